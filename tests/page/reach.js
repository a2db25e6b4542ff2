// Measures what the page costs: node reach.js VELMORA [SECONDS]. Nothing is asserted; docs/performance.md has the figures.
'use strict';

const { spawn } = require('node:child_process');
const fs = require('node:fs');
const os = require('node:os');
const path = require('node:path');
const puppeteer = require('puppeteer-core');

const [program, secondsText = '30'] = process.argv.slice(2);
const seconds = Number(secondsText);
const folder = fs.mkdtempSync(path.join(os.tmpdir(), 'velmora-reach-'));
const pause = (ms) => new Promise((resolve) => setTimeout(resolve, ms));

// Seconds of processor time that a process has used.
function used(pid) {
  const fields = fs.readFileSync(`/proc/${pid}/stat`, 'utf8').split(') ')[1].split(' ');
  return (Number(fields[11]) + Number(fields[12])) / 100;
}

function median(values) {
  return values.sort((a, b) => a - b)[values.length >> 1];
}

async function main() {
  // The car runs in a process of its own, so that it is not counted.
  const car = spawn(program, ['simulate', '--vehicle', 'petrol-can11', '--listen', 'tcp://127.0.0.1:0'], { stdio: ['ignore', 'pipe', 'ignore'] });
  const port = await new Promise((resolve) => car.stdout.once('data', (data) => resolve(String(data).trim())));
  const env = { ...process.env, STATE_DIRECTORY: folder, VELMORA_SETTINGS: path.join(folder, 'settings.toml') };
  const dash = spawn(program, ['--port', port, 'dash', 'all', '--listen', '127.0.0.1:0'], { stdio: ['ignore', 'pipe', 'ignore'], env });
  const link = await new Promise((resolve) => dash.stdout.once('data', (data) => resolve(String(data).trim())));
  const browsers = await Promise.all([1, 2, 3].map(() => puppeteer.launch({ executablePath: '/usr/bin/chromium', headless: true, args: ['--no-sandbox', '--disable-dev-shm-usage'] })));
  const pages = [];
  for (const browser of browsers) {
    const page = await browser.newPage();
    await page.goto(link);
    await page.waitForFunction("document.getElementById('status').textContent.startsWith('Live')", { timeout: 30000 });
    pages.push(page);
  }
  await pages[0].evaluate("location.hash = '/chart'");
  await pages[1].evaluate("location.hash = '/numbers'");
  await pause(3000);
  const sensors = await pages[1].evaluate("document.querySelectorAll('#numbers tbody tr').length");
  const before = await Promise.all(pages.map((page) => page.metrics()));
  const cpu = used(dash.pid);
  const begin = Date.now();
  await pause(seconds * 1000);
  const elapsed = (Date.now() - begin) / 1000;
  const after = await Promise.all(pages.map((page) => page.metrics()));
  console.log(`${sensors} sensors in the table, ${elapsed.toFixed(0)} s, three browsers`);
  console.log(`program: ${((100 * (used(dash.pid) - cpu)) / elapsed).toFixed(1)} % of a core`);
  ['chart', 'numbers', 'gauges'].forEach((view, index) =>
    console.log(`main thread, ${view}: ${((100 * (after[index].TaskDuration - before[index].TaskDuration)) / elapsed).toFixed(1)} %`));

  const paints = [];
  let weight = 0;
  for (let i = 0; i < 5; ++i) {
    const page = await browsers[2].newPage();
    await page.setCacheEnabled(false);
    await page.goto(`${link}#/chart`);
    await pause(1500);
    paints.push(await page.evaluate("performance.getEntriesByType('paint').find((each) => each.name === 'first-contentful-paint').startTime"));
    weight = await page.evaluate("[...performance.getEntriesByType('resource'), ...performance.getEntriesByType('navigation')].reduce((sum, each) => sum + each.transferSize, 0)");
    await page.close();
  }
  console.log(`first paint, median of five: ${median(paints).toFixed(0)} ms`);
  console.log(`transferred with the chart: ${(weight / 1024).toFixed(0)} KiB`);
  const end = Date.now();
  dash.kill('SIGTERM');
  await new Promise((resolve) => dash.once('exit', resolve));
  console.log(`end with three browsers connected: ${Date.now() - end} ms`);
  car.kill('SIGTERM');
  await Promise.all(browsers.map((browser) => browser.close()));
  fs.rmSync(folder, { recursive: true, force: true });
}

main();
