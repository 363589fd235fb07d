// The array: controllers, racks with their slots, volumes, batteries and ports.
import { byId, make, setAttribute, setChildren, setText } from '/page/dom.js';

const kDense = 30; // slots from which on only what matters has words

export class ArrayView {
  constructor(model, onSelect) {
    this.model = model;
    this.onSelect = onSelect;
    this.root = byId('array');
    this.sections = new Map(); // controller -> its nodes
    this.racks = new Map();    // name -> { node, text }
    this.nodes = new Map();    // key -> nodes that show the element
    this.selected = null;
    this.pointed = null;
    this.listen();
  }

  /// Draws what has another shape, then everything that was touched (null: all of it).
  update(touched) {
    const keys = touched ?? [...this.nodes.keys()]; // new ones are filled when they are made
    const focused = document.activeElement;
    this.drawSections();
    // A rack that was drawn anew has taken the focus with it.
    if (focused?.dataset.key && !focused.isConnected) this.nodeOf(focused.dataset.key)?.focus({ preventScroll: true });
    for (const key of keys) for (const node of this.nodes.get(key) ?? []) this.fill(node, key);
    this.highlight();
  }

  /// The progress of those that have some, and of those that had.
  updateProgress(keys) {
    for (const key of keys) for (const node of this.nodes.get(key) ?? []) this.fill(node, key);
  }

  select(key) {
    this.selected = key;
    for (const node of this.root.querySelectorAll('[aria-pressed="true"]'))
      if (node.dataset.key !== key) node.setAttribute('aria-pressed', 'false');
    for (const node of this.nodes.get(key) ?? []) setAttribute(node, 'aria-pressed', true);
    this.highlight();
  }

  nodeOf(key) {
    return (this.nodes.get(key) ?? []).find((node) => node.isConnected);
  }

  place(key) {
    for (const rack of this.model.rest.racks)
      for (const slot of rack.slots)
        if (slot.drive === key && !rack.row)
          return rack.name + (slot.slot === null ? '' : `, slot ${slot.slot}`);
    return null;
  }

  // -- drawing ------------------------------------------------------------------------------

  drawSections() {
    const controllers = this.model.ofKind('controller').map(({ view }) => view);
    const known = new Set(controllers.map((view) => view.id));
    const strays = [...this.model.elements.values()].some(
      ({ view }) => view.kind !== 'controller' && !known.has(view.controller));
    const wanted = controllers.map((view) => this.section(view.id, view));
    if (strays) wanted.push(this.section('', null));
    if (wanted.length === 0) wanted.push(this.emptyNote());
    setChildren(this.root, wanted);
    for (const id of this.sections.keys()) if (!known.has(id) && id !== '') this.sections.delete(id);
  }

  emptyNote() {
    this.empty ??= make('p', { class: 'faint empty' });
    setText(this.empty, this.model.rest.check.status === 3 ? 'Nothing is there yet.' : 'There is nothing.');
    return this.empty;
  }

  section(id, view) {
    let section = this.sections.get(id);
    if (!section) {
      section = {
        node: make('section', { class: 'controller' }),
        head: make('header'),
        racks: make('div', { class: 'racks' }),
        volumes: this.group('Volumes', 'volumes'),
        parts: this.group('Batteries and ports', 'parts'),
      };
      section.node.append(section.head, section.racks, section.volumes, section.parts);
      this.sections.set(id, section);
    }
    const name = view ? view.name : 'Without a controller';
    setAttribute(section.node, 'aria-label', name);
    this.drawHead(section, id, view, name);
    this.drawRacks(section, id);
    this.drawList(section.volumes, this.model.ofKind('volume', id), 'volume');
    this.drawList(section.parts, [...this.model.ofKind('battery', id), ...this.model.ofKind('port', id)],
                  'part');
    return section.node;
  }

  group(title, className) {
    return make('div', { class: className, role: 'group', 'aria-label': title }, make('h3', {}, title),
                make('div', { class: 'items' }));
  }

  drawHead(section, id, view, name) {
    const software = this.model.ofKind('software version', id);
    const nodes = [make('h2', {}, view ? this.node(view.key, 'name') : name),
                   ...software.map(({ view: each }) => this.node(each.key, 'firmware'))];
    if (view) setText(nodes[0].firstChild, name);
    if (section.head.textContent === nodes.map((node) => node.textContent).join('') &&
        section.headKeys === nodes.length) return;
    section.headKeys = nodes.length;
    section.head.replaceChildren(...nodes);
  }

