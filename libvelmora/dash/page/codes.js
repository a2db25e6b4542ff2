// Trouble codes: those that the program looks after, and all about them when they were asked for.
import { byId, button, element, facts, setText, table, tag } from './tables.js';
import { post } from './link.js';

const kinds = { confirmed: ['Confirmed', 'bad'], pending: ['Pending', 'warn'], permanent: ['Permanent', 'bad'] };

let current = []; // {module, code, kind, text}
let report = null; // the answer
let busy = false;

export function count() {
  return new Set(current.map((each) => each.module + each.code)).size;
}

export function takeNews(news) {
  current = news.codes;
  const number = count();
  const mark = byId('count');
  mark.hidden = number === 0;
  setText(mark, String(number));
  draw();
}

export function takeAnswer(answer) {
  report = answer;
  busy = false;
  draw();
}

export function ask() {
  busy = true;
  draw();
  return post('/ask', { topic: 'codes' }).then((reply) => {
    if (!reply.ok) takeAnswer({ done: false, data: reply.text, time: Date.now() });
  });
}

export function wanted() {
  return !report && !busy;
}

function lampText(lamp) {
  if (lamp == null) return tag('Lamp: not told', 'faint');
  return lamp ? tag('Lamp: on', 'bad') : tag('Lamp: off', 'good');
}

function list(kind, told) {
  const [title, level] = kinds[kind];
  if (told.answer !== 'read') {
    return element('p', { class: 'faint' }, `${title}: ${told.answer}${told.reason ? `, ${told.reason}` : ''}`);
  }
  if (told.codes.length === 0) return element('p', {}, tag(`${title}: none stored`, 'good'));
  return element('div', {}, ...told.codes.map((each) => element('p', {}, element('span', { class: 'code' }, each.code), ' ', tag(title, level),
    ' ', each.meaning?.text ?? meanings(each), each.meaning?.maker && each.meaning.maker !== 'Generic' ? ` (${each.meaning.maker})` : '')));
}

function meanings(code) {
  const number = code.meanings?.length ?? 0;
  return number > 1 ? `has ${number} meanings, one for each maker` : 'has no known meaning';
}

function freeze(report, id) {
  const frame = report.freeze;
  if (report.answer !== 'read') return null;
  if (!frame) return element('p', { class: 'faint' }, 'No freeze frame stored');
  const rows = frame.readings.filter((each) => each.value != null).map((each) => [each.name, [each.value, 'right'], each.unit]);
  return element('details', {}, element('summary', {}, `Freeze frame of ${frame.code.code}`),
    table(['Sensor', ['Value', 'right'], 'Unit'], rows, `Freeze frame of ${id}`));
}

function moduleCard(module) {
  const codes = module.codes;
  return element('article', { class: 'card' },
    element('h3', {}, `${module.name ?? 'Control module'} ${module.id} `, lampText(codes.lamp)),
    ...['confirmed', 'pending', 'permanent'].filter((kind) => codes[kind]).map((kind) => list(kind, codes[kind])),
    freeze(module.freeze, module.id));
}

// What the program sees by itself, until all was asked for.
function known() {
  if (current.length === 0) return element('p', { class: 'faint' }, 'The program has seen no trouble code so far.');
  return table(['Code', 'Kind', 'Meaning', 'Module'], current.map((each) =>
    [element('span', { class: 'code' }, each.code), tag(...kinds[each.kind]), each.text, each.module]), 'Codes seen by the program');
}

function differs() {
  if (!report?.done) return false;
  const told = new Set(report.data.flatMap((module) => Object.keys(kinds).flatMap((kind) => (module.codes[kind]?.codes ?? []).map((each) => `${module.id} ${kind} ${each.code}`))));
  return current.length !== told.size || current.some((each) => !told.has(`${each.module} ${each.kind} ${each.code}`));
}

function draw() {
  const open = [...byId('codes').querySelectorAll('details')].map((each) => each.open);
  const parts = [];
  if (busy) parts.push(element('p', { class: 'faint' }, 'Asking the control modules …'));
  if (report && !report.done) parts.push(element('p', { class: 'bad' }, report.data));
  if (report?.done && !differs()) parts.push(...report.data.map(moduleCard));
  else {
    if (report?.done) parts.push(element('p', { class: 'warn' }, 'The codes have changed since they were read.'));
    parts.push(known());
  }
  if (report) parts.push(element('p', { class: 'faint' }, `Read at ${new Date(report.time).toLocaleTimeString()}`));
  byId('codes').replaceChildren(...parts.filter(Boolean));
  byId('codes').querySelectorAll('details').forEach((each, index) => (each.open = open[index] ?? false));
}

// What came of clearing.
export function takeCleared(answer) {
  const text = answer.done
    ? answer.data.map((each) => `${each.name ?? ''} ${each.id}: ${each.result}${each.reason ? `, ${each.reason}` : ''}`).join('; ')
    : answer.data;
  byId('codes').prepend(element('p', { class: answer.done && answer.data.every((each) => each.cleared) ? 'good' : 'bad' }, text.trim()));
  return text;
}

export function start() {
  byId('clear').addEventListener('click', () => byId('clearDialog').showModal());
  byId('clearNo').addEventListener('click', () => byId('clearDialog').close());
  byId('clearYes').addEventListener('click', async () => {
    byId('clearDialog').close();
    const reply = await post('/ask', { topic: 'clear', sure: true });
    if (!reply.ok) takeCleared({ done: false, data: reply.text });
  });
}
