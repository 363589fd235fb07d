// Buttons for the live commands. What each of them sends is what it shows.
import { byId, make, setText } from '/page/dom.js';

const kResultShown = 8000; // what was refused stays until the next command

export class Steering {
  constructor(model) {
    this.model = model;
    this.token = null;
    byId('free').addEventListener('submit', (event) => {
      event.preventDefault();
      const command = byId('free-command').value.trim();
      if (command) this.send(command);
    });
  }

  get isAllowed() {
    return this.token !== null && this.model.page?.commands !== null;
  }

  /// Asks whether this page may give commands; a server that was started anew has another token.
  async learn() {
    const response = await fetch('/page/token', { cache: 'no-store' });
    this.token = response.ok ? (await response.json()).token : null;
    byId('steer').hidden = !this.isAllowed;
    if (!this.isAllowed) return;
    byId('time-commands').replaceChildren(...this.buttons('time', ''));
    byId('fault-commands').replaceChildren(...this.buttons('faults', ''));
  }

  updateTime() {
    const time = this.model.rest.timeline;
    if (!time) return;
    setText(byId('time'), time.paused ? 'The array’s time stands still.'
      : `The array’s time goes ${time.speed === 1 ? 'with the clock' : `${time.speed} times as fast as the clock`}.`);
    const lines = time.next.map((next) => make('li', {}, `in ${next.in}: `, make('code', {}, next.command)));
    if (time.more > 0) lines.push(make('li', {}, `and ${time.more} more`));
    byId('ahead').replaceChildren(...lines);
    byId('ahead').hidden = lines.length === 0;
  }

  /// The commands of a kind for what they call an element; none when one may only look.
  controls(kind, target) {
    if (!this.isAllowed || !target || !this.model.page.commands[kind]) return null;
    const choice = this.choice(kind, target);
    return make('div', { class: 'commands', role: 'group', 'aria-label': 'Commands' },
                ...this.buttons(kind, target), ...(choice ? [choice] : []));
  }

  buttons(kind, target) {
    return this.model.page.commands[kind].buttons.map(({ label, command, help }) =>
      this.button(label, command.replace('{}', () => target), help));
  }

  button(label, command, help) {
    const same = label === command;
    const button = make('button', { type: 'button', 'data-command': command, title: help },
                        make(same ? 'code' : 'b', {}, label), same ? null : make('code', {}, command));
    button.addEventListener('click', () => this.send(command));
    return button;
  }

  /// Every state by its word.
  choice(kind, target) {
    const states = this.model.page.commands[kind].states;
    if (states.length === 0) return null;
    const commandFor = (i) => states[i].command.replace('{}', () => target);
    const select = make('select', { 'aria-label': 'another state' },
                        ...states.map(({ label }, i) => make('option', { value: i }, label)));
    const code = make('code', {}, commandFor(0));
    const button = make('button', { type: 'button', 'data-command': commandFor(0) }, make('b', {}, 'set'), code);
    select.addEventListener('change', () => {
      setText(code, commandFor(select.value));
      button.dataset.command = commandFor(select.value);
    });
    button.addEventListener('click', () => this.send(commandFor(select.value)));
    return make('div', { class: 'choice' }, select, button);
  }

  async send(command) {
    const tell = (text, refused) => {
      setText(byId('result'), text);
      byId('result').dataset.refused = refused;
      clearTimeout(this.fading);
      if (!refused) this.fading = setTimeout(() => setText(byId('result'), ''), kResultShown);
    };
    tell(`sending: ${command}`, false);
    try {
      const response = await fetch('/page/command', {
        method: 'POST',
        headers: { 'Content-Type': 'application/json', 'X-Plexor-Token': this.token },
        body: JSON.stringify({ command }),
      });
      if (!response.ok) throw new Error(`the server answered with status ${response.status}`);
      const { refused, text } = await response.json();
      tell(refused ? `refused: ${text}` : `done: ${command}`, refused);
    } catch (error) {
      tell(`not sent: ${error.message}`, true);
    }
  }
}
