// The page as a whole: which view is shown, what the status line says, and when what is drawn.
import { byId, setText } from './tables.js';
import * as link from './link.js';
import * as store from './store.js';
import * as layout from './layout.js';
import * as limits from './limits.js';
import * as gauges from './gauges.js';
import * as numbers from './numbers.js';
import * as chart from './chartview.js';
import * as codes from './codes.js';
import * as topics from './topics.js';
import * as traffic from './traffic.js';
import * as picker from './picker.js';
import * as player from './player.js';
import * as performanceRuns from './performance.js';

const textMs = 100; // between two redraws of texts
const chartMs = 250; // and of the chart

let beat = null;
let frozen = false;
let lastReading = 0;
let usualGap = 100;
let spoken = '';

const views = [...document.querySelectorAll('[data-view]')].map((section) => section.dataset.view);

function current() {
  const name = location.hash.slice(2);
  return views.includes(name) ? name : 'gauges';
}

function showView() {
  const name = current();
  for (const section of document.querySelectorAll('[data-view]')) section.hidden = section.dataset.view !== name;
  for (const each of document.querySelectorAll('nav a')) {
    if (each.hash === `#/${name}`) each.setAttribute('aria-current', 'page');
    else each.removeAttribute('aria-current');
  }
  document.querySelector('nav a[aria-current]')?.scrollIntoView({ block: 'nearest', inline: 'nearest' });
  traffic.follow(name === 'traffic');
  if (name === 'chart') chart.rebuild();
  if (beat?.link && name === 'codes' && codes.wanted()) codes.ask();
  if (beat?.link && topics.isTopic(name) && topics.wanted(name)) topics.ask(name);
  drawTexts();
}

// The one line that tells how all stands; a reader of the screen hears it when it changes.
function status() {
  const program = link.programState();
  if (program === 'refused') return ['bad', 'Not let in: open the page with the link that the program printed'];
  if (program === 'gone') return ['bad', 'No connection to the program'];
  if (!beat) return ['wait', 'Connecting to the program'];
  if (beat.state === 'parked' || beat.state === 'settling') return ['warn', 'The car is parked: nothing is asked of it'];
  if (player.isPaused()) return ['warn', 'The recording is paused'];
  if (player.isOver()) return ['warn', 'The recording has ended'];
  if (!beat.link) return ['bad', `No link to the car${beat.trouble ? `: ${beat.trouble}` : ''}`];
  if (lastReading && performance.now() - lastReading > Math.max(1500, Math.min(6000, 5 * usualGap))) {
    return ['bad', 'The car does not answer'];
  }
  if (!lastReading) return ['wait', 'Waiting for the first values'];
  const number = codes.count();
  const beyond = limits.sentence(performance.now());
  const found = (number === 0 ? '' : number === 1 ? ', 1 trouble code' : `, ${number} trouble codes`) + (beyond && `, ${beyond}`);
  return [frozen || beyond ? 'warn' : 'good', `${frozen ? 'Frozen' : 'Live'}${found}`];
}

function drawStatus() {
  const [level, text] = status();
  const line = byId('status');
  line.dataset.level = level;
  setText(line, level === 'bad' ? text : spoken || text); // a loss is told at once, whatever is being said
}

function say(text) {
  spoken = text;
  drawStatus();
  setTimeout(() => (spoken = ''), 8000);
}

function drawTexts() {
  if (frozen || document.hidden) return;
  const now = link.programNow();
  if (current() === 'gauges') gauges.update(now);
  if (current() === 'numbers') numbers.update(now);
}

function takeReadings(event) {
  store.takeValues(event);
  const now = performance.now();
  if (lastReading) usualGap = usualGap * 0.9 + Math.min(now - lastReading, 5000) * 0.1;
  lastReading = now;
  for (const [id] of event.v) limits.note(store.sensors.get(id), now);
}

