// What passes between program and adapter, as long as it is looked at, and the console.
import { byId } from './tables.js';
import { post } from './link.js';

const most = 500;

let source = null;
let lines = [];
let held = false;

function clock(ms) {
  const time = new Date(ms);
  return time.toTimeString().slice(0, 8) + '.' + String(time.getMilliseconds()).padStart(3, '0');
}

function draw() {
  if (held) return;
  const box = byId('trafficBox');
  const atEnd = box.scrollTop + box.clientHeight > box.scrollHeight - 40;
  byId('trafficLines').textContent = lines.map(([time, way, text]) => `${clock(time)} ${way} ${text}`).join('\n');
  if (atEnd) box.scrollTop = box.scrollHeight;
}

// Who was too slow, or comes again, gets lines a second time: each has a number, which begins anew with the program.
function joined(known, told) {
  const last = known.at(-1)?.[3] ?? 0;
  if ((told.at(-1)?.[3] ?? 0) < last) return told;
  return known.concat(told.filter(([, , , number]) => number > last)).slice(-most);
}

// A stream of its own, which only who looks pays for.
export function follow(wanted) {
  if (!wanted || document.hidden) {
    source?.close();
    source = null;
  } else if (!source) {
    lines = [];
    source = new EventSource('/traffic');
    source.addEventListener('lines', (event) => {
      lines = joined(lines, JSON.parse(event.data));
      draw();
    });
  }
}

function say(text) {
  const box = byId('consoleLines');
  box.textContent += (box.textContent ? '\n' : '') + text;
  box.parentElement.scrollTop = box.parentElement.scrollHeight;
}

export function takeReply(answer) {
  if (!answer.done) say(answer.data);
  else say(`> ${answer.data.command}\n${answer.data.answered ? answer.data.reply : '(no answer)'}`);
}

async function send() {
  const text = byId('command').value.trim();
  if (!text) return;
  byId('command').value = '';
  const reply = await post('/ask', { topic: 'console', text });
  if (!reply.ok) say(reply.text);
}

export function start() {
  byId('send').addEventListener('click', send);
  byId('command').addEventListener('keydown', (event) => {
    if (event.key === 'Enter') send();
  });
  byId('holdTraffic').addEventListener('click', (event) => {
    held = !held;
    event.currentTarget.setAttribute('aria-pressed', String(held));
    draw();
  });
}
