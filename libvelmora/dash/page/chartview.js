// The chart of the last minutes, with an axis for each unit. Chart.js is loaded when it is first looked at.
import { limitLines, segmentOf } from './chartlimits.js';
import { byId, element, setText } from './tables.js';
import { chosen, change, setting } from './layout.js';
import { drawValue, makeValue } from './limits.js';
import { getJson, programNow } from './link.js';
import { sensors, takeHistory, titleOf } from './store.js';
import { convert, inOrder, unitOf } from './units.js';

// None of them is the red of what is beyond a limit.
const light = ['#0b63bd', '#a3128b', '#176b41', '#7a3fb8', '#855300', '#0f6d78'];
const dark = ['#62b4ff', '#ff9ae0', '#54d08d', '#c9a2ff', '#f4bd55', '#5fd3de'];
const stretchPixels = 4; // of which a line has four points at most
const dashes = [[], [8, 4], [2, 3], [12, 4, 2, 4], [5, 5], [1, 2]]; // no line is told by its colour alone

let chart = null;
let loading = null;
let view = null; // {from, to} while zoomed, else live

function load() {
  loading ??= new Promise((resolve, reject) => {
    const script = element('script', { src: '/page/chart.min.js' });
    script.onload = resolve;
    script.onerror = reject;
    document.head.append(script);
  });
  return loading;
}

function style(name) {
  return getComputedStyle(document.documentElement).getPropertyValue(name).trim();
}

function colours() {
  return matchMedia('(prefers-color-scheme: dark)').matches && document.documentElement.dataset.theme !== 'light' ||
    document.documentElement.dataset.theme === 'dark' ? dark : light;
}

function clock(ms) {
  return new Date(ms).toLocaleTimeString([], { hour: '2-digit', minute: '2-digit', second: '2-digit', hour12: false });
}

function shown() {
  return chosen('chart').map((id) => sensors.get(id)).filter((sensor) => sensor?.points);
}

function datasets() {
  const palette = colours();
  return shown().map((sensor, index) => ({
    label: titleOf(sensor), data: [], borderColor: palette[index % 6], backgroundColor: palette[index % 6],
    borderDash: dashes[index % 6], borderWidth: 2, pointRadius: 0, tension: 0, spanGaps: false, yAxisID: axisOf(sensor),
    segment: segmentOf(sensor, style('--bad')),
  }));
}

function axisOf(sensor) {
  return `y-${unitOf(sensor) || 'none'}`;
}

// Whole minutes or seconds, as a clock has them.
function ticks(axis) {
  const length = axis.max - axis.min;
  const step = [1000, 5000, 10000, 30000, 60000, 180000].find((each) => length / each <= (axis.width < 500 ? 4 : 8)) ?? 300000;
  axis.ticks = [];
  for (let at = Math.ceil(axis.min / step) * step; at <= axis.max; at += step) axis.ticks.push({ value: at });
}

function scales() {
  const ink = style('--faint');
  const grid = style('--line');
  const result = { x: { type: 'linear', ticks: { color: ink, maxTicksLimit: 7, maxRotation: 0, callback: clock }, grid: { color: grid }, afterBuildTicks: ticks } };
  [...new Set(shown().map(axisOf))].forEach((id, index) => {
    result[id] = { type: 'linear', grace: '8%', position: index % 2 ? 'right' : 'left', ticks: { color: ink, maxTicksLimit: 7 },
      grid: { color: grid, drawOnChartArea: index === 0, tickLength: 4 }, // on a phone three axes have a sixth of the width each
      title: { display: true, color: ink, padding: 0, text: id.slice(2).replace('none', '') } };
  });
  return result;
}

// In the units that are wanted, with one point before and one behind what is seen.
function pointsOf(sensor, from, to) {
  const { points } = sensor;
  const first = points.indexFrom(from);
  const result = [];
  if (first === points.size) return result;
  const end = Math.min(points.size, points.indexFrom(to) + 1);
  points.thinned(Math.max(0, first - 1), end, ((to - from) / chart.width) * stretchPixels, (x, y) => result.push({ x, y: convert(sensor, y) }));
  return result;
}

function range() {
  const to = programNow();
  return view ?? { from: to - setting('minutes', 5) * 60000, to };
}

async function fetchHistories() {
  for (const sensor of shown().filter((each) => !each.hasHistory)) {
    sensor.hasHistory = true;
    try {
      takeHistory(await getJson(`/history?${sensor.id}`));
    } catch {
      sensor.hasHistory = false;
    }
  }
}

export async function rebuild() {
  byId('minutes').value = String(setting('minutes', 5));
  if (byId('canvas').closest('section').hidden) return;
  await load();
  await fetchHistories();
  chart?.destroy();
  chart = new window.Chart(byId('canvas'), {
    type: 'line',
    data: { datasets: datasets() },
    plugins: [limitLines(shown(), axisOf, style('--bad'))],
    options: { parsing: false, animation: false, normalized: true, maintainAspectRatio: false, interaction: { mode: 'nearest', axis: 'x', intersect: false },
      scales: scales(), plugins: { decimation: { enabled: true, algorithm: 'min-max', threshold: 400 },
        legend: { labels: { color: style('--ink'), boxHeight: 0, boxWidth: 36 } }, tooltip: { callbacks: { title: (items) => clock(items[0].parsed.x) } } } },
  });
  update();
}

