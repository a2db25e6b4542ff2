// The view that is read from afar: a dial and big digits for each chosen sensor.
import { byId, button, element, setText, svg } from './tables.js';
import { chosen, change } from './layout.js';
import { freshMs, sensors, titleOf } from './store.js';
import { convert, rangeOf, show, unitOf } from './units.js';

const arcPath = 'M 30.7 140 A 80 80 0 1 1 169.3 140'; // two thirds of a circle

const cards = new Map();
let dragged = null;

function makeCard(id) {
  const arc = svg('path', { d: arcPath, class: 'arc', fill: 'none', 'stroke-width': 13, 'stroke-linecap': 'round', pathLength: 100, 'stroke-dasharray': '100 200', 'stroke-dashoffset': 100 });
  const track = svg('path', { d: arcPath, class: 'track', fill: 'none', 'stroke-width': 13, 'stroke-linecap': 'round' });
  const parts = {
    arc,
    name: element('span', { class: 'name', id: `name-${id}` }),
    number: element('span', { class: 'number' }),
    unit: element('div', { class: 'unit' }),
    low: element('span'), high: element('span'),
    age: element('span', { class: 'age' }),
  };
  const face = element('div', { class: 'face', role: 'meter', 'aria-labelledby': `name-${id}` },
    svg('svg', { viewBox: '0 10 200 142', 'aria-hidden': 'true' }, track, arc),
    element('div', { class: 'digits', 'aria-hidden': 'true' }, parts.number, parts.unit));
  const card = element('li', { class: 'gauge', 'data-id': id }, parts.name, face,
    element('div', { class: 'ends', 'aria-hidden': 'true' }, parts.low, parts.age, parts.high), makeMoves(id));
  Object.assign(parts, { card, face, told: 0 });
  addDrag(card, id);
  return parts;
}

function makeMoves(id) {
  const move = (steps) => () => {
    shift(id, steps);
    byId('gauges').querySelector(`[data-id="${CSS.escape(id)}"] [data-step="${steps}"]`)?.focus();
  };
  return element('div', { class: 'moves' },
    button('◀', move(-1), { 'data-step': -1, 'data-label': 'Move earlier:' }),
    button('▶', move(1), { 'data-step': 1, 'data-label': 'Move later:' }),
    button('✕', () => change({ gauges: chosen('gauges').filter((each) => each !== id) }), { 'data-label': 'Remove:' }));
}

function shift(id, steps) {
  const ids = [...chosen('gauges')];
  const from = ids.indexOf(id);
  const to = Math.max(0, Math.min(ids.length - 1, from + steps));
  ids.splice(to, 0, ...ids.splice(from, 1));
  change({ gauges: ids });
}

function addDrag(card, id) {
  card.addEventListener('dragstart', (event) => {
    dragged = id;
    event.dataTransfer.setData('text/plain', id);
  });
  card.addEventListener('dragover', (event) => {
    if (!dragged) return;
    event.preventDefault();
    card.classList.add('over');
  });
  card.addEventListener('dragleave', () => card.classList.remove('over'));
  card.addEventListener('drop', (event) => {
    event.preventDefault();
    card.classList.remove('over');
    const ids = chosen('gauges');
    if (dragged && dragged !== id) shift(dragged, ids.indexOf(id) - ids.indexOf(dragged));
    dragged = null;
  });
}

export function arrange(on) {
  byId('gauges').classList.toggle('arranging', on);
  for (const { card } of cards.values()) card.draggable = on;
}

// Cards stay for as long as their sensor is chosen, so that the focus stays where it is.
export function rebuild() {
  const ids = chosen('gauges');
  const list = byId('gauges');
  for (const [id, parts] of cards) {
    if (!ids.includes(id)) {
      parts.card.remove();
      cards.delete(id);
    }
  }
  ids.forEach((id, index) => {
    if (!cards.has(id)) cards.set(id, makeCard(id));
    const { card } = cards.get(id);
    if (list.children[index] !== card) list.insertBefore(card, list.children[index] ?? null);
  });
  arrange(byId('arrange').getAttribute('aria-pressed') === 'true');
  byId('nothing').hidden = ids.length > 0;
}

export function ageText(ms) {
  if (ms < 60000) return `${Math.round(ms / 1000)} s ago`;
  return ms < 3600000 ? `${Math.round(ms / 60000)} min ago` : 'long ago';
}

export function isStale(sensor, now) {
  return now - sensor.time > freshMs(sensor);
}

function draw(parts, sensor, now) {
  const title = titleOf(sensor);
  const text = show(sensor, sensor.value);
  setText(parts.name, title);
  for (const each of parts.card.querySelectorAll('[data-label]')) each.setAttribute('aria-label', `${each.dataset.label} ${title}`);
  setText(parts.number, text);
  parts.number.classList.toggle('long', text.length > 7);
  setText(parts.unit, unitOf(sensor));
  const stale = sensor.time > 0 && isStale(sensor, now);
  parts.card.classList.toggle('stale', stale);
  setText(parts.age, stale ? ageText(now - sensor.time) : '');
  const [low, high] = rangeOf(sensor);
  const numeric = typeof sensor.value === 'number';
  setText(parts.low, numeric ? String(Math.round(convert(sensor, low))) : '');
  setText(parts.high, numeric ? String(Math.round(convert(sensor, high))) : '');
  const share = numeric && !stale ? Math.max(0, Math.min(1, (sensor.value - low) / (high - low))) : 0;
  parts.arc.setAttribute('stroke-dashoffset', String(Math.round(1000 - share * 1000) / 10));
  parts.arc.setAttribute('visibility', share > 0.002 ? 'visible' : 'hidden');
  tellReaders(parts, sensor, { low, high, numeric, stale, text }, now);
}

// Once a second at most, and never by itself: a reader of the screen hears it where he goes.
function tellReaders(parts, sensor, { low, high, numeric, stale, text }, now) {
  if (now - parts.told < 1000) return;
  parts.told = now;
  parts.face.setAttribute('aria-valuemin', String(low));
  parts.face.setAttribute('aria-valuemax', String(high));
  parts.face.setAttribute('aria-valuenow', String(numeric ? sensor.value : low));
  parts.face.setAttribute('aria-valuetext', sensor.value == null ? 'no value' : `${text} ${unitOf(sensor)}${stale ? ', ' + parts.age.textContent : ''}`);
}

export function update(now) {
  for (const [id, parts] of cards) {
    const sensor = sensors.get(id);
    if (sensor) draw(parts, sensor, now);
  }
}

// A sentence with all values, for a button.
export function sentence() {
  const told = chosen('gauges').map((id) => sensors.get(id)).filter((sensor) => sensor?.value != null);
  return told.map((sensor) => `${sensor.name} ${show(sensor, sensor.value)} ${unitOf(sensor)}`).join(', ') || 'No values yet';
}
