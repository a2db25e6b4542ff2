// The page in a real browser, against the real program and the real simulator.
//   node dash_test.js VELMORA SCREENSHOT_FOLDER
// NODE_PATH names the folder with puppeteer-core and axe-core.
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

async function testViews(browser, link) {
  const page = await openPage(browser, link);
  await waitFor(page, status('Live'));
  const number = "document.querySelector('[data-id=\"7E8/RPM\"] .number').textContent";
  const before = await page.evaluate(number);
  assert.match(before, /^\d{3,4}$/);
  await waitFor(page, `${number} !== ${JSON.stringify(before)}`);
  await waitFor(page, "document.getElementById('count').textContent === '3'"); // a code appears by itself
  await show(page, 'codes');
  await waitFor(page, "document.getElementById('codes').textContent.includes('Freeze frame of P0133')");
  assert.match(await page.$eval('#codes', (each) => each.textContent), /O2 Sensor Circuit Slow Response/);
  await show(page, 'readiness');
  await waitFor(page, "document.getElementById('readiness').textContent.includes('2 not complete')");
  await show(page, 'monitors');
  await waitFor(page, "document.getElementById('monitors').textContent.includes('1 failed')");
  await show(page, 'info');
  await waitFor(page, "document.getElementById('info').textContent.includes('VELMRAS1MM0000001')");
  await show(page, 'traffic');
  await waitFor(page, "/> 01 ?0C/.test(document.getElementById('trafficLines').textContent)");
  await show(page, 'performance');
  await page.click('#runs');
  await waitFor(page, "/^[0-9]+ km.h, (standing|running|stand still)/.test(document.getElementById('runState').textContent)");
  await waitFor(page, "/0 to 100 km.h/.test(document.getElementById('runResults').textContent)");
  const run = await page.evaluate("fetch(document.getElementById('runExport').href).then((each) => each.json())");
  assert.equal(run.weight_kg, 1500);
  assert.ok(Array.isArray(run.speed) && run.active);
  await show(page, 'traffic'); // nothing but the two is asked meanwhile
  await waitFor(page, "(() => { const lines = document.getElementById('trafficLines').textContent.split('\\n').filter((line) => /> 01/.test(line)).slice(-12); return lines.length === 12 && lines.every((line) => /> 01 ?0[CD]/.test(line)); })()");
  await show(page, 'performance');
  await page.click('#runs');
  await waitFor(page, "document.getElementById('runs').textContent === 'Time runs'");
  await show(page, 'chart');
  await waitFor(page, `document.getElementById('canvas').width > 300 && ${drawn} > 2000`);
  await waitFor(page, "document.getElementById('figures').rows.length === 4");
  await page.focus('#plot');
  await page.keyboard.press('+');
  await page.keyboard.press('Home');
  assert.deepEqual(page.problems, []);
  return page;
}

// By keyboard alone: six gauges become seven, in another order; a reload and another browser find them so.
async function testLayout(page, other, link) {
  const ids = "[...document.querySelectorAll('#gauges > li')].map((each) => each.dataset.id).join()";
  await show(page, 'gauges');
  await page.focus('[data-pick="gauges"]');
  await page.keyboard.press('Enter');
  await page.focus('#find');
  await page.keyboard.type('timing');
  await page.focus('#offered input');
  await page.keyboard.press('Space');
  await page.focus('#pickerDone');
  await page.keyboard.press('Enter');
  await waitFor(page, "document.querySelectorAll('#gauges > li').length === 7");
  await waitFor(page, "/\\d/.test(document.querySelector('[data-id=\"7E8/TIMING_ADVANCE\"] .number').textContent)");
  await page.focus('#arrange');
  await page.keyboard.press('Enter');
  await page.focus('[data-id="7E8/TIMING_ADVANCE"] [data-step="-1"]');
  for (let i = 0; i < 6; ++i) await page.keyboard.press('Enter');
  const order = await page.evaluate(ids);
  assert.match(order, /^7E8\/TIMING_ADVANCE,/);
  await new Promise((resolve) => setTimeout(resolve, 600));
  await page.reload();
  await waitFor(page, `${ids} === ${JSON.stringify(order)}`);
  const second = await openPage(other, link);
  await waitFor(second, `${ids} === ${JSON.stringify(order)}`);
  await second.evaluate(() => document.getElementById('display').click());
  await second.select('#units', 'imperial');
  await waitFor(page, "document.querySelector('[data-id=\"7E8/SPEED\"] .unit').textContent === 'mph'"); // both see it
  await second.select('#units', 'metric');
  await second.close();
}