// Called four times a second at most.
export function update() {
  if (!chart) return;
  const { from, to } = range();
  chart.options.scales.x.min = from;
  chart.options.scales.x.max = to;
  shown().forEach((sensor, index) => {
    if (chart.data.datasets[index]) chart.data.datasets[index].data = pointsOf(sensor, from, to);
  });
  chart.update('none');
  figures(from, to);
}

// Lowest, mean, highest and last of what lies between two times.
function summary(points, from, to) {
  const first = points.indexFrom(from);
  const end = points.indexFrom(to + 1);
  if (first >= end) return [null, null, null, null];
  let low = points.value(first);
  let high = low;
  let sum = 0;
  for (let i = first; i < end; ++i) {
    low = Math.min(low, points.value(i));
    high = Math.max(high, points.value(i));
    sum += points.value(i);
  }
  return [low, sum / (end - first), high, points.value(end - 1)];
}

let rows = []; // of the table of figures

function makeFigures(list) {
  const head = ['Sensor', 'Lowest', 'Mean', 'Highest', 'Last', 'Unit'].map((text, index) =>
    element('th', { scope: 'col', class: index > 0 && index < 5 ? 'right' : null }, text));
  rows = list.map(() => ({ name: element('th', { scope: 'row' }), values: [1, 2, 3, 4].map(makeValue), unit: element('td') }));
  const made = rows.map(({ name, values, unit }) =>
    element('tr', {}, name, ...values.map(({ nodes }) => element('td', { class: 'right' }, ...nodes)), unit));
  byId('figures').replaceChildren(element('thead', {}, element('tr', {}, ...head)), element('tbody', {}, ...made));
}

function figures(from, to) {
  const list = shown();
  if (rows.length !== list.length || !byId('figures').tHead) makeFigures(list);
  list.forEach((sensor, index) => {
    const { name, values, unit } = rows[index];
    setText(name, titleOf(sensor));
    setText(unit, unitOf(sensor));
    const [lowest, mean, highest, last] = summary(sensor.points, from, to);
    const [low, high] = inOrder(sensor, lowest, highest);
    [low, mean, high, last].forEach((value, place) => drawValue(values[place], sensor, value));
  });
}

function zoom(kind) {
  const { from, to } = range();
  const length = to - from;
  const moves = { in: [0.25, -0.25], out: [-0.5, 0.5], back: [-0.5, -0.5], forth: [0.5, 0.5] };
  if (kind === 'live') view = null;
  else view = { from: from + moves[kind][0] * length, to: to + moves[kind][1] * length };
  if (view && view.to - view.from < 2000) view = { from, to };
  if (view && (view.to >= programNow() && kind !== 'in' || view.to - view.from > 15 * 60000)) view = null;
  update();
}

function selectByPointer(box) {
  let begin = null;
  const mark = element('div', { class: 'select', hidden: true });
  box.append(mark);
  const place = (event) => Math.max(0, Math.min(box.clientWidth, event.clientX - box.getBoundingClientRect().left));
  const value = (x) => chart.scales.x.getValueForPixel(x - byId('canvas').offsetLeft);
  box.addEventListener('pointerdown', (event) => {
    if (event.pointerType === 'mouse' && chart) begin = place(event);
  });
  box.addEventListener('pointermove', (event) => {
    if (begin === null) return;
    const x = place(event);
    mark.hidden = false;
    mark.style.left = `${Math.min(begin, x)}px`;
    mark.style.width = `${Math.abs(x - begin)}px`;
  });
  addEventListener('pointerup', (event) => {
    if (begin === null) return;
    const [low, high] = [begin, place(event)].sort((a, b) => a - b);
    begin = null;
    mark.hidden = true;
    if (high - low > 12) {
      view = { from: value(low), to: value(high) };
      update();
    }
  });
}

export function start() {
  byId('minutes').addEventListener('change', (event) => {
    view = null;
    change({ minutes: Number(event.target.value) });
  });
  for (const each of document.querySelectorAll('[data-zoom]')) each.addEventListener('click', () => zoom(each.dataset.zoom));
  const box = byId('plot');
  box.addEventListener('keydown', (event) => {
    const kinds = { '+': 'in', '-': 'out', ArrowLeft: 'back', ArrowRight: 'forth', Home: 'live' };
    if (kinds[event.key]) {
      event.preventDefault();
      zoom(kinds[event.key]);
    }
  });
  box.addEventListener('dblclick', () => zoom('live'));
  selectByPointer(box);
  matchMedia('(prefers-color-scheme: dark)').addEventListener('change', rebuild);
}