  drawList(group, elements, className) {
    group.hidden = elements.length === 0;
    setChildren(group.lastElementChild, elements.map(({ view }) => this.node(view.key, className)));
  }

  drawRacks(section, id) {
    const racks = this.model.rest.racks.filter((rack) => rack.controller === id);
    setChildren(section.racks, racks.map((rack) => this.rack(id, rack)));
  }

  rack(id, rack) {
    const name = `${id} ${rack.name}`;
    const text = JSON.stringify(rack);
    const known = this.racks.get(name);
    if (known?.text === text) return known.node;
    const slots = make('div', { class: 'slots', role: 'group', 'aria-label': `${rack.name}, drives` });
    slots.append(...rack.slots.map((slot) => this.slot(slot, rack)));
    const first = slots.querySelector('button');
    if (first) first.tabIndex = 0;
    const node = make('div', {
      class: `${rack.row ? 'row' : 'rack'}${rack.slots.length > kDense ? ' dense' : ''}`,
    }, this.rackHead(rack), slots);
    setAttribute(node, 'data-lost', rack.lost);
    this.racks.set(name, { node, text });
    return node;
  }

  rackHead(rack) {
    const drives = rack.slots.filter((slot) => slot.drive).length;
    const head = make('h3', {}, rack.name);
    if (rack.target) {
      const button = make('button', { type: 'button', class: 'name' }, rack.name);
      button.addEventListener('click', () => this.onSelect({ rack }));
      head.replaceChildren(button);
    }
    const state = rack.state && rack.state !== 'ok' ? `${rack.lost ? '✕ ' : ''}${rack.state}, ` : '';
    head.append(make('span', { class: 'faint' }, ` ${state}${drives} ${drives === 1 ? 'drive' : 'drives'}`));
    return head;
  }

  slot(slot, rack) {
    if (slot.drive) {
      const node = this.node(slot.drive, 'slot', true);
      node.dataset.place = rack.row ? '' : `${rack.name}, slot ${slot.slot ?? 'unknown'}`;
      node.dataset.slot = slot.slot ?? '';
      node.dataset.id = slot.id;
      node.tabIndex = -1;
      this.fill(node, slot.drive);
      return node;
    }
    const number = slot.slot === null ? 'without a number' : slot.slot;
    const parts = [make('span', { class: 'number' }, slot.slot === null ? '' : String(slot.slot)),
                   make('span', { class: 'word' }, slot.insert ? `+ ${slot.id}` : 'empty')];
    if (!slot.insert)
      return make('div', { class: 'slot vacant', role: 'img', 'aria-label': `slot ${number}, empty` },
                  ...parts);
    const button = make('button', {
      type: 'button', class: 'slot vacant', tabindex: -1,
      'aria-label': `slot ${number}, empty, drive ${slot.id} was here`,
    }, ...parts);
    button.addEventListener('click', () => this.onSelect({ slot, rack }));
    return button;
  }

  /// A button that shows an element; `fresh` makes another one, which is still empty.
  node(key, className, fresh = false) {
    const nodes = (this.nodes.get(key) ?? []).filter((node) => !fresh || node.isConnected);
    const known = nodes.find((node) => node.classList.contains(className));
    if (known && !fresh) return known;
    const node = make('button', {
      type: 'button', class: className, 'data-key': key, 'aria-pressed': key === this.selected,
    });
    this.nodes.set(key, [...nodes, node]);
    if (!fresh) this.fill(node, key);
    return node;
  }

  fill(node, key) {
    const element = this.model.get(key);
    const fillers = { slot: this.fillSlot, volume: this.fillVolume, part: this.fillPart };
    for (const [name, fill] of Object.entries(fillers))
      if (node.classList.contains(name)) return fill.call(this, node, key, element);
    if (!element) return;
    setText(node, node.classList.contains('firmware')
      ? `firmware ${element.properties.VersionString ?? 'not told'}` : element.view.name);
  }

