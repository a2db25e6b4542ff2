// The view that is read from afar: a dial and big digits for each chosen sensor.
import { byId, button, element, setText, svg } from './tables.js';
import { chosen, change } from './layout.js';
import { limitNumber, limitOf, side, sideShown, words } from './limits.js';
import { freshMs, sensors, titleOf } from './store.js';
import { dialOf, rangeOf, show, unitOf } from './units.js';

const arcPath = 'M 30.7 140 A 80 80 0 1 1 169.3 140'; // two thirds of a circle

// A line across the dial at a share of its sweep.
function placeMark(mark, share) {
  const angle = ((150 + 240 * share) * Math.PI) / 180;
  const at = (radius) => [100 + radius * Math.cos(angle), 100 + radius * Math.sin(angle)].map((each) => each.toFixed(1));
  const [x1, y1] = at(72);
  const [x2, y2] = at(92);
  for (const [name, value] of Object.entries({ x1, y1, x2, y2 })) mark.setAttribute(name, value);
}

const cards = new Map();
let dragged = null;

function makeCard(id) {
  const arc = svg('path', { d: arcPath, class: 'arc', fill: 'none', 'stroke-width': 13, 'stroke-linecap': 'round', pathLength: 100, 'stroke-dasharray': '100 200', 'stroke-dashoffset': 100 });
  const track = svg('path', { d: arcPath, class: 'track', fill: 'none', 'stroke-width': 13, 'stroke-linecap': 'round' });
  const parts = {
    arc,
    marks: [0, 1].map(() => svg('line', { class: 'mark', 'stroke-width': 4, visibility: 'hidden' })),
    sign: element('span', { class: 'sign' }),
    name: element('span', { class: 'name', id: `name-${id}` }),
    number: element('span', { class: 'number' }),
    unit: element('div', { class: 'unit' }),
    low: element('span'), high: element('span'),
    age: element('span', { class: 'age' }),
  };
  const face = element('div', { class: 'face', role: 'meter', 'aria-labelledby': `name-${id}` },
    svg('svg', { viewBox: '0 10 200 142', 'aria-hidden': 'true' }, track, arc, ...parts.marks),
    element('div', { class: 'digits', 'aria-hidden': 'true' }, parts.sign, parts.number, parts.unit));
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

// As far as the sensor's range goes, and to its limits.
function endsOf(sensor) {
  const [low, high] = rangeOf(sensor);
  const { lowest, highest } = limitOf(sensor);
  return [Math.min(low, lowest ?? low), Math.max(high, highest ?? high)];
}

function drawDial(parts, sensor, stale) {
  const dial = dialOf(sensor, endsOf(sensor));
  const numeric = typeof sensor.value === 'number';
  const share = numeric && !stale ? dial.at(sensor.value) : 0;
  parts.arc.setAttribute('stroke-dashoffset', String(Math.round(1000 - share * 1000) / 10));
  parts.arc.setAttribute('visibility', share > 0.002 ? 'visible' : 'hidden');
  setText(parts.low, numeric ? String(Math.round(dial.low)) : '');
  setText(parts.high, numeric ? String(Math.round(dial.high)) : '');
  const { lowest, highest } = limitOf(sensor);
  [lowest, highest].forEach((limit, index) => {
    parts.marks[index].setAttribute('visibility', limit == null || !numeric ? 'hidden' : 'visible');
    if (limit != null) placeMark(parts.marks[index], dial.at(limit));
  });
}

// Under the digits: how old the value is, or which limit it is beyond.
function remark(sensor, stale, now) {
  if (stale) return ageText(now - sensor.time);
  const where = side(sensor, sensor.value);
  const { lowest, highest } = limitOf(sensor);
  return where && `${sideShown(sensor, where)} ${limitNumber(sensor, where === 'above' ? highest : lowest)}`;
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
  const beyond = !stale && side(sensor, sensor.value) !== '';
  parts.card.classList.toggle('stale', stale);
  parts.card.classList.toggle('beyond', beyond);
  setText(parts.sign, beyond ? '!' : '');
  setText(parts.age, remark(sensor, stale, now));
  drawDial(parts, sensor, stale);
  tellReaders(parts, sensor, text, stale, now);
}

// Once a second at most, and never by itself: a reader of the screen hears it where he goes.
function tellReaders(parts, sensor, text, stale, now) {
  if (now - parts.told < 1000) return;
  parts.told = now;
  const [low, high] = endsOf(sensor);
  const further = stale ? parts.age.textContent : words(sensor, sensor.value);
  parts.face.setAttribute('aria-valuemin', String(low));
  parts.face.setAttribute('aria-valuemax', String(high));
  parts.face.setAttribute('aria-valuenow', String(typeof sensor.value === 'number' ? sensor.value : low));
  parts.face.setAttribute('aria-valuetext', sensor.value == null ? 'no value' : `${text} ${unitOf(sensor)}${further ? `, ${further}` : ''}`);
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
  return told.map((sensor) => [sensor.name, show(sensor, sensor.value), unitOf(sensor), words(sensor, sensor.value)].filter(Boolean).join(' ')).join(', ') || 'No values yet';
}
