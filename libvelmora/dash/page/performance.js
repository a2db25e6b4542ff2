// Timed runs: the program reads speed and engine speed alone for as long, and tells what came of it.
import { byId, element, setText, svg, table } from './tables.js';
import { post } from './link.js';
import { setting } from './layout.js';

let runs = null;
let trouble = '';
let drawn = '';

const imperial = () => setting('units', 'metric') !== 'metric';
const speedText = (kmh) => (imperial() ? `${Math.round(kmh * 0.621371)} mph` : `${Math.round(kmh)} km/h`);
const powerText = (kw) => (imperial() ? `${Math.round(kw * 1.3410221)} hp` : `${Math.round(kw)} kW`);

export function take(data) {
  runs = data;
  draw();
}

export function takeAnswer(answer) {
  trouble = answer.done ? '' : answer.data;
  draw();
}

async function ask() {
  const reply = await post('/ask', { topic: 'performance', text: runs?.active ? 'end' : 'begin' });
  trouble = reply.ok ? '' : reply.text;
  draw();
}

function goalRow(goal) {
  if (goal.seconds == null) return [goal.name, ['–', 'right'], ['', 'right'], ''];
  const end = goal.name === 'quarter mile' ? speedText(goal.end_kmh) : '';
  return [goal.name, [`${goal.seconds.toFixed(2)} s`, 'right'], [`± ${goal.error_s.toFixed(2)} s`, 'right'], end];
}

function powerRow(point, highest) {
  const bar = svg('svg', { viewBox: '0 0 120 14', width: 120, height: 14, 'aria-hidden': 'true' },
    svg('line', { x1: 4, x2: 4 + (112 * point.kw) / highest, y1: 7, y2: 7, class: 'bartrack', 'stroke-width': 8 }));
  return [`${point.rpm} rpm`, [powerText(point.kw), 'right'], [`${Math.round(point.nm)} Nm`, 'right'], bar];
}

function parts() {
  const wanted = imperial() ? '0 to 100 km/h' : '0 to 60 mph'; // the other one is left out
  const goals = runs.goals.filter((goal) => goal.name !== wanted).map(goalRow);
  const highest = Math.max(...runs.power.map((point) => point.kw), 1);
  const list = [table(['Run', ['Time', 'right'], ['Error', 'right'], 'Speed at the end'], goals, 'Times'),
    element('p', { class: 'faint' }, `The start is reckoned back from the first readings that rise. Speed comes in whole km/h${runs.interval_s ? ` each ${Math.round(runs.interval_s * 1000)} ms` : ''}.`)];
  if (runs.power.length) {
    list.push(element('h3', {}, `Highest power and torque by engine speed, for ${runs.weight_kg} kg`),
      table(['Engine speed', ['Power', 'right'], ['Torque', 'right'], ''], runs.power.map((point) => powerRow(point, highest)), 'Power and torque'));
  }
  return list;
}

export function draw() {
  byId('runs').setAttribute('aria-pressed', String(Boolean(runs?.active)));
  setText(byId('runs'), runs?.active ? 'End timing' : 'Time runs');
  setText(byId('runState'), trouble || (runs?.active ? `${speedText(runs.kmh)}, ${runs.state}` : 'Only speed and engine speed are read while runs are timed.'));
  byId('runExport').hidden = !runs;
  const shape = JSON.stringify([runs?.goals, runs?.power, imperial()]);
  if (shape === drawn) return; // a reader of the screen is left alone by what stays the same
  drawn = shape;
  byId('runResults').replaceChildren(...(runs ? parts() : []));
}

export function start() {
  byId('runs').addEventListener('click', ask);
}