async function testLooks(page) {
  const sizes = [['phone', { width: 390, height: 844, deviceScaleFactor: 2, isMobile: true, hasTouch: true }],
    ['laptop', { width: 1280, height: 800 }], ['screen', { width: 1920, height: 1080 }]];
  for (const [name, size] of sizes) {
    await page.setViewport(size);
    for (const scheme of ['light', 'dark']) {
      await page.emulateMediaFeatures([{ name: 'prefers-color-scheme', value: scheme }]);
      for (const view of ['gauges', 'numbers', 'chart', 'codes', 'readiness', 'monitors', 'info', 'performance', 'help']) {
        if (name === 'screen' && view !== 'gauges' && view !== 'chart') continue;
        await show(page, view);
        await waitFor(page, status('Live'));
        await new Promise((resolve) => setTimeout(resolve, 300));
        await page.screenshot({ path: path.join(pictures, `${view}-${name}-${scheme}.png`) });
        assert.ok(await page.evaluate('document.documentElement.scrollWidth <= innerWidth'), `${view} is too wide on a ${name}`);
        if (name !== 'screen') await check(page, `${view} on a ${name}, ${scheme}`);
      }
    }
  }
  await page.setViewport({ width: 320, height: 568 });
  await show(page, 'gauges');
  assert.ok(await page.evaluate('document.documentElement.scrollWidth <= innerWidth'), 'scrolls sideways at 320 px');
  const tree = await page.accessibility.snapshot();
  const meters = [];
  const collect = (node) => (node.role === 'meter' ? meters.push(node) : (node.children ?? []).forEach(collect));
  collect(tree);
  const speed = meters.find((each) => each.name.endsWith('Engine RPM'));
  assert.ok(speed?.value > 100, `what a reader of the screen finds: ${JSON.stringify(meters)}`);
  assert.match(await page.$eval('[data-id="7E8/RPM"] .face', (each) => each.getAttribute('aria-valuetext')), /^[0-9]+ rpm/);
}

// A program that stops dead raises no error by itself.
async function testProgramStops(page, dash) {
  await page.setViewport({ width: 1280, height: 800 });
  await waitFor(page, status('Live'));
  const begin = Date.now();
  dash.child.kill('SIGSTOP');
  await waitFor(page, status('No connection to the program'), 4000);
  assert.ok(Date.now() - begin < 2000, `told after ${Date.now() - begin} ms`);
  dash.child.kill('SIGCONT');
  await waitFor(page, status('Live'));
  const end = Date.now();
  dash.child.kill('SIGTERM');
  await ended(dash.child);
  assert.ok(Date.now() - end < 1000, `ended after ${Date.now() - end} ms`);
  await waitFor(page, status('No connection to the program'), 2000);
}

async function testCarStops(browser) {
  const car = start(['simulate', '--vehicle', 'petrol-can11', '--listen', 'tcp://127.0.0.1:0']);
  const dash = await startDash(await firstLine(car));
  const page = await openPage(browser, dash.link);
  await waitFor(page, status('Live'));
  await new Promise((resolve) => setTimeout(resolve, 1000));
  const begin = Date.now();
  car.kill('SIGSTOP');
  await waitFor(page, status('The car does not answer'), 4000);
  assert.ok(Date.now() - begin < 2000, `told after ${Date.now() - begin} ms`);
  car.kill('SIGCONT');
  await waitFor(page, status('Live'));
  await page.close();
  dash.child.kill('SIGTERM');
  car.kill('SIGTERM');
  await Promise.all([ended(dash.child), ended(car)]);
}

