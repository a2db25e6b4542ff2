// Measures how the page's heap grows while a recording of an hour is played: node heap.js VELMORA [SPEED]. Nothing is
// asserted; docs/performance.md has the figures.
'use strict';

const { spawn } = require('node:child_process');
const fs = require('node:fs');
const os = require('node:os');
const path = require('node:path');
const puppeteer = require('puppeteer-core');

const [program, speedText = '20'] = process.argv.slice(2);
const seconds = 3600;
const sensors = 20;
const folder = fs.mkdtempSync(path.join(os.tmpdir(), 'velmora-heap-'));
const pause = (ms) => new Promise((resolve) => setTimeout(resolve, ms));

function recording() {
  const names = ['RPM (rpm)', 'SPEED (km/h)', 'ENGINE_LOAD (%)', ...Array.from({ length: sensors - 3 }, (_, i) => `PID_${i} (V)`)];
  const row = (_, second) => [new Date(1709802000000 + second * 1000).toISOString(),
    ...names.map((_name, i) => (50 + 40 * Math.sin(second / (7 + i))).toFixed(1))].join();
  const file = path.join(folder, 'hour.csv');
  fs.writeFileSync(file, [`time,${names.map((name) => `7E8 ${name}`).join()}`, ...Array.from({ length: seconds }, row), ''].join('\n'));
  return file;
}

// The smallest of three: on a busy machine the page has made new garbage before the size is told.
async function heap(page) {
  const sizes = [];
  for (let i = 0; i < 3; ++i) {
    const session = await page.createCDPSession();
    await session.send('HeapProfiler.collectGarbage');
    await session.detach();
    sizes.push((await page.metrics()).JSHeapUsedSize);
    await pause(300);
  }
  return Math.min(...sizes);
}

async function main() {
  const env = { ...process.env, VELMORA_SETTINGS: path.join(folder, 'settings.toml') };
  const dash = spawn(program, ['dash', '--play', recording(), '--speed', speedText, '--listen', '127.0.0.1:0'], { stdio: ['ignore', 'pipe', 'ignore'], env });
  const link = await new Promise((resolve) => dash.stdout.once('data', (data) => resolve(String(data).trim())));
  const browser = await puppeteer.launch({ executablePath: '/usr/bin/chromium', headless: true, args: ['--no-sandbox', '--disable-dev-shm-usage'] });
  const page = await browser.newPage();
  await page.goto(`${link}#/chart`);
  await page.waitForFunction("document.getElementById('status').textContent.startsWith('Live')", { timeout: 30000 });
  await pause(5000);
  const sizes = [await heap(page)];
  const part = (seconds * 1000) / Number(speedText) / 4;
  for (let i = 0; i < 3; ++i) {
    await pause((i === 0 ? part - 5000 : part) - 1000);
    sizes.push(await heap(page));
  }
  await page.waitForFunction("document.getElementById('status').textContent.startsWith('The recording has ended')", { timeout: 0, polling: 1000 });
  sizes.push(await heap(page));
  console.log(`${sensors} sensors over ${seconds / 60} minutes at ${speedText} times the speed, chart in view`);
  console.log(`heap after collecting, at first and after each quarter: ${sizes.map((each) => (each / 1e6).toFixed(2)).join(', ')} MB`);
  await browser.close();
  dash.kill('SIGTERM');
  fs.rmSync(folder, { recursive: true, force: true });
}

main();