function takeHello(hello) {
  setText(byId('version'), hello.version);
  byId('clear').hidden = !hello.allow.clear;
  byId('consoleLink').hidden = !hello.allow.console;
  limits.take(hello.limits);
  store.takeOffered(hello.vehicle.offered, hello.resumed);
  layout.take(hello.layout);
  store.takeValues(hello.values);
  hello.history.forEach(store.takeHistory);
  codes.takeNews(hello.news);
  for (const answer of Object.values(hello.answers)) takeAnswer(answer);
  if (hello.performance) performanceRuns.take(hello.performance);
  beat = hello.beat;
  player.take(beat.play);
  layout.take(hello.layout);
  showView();
}

function takeAnswer(answer) {
  if (answer.topic === 'codes') codes.takeAnswer(answer);
  else if (answer.topic === 'console') traffic.takeReply(answer);
  else if (answer.topic === 'clear') say(`Clearing: ${codes.takeCleared(answer)}`);
  else if (answer.topic === 'performance') performanceRuns.takeAnswer(answer);
  else if (topics.isTopic(answer.topic)) topics.take(answer);
}

function freeze() {
  frozen = !frozen;
  byId('freeze').setAttribute('aria-pressed', String(frozen));
  drawStatus();
}

function startDisplay() {
  const dialog = byId('displayDialog');
  byId('display').addEventListener('click', () => {
    byId('units').value = layout.setting('units', 'metric');
    byId('theme').value = layout.setting('theme', 'auto');
    byId('size').value = layout.setting('size', 'normal');
    dialog.showModal();
  });
  for (const key of ['units', 'theme', 'size']) byId(key).addEventListener('change', (event) => layout.change({ [key]: event.target.value }));
  byId('displayDone').addEventListener('click', () => dialog.close());
}

function startControls() {
  byId('freeze').addEventListener('click', freeze);
  byId('speak').addEventListener('click', () => say(gauges.sentence()));
  byId('reset').addEventListener('click', () => {
    store.resetStatistics();
    drawTexts();
  });
  byId('arrange').addEventListener('click', (event) => {
    const on = event.currentTarget.getAttribute('aria-pressed') !== 'true';
    event.currentTarget.setAttribute('aria-pressed', String(on));
    gauges.arrange(on);
  });
  for (const each of document.querySelectorAll('[data-ask]')) {
    each.addEventListener('click', () => (each.dataset.ask === 'codes' ? codes.ask() : topics.ask(each.dataset.ask)));
  }
  addEventListener('hashchange', showView);
  document.addEventListener('visibilitychange', () => traffic.follow(current() === 'traffic'));
  document.addEventListener('keydown', (event) => {
    if (event.ctrlKey || event.altKey || event.metaKey || event.target.closest('input, select, dialog')) return;
    if (event.key === 'f') freeze();
    if (/^[1-8]$/.test(event.key)) location.hash = `/${views[Number(event.key) - 1]}`;
  });
}

async function start() {
  startControls();
  startDisplay();
  picker.start();
  chart.start();
  codes.start();
  traffic.start();
  performanceRuns.start();
  player.start();
  layout.onLayout(() => {
    gauges.rebuild();
    numbers.rebuild();
    chart.rebuild();
    performanceRuns.draw();
    drawTexts();
  });
  link.on('hello', takeHello);
  link.on('values', takeReadings);
  link.on('beat', (data) => {
    const up = !beat?.link && data.link;
    beat = data;
    player.take(data.play);
    if (!data.link) lastReading = 0;
    if (up) showView();
  });
  link.on('news', codes.takeNews);
  link.on('layout', layout.take);
  link.on('answer', takeAnswer);
  link.on('performance', performanceRuns.take);
  link.on('trouble', drawStatus);
  await link.login();
  link.open();
  showView();
  setInterval(drawStatus, 250);
  setInterval(drawTexts, textMs);
  setInterval(() => {
    if (!frozen && !document.hidden && current() === 'chart') chart.update();
  }, chartMs);
}

start();
