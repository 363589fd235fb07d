// Everything about what is selected.
import { byId, make, setText } from '/page/dom.js';

function valueText(value) {
  if (value === null) return '–';
  return Array.isArray(value) ? value.map(valueText).join(', ') : String(value);
}

export class DetailView {
  constructor(model, array, steering, onClose) {
    this.model = model;
    this.array = array;
    this.steering = steering;
    this.onClose = onClose;
    this.root = byId('detail');
    this.selection = null;
    this.shown = '';
  }

  show(selection) {
    this.selection = selection;
    this.shown = '';
    this.update();
  }

  /// Draws anew only what differs, so that what one has marked or focused stays.
  update() {
    this.root.hidden = this.selection === null;
    if (!this.selection) return;
    const { key, rack, slot } = this.selection;
    const element = key ? this.model.get(key) : null;
    const text = JSON.stringify([this.selection, element, this.steering.isAllowed, this.array.place(key)]);
    if (text !== this.shown) {
      this.shown = text;
      const focused = this.focusedCommand();
      const content = key ? this.elementNodes(key, element) : slot ? this.slotNodes(slot, rack) : this.rackNodes(rack);
      this.root.replaceChildren(this.closeButton(), ...content);
      this.root.querySelector(`[data-command="${CSS.escape(focused ?? '')}"]`)?.focus();
    }
    this.updateProgress(key);
  }

  focusedCommand() {
    return this.root.contains(document.activeElement) ? document.activeElement.dataset.command : null;
  }

  closeButton() {
    const button = make('button', { type: 'button', class: 'close', 'aria-label': 'Close the details' }, '×');
    button.addEventListener('click', () => this.onClose());
    return button;
  }

  updateProgress(key) {
    const node = this.root.querySelector('.progress');
    if (!node) return;
    const progress = this.model.rest.progress[key];
    node.hidden = !progress;
    if (!progress) return;
    node.firstElementChild.value = progress.percent;
    setText(node.lastElementChild, progress.text);
  }

  elementNodes(key, element) {
    if (!element)
      return [make('h2', {}, key), make('p', {}, 'The provider does not show it.')];
    const { view } = element;
    const facts = [view.size, this.array.place(key)].filter(Boolean).join(', ');
    return [
      make('h2', {}, view.name),
      view.state ? make('p', { class: 'state', 'data-look': view.look, 'data-level': view.level },
                        make('span', { class: 'sign', 'aria-hidden': 'true' }, view.sign), ` ${view.state}`) : null,
      facts ? make('p', { class: 'faint' }, facts) : null,
      make('p', { class: 'progress', hidden: '' },
           make('progress', { max: 100, 'aria-label': 'progress' }), make('span')),
      this.relatedNode(view),
      this.steering.controls(view.kind, view.target),
      this.pathNode(element.path),
      this.propertiesNode(element.properties),
    ].filter(Boolean);
  }

  relatedNode(view) {
    const names = this.model.related(view.key).map((key) => this.model.get(key)?.view)
      .filter(Boolean).map((each) => (view.kind === 'volume' ? each.id : each.label));
    if (names.length === 0) return null;
    return make('p', {}, view.kind === 'volume' ? `on drives ${names.join(', ')}` : `in ${names.join(', ')}`);
  }

  slotNodes(slot, rack) {
    const name = slot.slot === null ? 'An empty place' : `Slot ${slot.slot}, empty`;
    const group = this.steering.isAllowed
      ? make('div', { class: 'commands' }, this.steering.button('add', slot.insert, 'add a thing')) : null;
    return [make('h2', {}, name), make('p', { class: 'faint' }, rack.name),
            make('p', {}, `Drive ${slot.id} was here.`), group].filter(Boolean);
  }

  rackNodes(rack) {
    const now = this.model.rest.racks.find(
      ({ controller, name }) => controller === rack.controller && name === rack.name) ?? rack;
    return [make('h2', {}, now.name), make('p', { class: 'state', 'data-level': now.lost ? 'critical' : '' }, now.state ?? ''),
            this.steering.controls('enclosure', now.target)].filter(Boolean);
  }

  pathNode(path) {
    const code = make('code', { class: 'path', tabindex: 0, role: 'textbox', 'aria-readonly': 'true',
                                'aria-label': 'object path' }, path);
    const button = make('button', { type: 'button', class: 'copy' }, 'Copy the path');
    button.addEventListener('click', async () => {
      try {
        await navigator.clipboard.writeText(path);
        setText(button, 'Copied');
      } catch {
        getSelection().selectAllChildren(code);
        setText(button, 'Marked: copy it with the keyboard');
      }
    });
    return make('div', { class: 'path-line' }, code, button);
  }

  propertiesNode(properties) {
    const rows = Object.entries(properties).map(([name, value]) => {
      const words = this.model.page.words[name];
      const word = words && value !== null ? [value].flat().map((code) => words[code]).filter(Boolean).join(', ') : '';
      return make('tr', {}, make('th', { scope: 'row' }, name),
                  make('td', {}, valueText(value), word ? make('span', { class: 'faint' }, ` ${word}`) : null));
    });
    return make('table', {}, make('caption', {}, 'Properties'), make('tbody', {}, ...rows));
  }
}
