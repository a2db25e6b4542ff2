// What the tests of the page share: the program, browsers, and how a page is waited for.
'use strict';

const assert = require('node:assert/strict');
const { spawn } = require('node:child_process');
const fs = require('node:fs');
const os = require('node:os');
const path = require('node:path');
const puppeteer = require('puppeteer-core');

const [program, pictures] = process.argv.slice(2);
const axeSource = fs.readFileSync(require.resolve('axe-core/axe.min.js'), 'utf8');
const folder = fs.mkdtempSync(path.join(os.tmpdir(), 'velmora-page-'));
const running = new Set();
const limitMs = 15000;

function start(args) {
  const child = spawn(program, args, {
    stdio: ['ignore', 'pipe', 'ignore'],
    env: { ...process.env, STATE_DIRECTORY: folder, VELMORA_SETTINGS: path.join(folder, 'settings.toml') },
  });
  running.add(child);
  child.on('exit', () => running.delete(child));
  return child;
}

// The first line that a program prints.
function firstLine(child) {
  return new Promise((resolve, reject) => {
    let text = '';
    child.stdout.on('data', (data) => {
      text += data;
      if (text.includes('\n')) resolve(text.split('\n')[0]);
    });
    child.on('exit', () => reject(new Error('the program ended')));
  });
}

async function startDash(port, ...more) {
  const child = start(['--port', port, 'dash', '--listen', '127.0.0.1:0', ...more]);
  return { child, link: await firstLine(child) };
}

function ended(child) {
  return new Promise((resolve) => child.once('exit', resolve));
}

const status = (text) => `document.getElementById('status').textContent.startsWith(${JSON.stringify(text)})`;
const waitFor = (page, expression, timeout = limitMs) => page.waitForFunction(expression, { timeout, polling: 50 });

async function openPage(browser, link) {
  const page = await browser.newPage();
  page.problems = [];
  page.on('pageerror', (error) => page.problems.push(error.message));
  page.on('console', (message) => message.type() === 'error' && page.problems.push(message.text()));
  await page.setViewport({ width: 1280, height: 800 });
  await page.goto(link);
  return page;
}

async function show(page, view) {
  await page.evaluate((name) => (location.hash = `/${name}`), view);
}

async function check(page, what) {
  await page.evaluate(axeSource);
  const result = await page.evaluate(
    "axe.run(document,{runOnly:['wcag2a','wcag2aa','wcag21a','wcag21aa','wcag22aa','best-practice']})");
  const found = result.violations.filter((each) => ['serious', 'critical'].includes(each.impact));
  assert.deepEqual(found.map((each) => `${what}: ${each.id} ${each.nodes[0].html}`), []);
}

// How many points of the chart's canvas are drawn on.
const drawn = `(() => { const c = document.getElementById('canvas');
  const d = c.getContext('2d').getImageData(0, 0, c.width, c.height).data;
  let n = 0; for (let i = 3; i < d.length; i += 4) n += d[i] > 0; return n; })()`;

const launch = () => puppeteer.launch({ executablePath: '/usr/bin/chromium', headless: true,
  args: ['--no-sandbox', '--disable-dev-shm-usage', '--host-resolver-rules=MAP evil.test 127.0.0.1'] });

module.exports = { check, drawn, ended, firstLine, folder, launch, openPage, pictures, program, running, show, start, startDash, status, waitFor };
