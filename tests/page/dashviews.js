// The views of the page with a car that drives, and how they are arranged.
'use strict';

const assert = require('node:assert/strict');
const path = require('node:path');
const { check, drawn, openPage, pictures, show, status, waitFor } = require('./dashrig.js');

async function testViews(browser, link) {
  const page = await openPage(browser, link);
  await waitFor(page, status('Live'));
  const number = "document.querySelector('[data-id=\"7E8/RPM\"] .number').textContent";
  await waitFor(page, `/^[0-9]{3,4}$/.test(${number})`); // other sensors may have come before
  const before = await page.evaluate(number);
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

module.exports = { testLayout, testLooks, testViews };
