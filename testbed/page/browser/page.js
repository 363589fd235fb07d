// The page: what the server tells goes into the model, and from there into the views.
import { byId, make, setText } from '/page/dom.js';
import { Model } from '/page/model.js';
import { Feed } from '/page/feed.js';
import { ArrayView } from '/page/array.js';
import { DetailView } from '/page/detail.js';
import { Steering } from '/page/steer.js';

const kSigns = { ok: '✓', warning: '!', critical: '✕', unknown: '?' };
const kStale = 10; // seconds

const model = new Model();
const steering = new Steering(model);
const array = new ArrayView(model, select);
const detail = new DetailView(model, array, steering, () => select(null));
let answered = null; // when the server was answered last, in this page's time
let link = '';
let lostAt = 0;

function select(selection) {
  const same = selection?.key && selection.key === array.selected;
  const wanted = same ? null : selection;
  array.select(wanted?.key ?? null);
  detail.show(wanted);
}

function noteAge({ age }) {
  answered = age === null ? null : performance.now() - age * 1000;
  showAge();
}

function showAge() {
  const seconds = answered === null ? null : Math.max(0, Math.round((performance.now() - answered) / 1000));
  const text = seconds === null ? 'no answer yet' : seconds < 3 ? 'as of now' : `as of ${seconds} s ago`;
  setText(byId('age'), text);
  byId('age').classList.toggle('stale', seconds === null || seconds > kStale);
  if (link === 'lost')
    setText(byId('link'), `lost the server ${Math.round((performance.now() - lostAt) / 1000)} s ago, trying again`);
}

function showVerdict() {
  const { check, errors } = model.rest;
  byId('verdict').dataset.level = check.level;
  setText(byId('verdict-sign'), kSigns[check.level]);
  setText(byId('verdict-word'), check.level);
  const failed = errors.map((error) => `${error.class}: status ${error.status}`);
  setText(byId('verdict-text'), check.text || failed.join('; '));
  setText(byId('source'), model.page.source);
  document.title = `${kSigns[check.level]} ${check.level} – Plexor array`;
}

function changeNode(change) {
  const time = new Date(change.time);
  return make('li', { 'data-level': change.level },
              make('time', { datetime: change.time }, time.toTimeString().slice(0, 8)), ' ', change.text);
}

let newest = null;

function showChanges(announce) {
  const { changes } = model.rest;
  byId('no-changes').hidden = changes.length > 0;
  byId('changes').replaceChildren(...changes.map(changeNode));
  const known = changes.findIndex((change) => JSON.stringify(change) === newest);
  const fresh = known < 0 ? changes.length : known;
  newest = changes.length > 0 ? JSON.stringify(changes[0]) : null;
  if (!announce || fresh === 0) return;
  const said = changes.slice(0, 3).slice(0, fresh).map((change) => change.text).join('. ');
  setText(byId('told'), fresh > 3 ? `${fresh} changes. ${said}` : said);
}

function showLegend() {
  byId('legend').replaceChildren(...model.page.looks.filter(({ sign }) => sign).map(({ look, sign, meaning }) =>
    make('li', { 'data-look': look }, make('span', { class: 'sign', 'aria-hidden': 'true' }, sign), ` ${meaning}`)));
}

/// Leaves the time until the work was on the screen, of the last time only: a page on a wall stays
/// open for months.
function measured(name, work) {
  const start = performance.now();
  work();
  requestAnimationFrame(() => setTimeout(() => {
    performance.clearMeasures(`plexor:${name}`);
    performance.measure(`plexor:${name}`, { start });
  }));
}

const feed = new Feed({
  serial: () => model.serial,

  onDocument(data) {
    measured('document', () => {
      model.load(data);
      noteAge(data);
      showVerdict();
      showLegend();
      array.update(null);
      showChanges(newest !== null);
      steering.updateTime();
      detail.update();
    });
    steering.learn().then(() => detail.update()).catch(() => {});
    document.body.dataset.serial = model.serial;
  },

  onChange(data) {
    const before = Object.keys(model.rest.progress ?? {});
    let taken = null;
    measured('change', () => {
      taken = model.change(data);
      if (!taken) return;
      if ('check' in taken.set || 'errors' in taken.set) showVerdict();
      if (taken.touched.size > 0 || 'racks' in taken.set) array.update(taken.touched);
      if ('progress' in taken.set) array.updateProgress([...before, ...Object.keys(taken.set.progress)]);
      if ('changes' in taken.set) showChanges(true);
      if ('timeline' in taken.set) steering.updateTime();
      detail.update();
    });
    document.body.dataset.serial = model.serial;
    noteAge(data);
    return taken !== null;
  },

  onAlive: noteAge,

  onLink(state) {
    if (state === link) return;
    if (state === 'lost') lostAt = performance.now();
    link = state;
    document.body.dataset.link = state;
    setText(byId('link'), state === 'following' ? '' : state === 'asking' ? 'asking every 2 s' : 'lost the server');
  },
});

document.addEventListener('keydown', (event) => {
  if (event.key === 'Escape') select(null);
});
setInterval(showAge, 1000);
feed.start();