  fillSlot(node, key, element) {
    const view = element?.view ?? { look: 'absent', level: '', sign: '', state: 'not shown', id: node.dataset.id };
    const progress = this.model.rest.progress[key];
    const plain = view.look === 'ok' ? view.size ?? view.state : view.state;
    setAttribute(node, 'data-look', view.look);
    setAttribute(node, 'data-level', view.level);
    this.parts(node, [['number', node.dataset.slot === '' ? view.id : node.dataset.slot],
                      ['sign', view.sign],
                      ['word', progress ? `${progress.percent} %` : plain]], progress);
    const place = node.dataset.place ? `${node.dataset.place}, ` : '';
    setAttribute(node, 'aria-label', `${place}drive ${view.id}, ${view.state}${view.size ? `, ${view.size}` : ''}`);
    setAttribute(node, 'title', `${place}drive ${view.id}: ${view.state}${progress ? `, ${progress.text}` : ''}`);
  }

  fillVolume(node, key, element) {
    if (!element) return;
    const { view } = element;
    setAttribute(node, 'data-look', view.look);
    setAttribute(node, 'data-level', view.level);
    const count = view.members.length;
    const drives = count === 0 ? '' : count === 1 ? '1 drive' : `${count} drives`;
    this.parts(node, [['sign', view.sign], ['title', view.label],
                      ['word', view.state],
                      ['faint', [view.size, drives].filter(Boolean).join(', ')]]);
    setAttribute(node, 'aria-label', ['volume ' + view.label, view.state, view.size, drives].filter(Boolean).join(', '));
  }

  fillPart(node, key, element) {
    if (!element) return;
    const { view } = element;
    const progress = this.model.rest.progress[key];
    setAttribute(node, 'data-look', view.look);
    setAttribute(node, 'data-level', view.level);
    this.parts(node, [['sign', view.sign], ['title', view.label],
                      ['word', view.state + (progress ? ` ${progress.percent} %` : '')]], progress);
    setAttribute(node, 'aria-label', `${view.kind} ${view.label}, ${view.state}`);
  }

  /// Spans by class, and a bar when there is progress.
  parts(node, texts, progress) {
    const spans = texts.map(([name, text], i) => {
      const known = node.children[i];
      const span = known?.className === name ? known : make('span', { class: name });
      setText(span, String(text ?? ''));
      if (name === 'sign') span.setAttribute('aria-hidden', 'true');
      return span;
    });
    if (progress) {
      const known = node.querySelector('progress');
      const bar = known ?? make('progress', { max: 100, 'aria-hidden': 'true' });
      bar.value = progress.percent;
      spans.push(bar);
    }
    setChildren(node, spans);
  }

  // -- pointing, selecting, keys ------------------------------------------------------------

  listen() {
    const keyAt = (event) => event.target.closest?.('[data-key]')?.dataset.key ?? null;
    const point = (event) => this.point(keyAt(event));
    this.root.addEventListener('pointerover', point);
    this.root.addEventListener('pointerleave', () => this.point(null));
    this.root.addEventListener('focusin', point);
    this.root.addEventListener('focusout', () => this.point(null));
    this.root.addEventListener('click', (event) => {
      const key = keyAt(event);
      if (key) this.onSelect({ key });
    });
    this.root.addEventListener('keydown', (event) => this.moveBy(event));
  }

  point(key) {
    if (this.pointed === key) return;
    this.pointed = key;
    this.highlight();
  }

  highlight() {
    const related = new Set(this.model.related(this.pointed ?? this.selected));
    this.root.classList.toggle('pointing', this.pointed !== null && related.size > 0);
    for (const node of this.root.querySelectorAll('.related'))
      if (!related.has(node.dataset.key)) node.classList.remove('related');
    for (const key of related)
      for (const node of this.nodes.get(key) ?? []) node.classList.add('related');
  }

  /// Arrows move within a rack; Tab leaves it.
  moveBy(event) {
    const slots = event.target.closest?.('.slots');
    if (!slots) return;
    const buttons = [...slots.querySelectorAll('button')];
    const at = buttons.indexOf(event.target);
    const columns = buttons.filter((button) => button.offsetTop === buttons[0].offsetTop).length;
    const steps = { ArrowRight: 1, ArrowLeft: -1, ArrowDown: columns, ArrowUp: -columns,
                    Home: -at, End: buttons.length - 1 - at };
    const next = buttons[at + steps[event.key]];
    if (!next) return;
    event.preventDefault();
    event.target.tabIndex = -1;
    next.tabIndex = 0;
    next.focus();
  }
}
