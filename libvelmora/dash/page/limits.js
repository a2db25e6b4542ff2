// What values should stay in, as the program's settings have it. A value outside has a sign, words and a colour: no
// meaning is told by its colour alone.
import { element, setText } from './tables.js';
import { titleOf } from './store.js';
import { isImperial, show, turnsRound, unitOf } from './units.js';

const heldMs = 10000; // for how long the status line tells of a value that is back inside

let limits = {}; // by the sensor's key: [lowest, highest] in metric units, null for none
const outsideAt = new Map(); // the sensors that were outside of late, and when, by their names

export function take(told) {
  limits = told ?? {};
  outsideAt.clear();
}

// Limits are metric; a recording in other units has none.
export function limitOf(sensor) {
  const found = Object.hasOwn(limits, sensor.sensor) && !isImperial(sensor.unit) ? limits[sensor.sensor] : null;
  return { lowest: found?.[0] ?? null, highest: found?.[1] ?? null };
}

// 'above', 'below', or nothing for a value inside and for what is no number.
export function side(sensor, value) {
  if (typeof value !== 'number') return '';
  const { lowest, highest } = limitOf(sensor);
  if (highest != null && value > highest) return 'above';
  return lowest != null && value < lowest ? 'below' : '';
}

// The same of what is shown.
export function sideShown(sensor, where) {
  if (!turnsRound(sensor)) return where;
  return where === 'above' ? 'below' : 'above';
}

// "6000", in the unit that is shown, and with the limit's own digits where that is the sensor's.
export function limitNumber(sensor, limit) {
  return unitOf(sensor) === sensor.unit ? String(limit) : show(sensor, limit);
}

export function limitText(sensor, limit) {
  return `${limitNumber(sensor, limit)} ${unitOf(sensor)}`.trim();
}

// "above its limit of 6000 rpm", or nothing.
export function words(sensor, value) {
  const where = side(sensor, value);
  const { lowest, highest } = limitOf(sensor);
  return where && `${sideShown(sensor, where)} its limit of ${limitText(sensor, where === 'above' ? highest : lowest)}`;
}

export function note(sensor, now) {
  if (side(sensor, sensor.value)) outsideAt.set(titleOf(sensor), now);
}

// For the status line, which speaks: what swings about its limit is told once.
export function sentence(now) {
  for (const [name, at] of outsideAt) {
    if (now - at > heldMs) outsideAt.delete(name);
  }
  if (outsideAt.size === 0) return '';
  return outsideAt.size === 1 ? `${[...outsideAt.keys()][0]} beyond its limit` : `${outsideAt.size} values beyond their limits`;
}

// A value with room for its sign and its words.
export function makeValue() {
  const parts = { sign: element('span', { class: 'sign', 'aria-hidden': 'true' }), text: element('span'), words: element('span', { class: 'unseen' }) };
  return { ...parts, nodes: [parts.sign, parts.text, parts.words] };
}

export function drawValue(parts, sensor, value) {
  const told = words(sensor, value);
  setText(parts.sign, told ? '! ' : '');
  setText(parts.text, show(sensor, value));
  setText(parts.words, told ? `, ${told}` : '');
  parts.text.parentElement.classList.toggle('beyond', told !== '');
}