// A recording is played, held, and entered elsewhere.
async function testPlay(browser) {
  const file = path.join(folder, 'drive.csv');
  const row = (_, i) => `2024-03-07T09:${String(Math.floor(i / 60)).padStart(2, '0')}:${String(i % 60).padStart(2, '0')}.000Z,${800 + i},${i % 120}`;
  fs.writeFileSync(file, ['time,7E8 RPM (rpm),7E8 SPEED (km/h)', ...Array.from({ length: 600 }, row), ''].join('\n'));
  const child = start(['dash', '--play', file, '--speed', '4', '--listen', '127.0.0.1:0']);
  const page = await openPage(browser, await firstLine(child));
  await waitFor(page, status('Live'));
  await waitFor(page, "/^[0-9]+:[0-9]{2} of 9:59$/.test(document.getElementById('playTime').textContent)");
  const number = "Number(document.querySelector('[data-id=\"7E8/RPM\"] .number').textContent)";
  await waitFor(page, `${number} > 804`);
  await page.click('#playPause');
  await waitFor(page, status('The recording is paused'));
  await page.evaluate(() => {
    const place = document.getElementById('playPlace');
    place.value = '300000';
    place.dispatchEvent(new Event('change'));
  });
  await waitFor(page, `${number} === 1100`);
  for (const [name, width] of [['laptop', 1280], ['phone', 390], ['small', 320]]) {
    await page.setViewport({ width, height: 800 });
    await page.screenshot({ path: path.join(pictures, `gauges-play-${name}.png`) });
    assert.ok(await page.evaluate('document.documentElement.scrollWidth <= innerWidth'), `the player is too wide on a ${name}`);
    const height = await page.$eval('header', (each) => each.offsetHeight);
    assert.ok(height < 300, `the player takes ${height} px on a ${name}`);
  }
  await check(page, 'a recording');
  assert.deepEqual(page.problems, []);
  await page.close();
  child.kill('SIGTERM');
  await ended(child);
}

async function testDoors(browser) {
  const dash = await startDash('sim:petrol-can11?instant', '--allow-clear', '--allow-console');
  const { port } = new URL(dash.link);
  const bare = await openPage(browser, `http://127.0.0.1:${port}/`);
  await waitFor(bare, status('Not let in'));
  await bare.close();
  const evil = await browser.newPage();
  assert.equal((await evil.goto(`http://evil.test:${port}/`)).status(), 421);
  await evil.close();

  const page = await openPage(browser, dash.link);
  await waitFor(page, status('Live'));
  assert.equal(await page.evaluate('location.hash + document.cookie'), ''); // neither fragment nor cookie can be read
  const cross = await browser.newPage();
  await cross.goto('about:blank');
  const refused = await cross.evaluate(async (where) => {
    try {
      await fetch(`${where}ask`, { method: 'POST', body: '{"topic":"codes"}', credentials: 'include' });
      return 'went through';
    } catch {
      return 'refused';
    }
  }, `http://127.0.0.1:${port}/`);
  assert.equal(refused, 'refused');
  await cross.close();
  await page.reload();
  await waitFor(page, status('Live')); // still let in
  await show(page, 'console');
  await page.type('#command', 'ATI');
  await page.keyboard.press('Enter');
  await waitFor(page, "document.getElementById('consoleLines').textContent.includes('ELM327')");
  await show(page, 'codes');
  await page.click('#clear');
  await page.click('#clearYes');
  await waitFor(page, "document.getElementById('codes').textContent.includes('cleared')");
  await waitFor(page, "document.getElementById('count').textContent === '1'"); // the permanent one stays
  await page.close();
  dash.child.kill('SIGTERM');
  await ended(dash.child);
}

async function main() {
  fs.mkdirSync(pictures, { recursive: true });
  const launch = () => puppeteer.launch({ executablePath: '/usr/bin/chromium', headless: true,
    args: ['--no-sandbox', '--disable-dev-shm-usage', '--host-resolver-rules=MAP evil.test 127.0.0.1'] });
  const browsers = [await launch(), await launch()];
  const timer = setTimeout(() => {
    console.error('This takes too long');
    for (const child of running) child.kill('SIGKILL');
    process.exit(1);
  }, 200000);
  let failed = 0;
  const step = async (name, action) => {
    try {
      await action();
      console.log(`ok ${name}`);
    } catch (error) {
      ++failed;
      console.log(`FAILED ${name}: ${error.stack}`);
    }
  };
  const dash = await startDash('sim:petrol-can11');
  let page;
  await step('shows all views of a car', async () => (page = await testViews(browsers[0], dash.link)));
  if (page) {
    await step('keeps its layout, for other browsers too', () => testLayout(page, browsers[1], dash.link));
    await step('looks well and is accessible in all sizes', () => testLooks(page));
    await step('tells within 2 s that the program is gone', () => testProgramStops(page, dash));
  }
  await step('tells within 2 s that the car does not answer', () => testCarStops(browsers[0]));
  await step('plays a recording', () => testPlay(browsers[0]));
  await step('lets in nobody without the token', () => testDoors(browsers[1]));
  clearTimeout(timer);
  for (const child of running) child.kill('SIGKILL');
  await Promise.all(browsers.map((browser) => browser.close()));
  fs.rmSync(folder, { recursive: true, force: true });
  process.exit(failed === 0 ? 0 : 1);
}

main();
