// Readiness, monitor test results and vehicle information: asked for when they are first looked at.
import { byId, element, facts, svg, table, tag } from './tables.js';
import { post } from './link.js';

const answers = {};
const busy = new Set();

const makers = { readiness, monitors, info };

export function isTopic(name) {
  return name in makers;
}

export function wanted(topic) {
  return !answers[topic] && !busy.has(topic);
}

export function take(answer) {
  answers[answer.topic] = answer;
  busy.delete(answer.topic);
  draw(answer.topic);
}

export async function ask(topic) {
  busy.add(topic);
  draw(topic);
  const reply = await post('/ask', { topic });
  if (!reply.ok) take({ topic, done: false, data: reply.text, time: Date.now() });
}

function draw(topic) {
  const answer = answers[topic];
  const parts = [];
  if (busy.has(topic)) parts.push(element('p', { class: 'faint' }, 'Asking the control modules …'));
  if (answer && !answer.done) parts.push(element('p', { class: 'bad' }, answer.data));
  if (answer?.done) parts.push(...answer.data.map(makers[topic]));
  if (answer) parts.push(element('p', { class: 'faint' }, `Read at ${new Date(answer.time).toLocaleTimeString()}`));
  byId(topic).replaceChildren(...parts);
}

function card(module, ...content) {
  return element('article', { class: 'card' }, element('h3', {}, `${module.name ?? 'Control module'} ${module.id}`), ...content);
}

function untold(module) {
  return card(module, element('p', { class: 'faint' }, `This module: ${module.answer}`));
}

function readiness(module) {
  if (module.answer !== 'read') return untold(module);
  const level = { complete: 'good', 'not complete': 'warn' };
  const status = (text) => (text ? tag(text, level[text] ?? 'faint') : '');
  const open = module.notComplete;
  return card(module,
    element('p', {}, open === 0 ? tag('Ready', 'good') : tag(`${open} not complete`, 'warn'), open === 0 ? ' All monitors have run.' : ' An emissions test may be refused until they have run.'),
    table(['Monitor', 'Since codes were cleared', 'This drive'], module.monitors.filter((each) => each.sinceCleared !== 'not available')
      .map((each) => [each.name, status(each.sinceCleared), status(each.thisCycle)]), `Monitors of ${module.id}`));
}

// Where the value stands between its limits.
function bar(test) {
  const [value, low, high] = [test.value, test.minimum, test.maximum].map((text) => (text == null || text === '' ? NaN : Number(text)));
  if (![value, low, high].every(Number.isFinite) || low >= high || test.result === 'no result') return '';
  const reach = Math.max(high, value) - Math.min(low, value);
  const place = (number) => 4 + (112 * (number - Math.min(low, value))) / reach;
  return svg('svg', { viewBox: '0 0 120 14', width: 120, height: 14, 'aria-hidden': 'true' },
    svg('line', { x1: place(low), x2: place(high), y1: 7, y2: 7, class: 'bartrack', 'stroke-width': 8, 'stroke-linecap': 'round' }),
    svg('line', { x1: place(value), x2: place(value), y1: 1, y2: 13, class: 'bar', 'stroke-width': 3 }));
}

function monitors(module) {
  if (module.answer !== 'read') return untold(module);
  const level = { passed: 'good', failed: 'bad' };
  const row = (test) => [test.description, tag(test.result ?? 'constant', level[test.result] ?? 'faint'),
    [test.value, 'right'], [test.minimum, 'right'], [test.maximum, 'right'], test.unit, bar(test)];
  const failed = module.monitors.flatMap((monitor) => monitor.tests).filter((test) => test.result === 'failed').length;
  const tables = module.monitors.flatMap((monitor) => [element('h4', {}, monitor.description),
    table(['Test', 'Result', ['Value', 'right'], ['Lowest', 'right'], ['Highest', 'right'], 'Unit', 'Place'], monitor.tests.map(row), `${monitor.description}, ${module.id}`)]);
  return card(module, element('p', {}, failed === 0 ? tag('None failed', 'good') : tag(`${failed} failed`, 'bad')), ...tables);
}

function reading(value) {
  return value ? `${value.value} ${value.unit ?? ''}`.trim() : null;
}

function info(module) {
  return card(module, facts([['Description', module.description], ['VIN', module.vin], ['Standard', module.standard], ['Protocol', module.protocol],
    ...(module.calibrations ?? []).map((each) => ['Calibration', each.verification ? `${each.id} (${each.verification})` : each.id]),
    ['Engine serial number', module.engineSerialNumber], ['EROTAN', module.erotan],
    ['Distance with the lamp on', reading(module.withLamp?.distance)], ['Time with the lamp on', reading(module.withLamp?.runTime)],
    ['Distance since codes were cleared', reading(module.sinceCleared?.distance)], ['Time since codes were cleared', reading(module.sinceCleared?.runTime)]]));
}
