// What the car has told so far: the sensors with their values, statistics and history.
import { Points } from './points.js';

const keptMs = 15 * 60 * 1000;
const mostPoints = 6000;

export const sensors = new Map(); // by id
export let offered = []; // all that the car has

// The sensors of the chart: only their points are kept here, the program has those of all.
let charted = new Set();
export function keepPoints(ids) {
  charted = new Set(ids);
  for (const sensor of sensors.values()) {
    if (charted.has(sensor.id)) {
      sensor.points ??= new Points();
    } else {
      sensor.points = null;
      sensor.hasHistory = false;
    }
  }
}

function known(id) {
  let sensor = sensors.get(id);
  if (!sensor) {
    const points = charted.has(id) ? new Points() : null;
    sensor = { id, name: id, unit: '', sensor: '', precision: 0, value: null, time: 0, gap: 0, stats: fresh(), points, hasHistory: false };
    sensors.set(id, sensor);
  }
  return sensor;
}

function fresh() {
  return { min: null, max: null, sum: 0, count: 0 };
}

export function resetStatistics() {
  for (const sensor of sensors.values()) sensor.stats = fresh();
}

export function takeOffered(list, resumed) {
  offered = list;
  if (!resumed) for (const sensor of sensors.values()) sensor.hasHistory = false; // a broken stream leaves gaps
  for (const about of list) Object.assign(known(about.id), about, { precision: known(about.id).precision });
}

// An event of values: {"v": [[id, time, value], ...], "sensors": [...]}.
export function takeValues(event) {
  for (const about of event.sensors ?? []) Object.assign(known(about.id), about);
  for (const [id, time, value] of event.v) {
    const sensor = known(id);
    if (time <= sensor.time) continue;
    if (sensor.time) sensor.gap = sensor.gap ? 0.8 * sensor.gap + 0.2 * Math.min(time - sensor.time, 60000) : time - sensor.time;
    sensor.time = time;
    sensor.value = value;
    if (typeof value !== 'number') continue;
    const stats = sensor.stats;
    stats.min = stats.count ? Math.min(stats.min, value) : value;
    stats.max = stats.count ? Math.max(stats.max, value) : value;
    stats.sum += value;
    stats.count += 1;
    sensor.points?.add(time, value);
    sensor.points?.trim(time - keptMs, mostPoints);
  }
}

// {"id", "t": [...], "v": [...]}: what was there before this page, or while its link was broken.
export function takeHistory(history) {
  const sensor = known(history.id);
  if (!sensor.points) return;
  sensor.hasHistory = true;
  sensor.points.merge(history.t, history.v);
}

// The sensors that are read now or were a moment ago, as in the list of what is offered.
export function readNow(now) {
  const places = new Map(offered.map((each, index) => [each.id, index]));
  return [...sensors.values()]
    .filter((sensor) => sensor.time > now - 60000)
    .sort((a, b) => (places.get(a.id) ?? 999) - (places.get(b.id) ?? 999));
}

export function moduleCount() {
  return new Set(offered.map((each) => each.module)).size;
}

// With the module in front where another one has the same sensor.
export function titleOf(sensor) {
  const shared = offered.some((each) => each.name === sensor.name && each.id !== sensor.id);
  return shared && sensor.module ? `${sensor.module} ${sensor.name}` : sensor.name;
}

// How long a value is as good as new: some of the usual pauses between two.
export function freshMs(sensor) {
  return sensor.gap ? Math.max(2500, 2.5 * sensor.gap) : 15000;
}
