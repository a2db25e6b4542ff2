// How the page is arranged. The program keeps it, for each vehicle.
import { keepPoints, offered, readNow, sensors } from './store.js';
import { programNow } from './link.js';
import { setSystem } from './units.js';

const usualGauges = ['SPEED', 'RPM', 'COOLANT_TEMP', 'ENGINE_LOAD', 'THROTTLE_POS', 'FUEL_LEVEL'];
const usualChart = ['RPM', 'SPEED', 'ENGINE_LOAD'];
const changed = new Set();

let stored = {};
let sending = null;

export function onLayout(handler) {
  changed.add(handler);
}

export function take(layout) {
  stored = layout ?? {};
  apply();
}

function apply() {
  keepPoints(chosen('chart'));
  setSystem(stored.units ?? 'metric');
  document.documentElement.dataset.theme = stored.theme ?? 'auto';
  document.documentElement.dataset.size = stored.size ?? 'normal';
  for (const handler of changed) handler();
}

function usual(keys) {
  const pool = offered.length ? offered : [...sensors.values()];
  return keys.map((key) => pool.find((each) => each.sensor === key)?.id).filter(Boolean);
}

// The ids that a view shows.
export function chosen(view) {
  if (stored[view]) return stored[view];
  if (view === 'gauges') return usual(usualGauges);
  if (view === 'chart') return usual(usualChart);
  return readNow(programNow()).map((sensor) => sensor.id);
}

export function setting(key, otherwise) {
  return stored[key] ?? otherwise;
}

// Shows the change at once and sends it a moment later, with those that follow on its heels.
export function change(part) {
  stored = { ...stored, ...part };
  apply();
  clearTimeout(sending);
  sending = setTimeout(send, 300);
}

function send() {
  clearTimeout(sending);
  sending = null;
  fetch('/layout', { method: 'POST', body: JSON.stringify(stored), keepalive: true }).catch(() => {});
}

// What was just arranged outlives a page that is closed at once.
addEventListener('pagehide', () => sending && send());
