// Recordings on the page, whose values are known.
'use strict';

const assert = require('node:assert/strict');
const fs = require('node:fs');
const path = require('node:path');
const { check, ended, firstLine, folder, openPage, pictures, start, status, waitFor } = require('./dashrig.js');

// Ten minutes: 800 rpm and one more each second.
function drive() {
  const file = path.join(folder, 'drive.csv');
  const row = (_, i) => `2024-03-07T09:${String(Math.floor(i / 60)).padStart(2, '0')}:${String(i % 60).padStart(2, '0')}.000Z,${800 + i},${i % 120}`;
  fs.writeFileSync(file, ['time,7E8 RPM (rpm),7E8 SPEED (km/h)', ...Array.from({ length: 600 }, row), ''].join('\n'));
  return file;
}

async function goTo(page, seconds) {
  await page.evaluate((place) => {
    const range = document.getElementById('playPlace');
    range.value = String(place);
    range.dispatchEvent(new Event('change'));
  }, seconds * 1000);
}

// A recording is played, held, and entered elsewhere.
async function testPlay(browser) {
  const child = start(['dash', '--play', drive(), '--speed', '4', '--listen', '127.0.0.1:0']);
  const page = await openPage(browser, await firstLine(child));
  await waitFor(page, status('Live'));
  await waitFor(page, "/^[0-9]+:[0-9]{2} of 9:59$/.test(document.getElementById('playTime').textContent)");
  const number = "Number(document.querySelector('[data-id=\"7E8/RPM\"] .number').textContent)";
  await waitFor(page, `${number} > 804`);
  await page.click('#playPause');
  await waitFor(page, status('The recording is paused'));
  await goTo(page, 300);
  await waitFor(page, `${number} === 1100`);
  for (const [name, width, limit] of [['laptop', 1280, 130], ['phone', 390, 200], ['small', 320, 240]]) {
    await page.setViewport({ width, height: 800 });
    await page.screenshot({ path: path.join(pictures, `gauges-play-${name}.png`) });
    assert.ok(await page.evaluate('document.documentElement.scrollWidth <= innerWidth'), `the player is too wide on a ${name}`);
    const height = await page.$eval('header', (each) => each.offsetHeight);
    assert.ok(height < limit, `the player takes ${height} px on a ${name}`);
  }
  await check(page, 'a recording');
  assert.deepEqual(page.problems, []);
  await page.close();
  child.kill('SIGTERM');
  await ended(child);
}

// A dialogue has the time that its replies took: here a second each.
async function testDialogue(browser) {
  const file = path.join(folder, 'drive.dialogue');
  const hex = (number) => number.toString(16).toUpperCase().padStart(4, '0').replace(/(..)(..)/, '$1 $2');
  const turn = (_, i) => `-> 010C\n.. 1000\n<- 7E8 04 41 0C ${hex(4 * (800 + i))}\\r\\r>`;
  fs.writeFileSync(file, ['vehicle: made up', 'adapter: ELM327 v1.5', 'protocol: 6', 'headers: on', '',
    '-> 0100', '<- 7E8 06 41 00 BE 1F A8 12\\r\\r>', ...Array.from({ length: 121 }, turn), ''].join('\n'));
  const child = start(['dash', '--play', file, '--listen', '127.0.0.1:0']);
  const page = await openPage(browser, await firstLine(child));
  await waitFor(page, status('Live'));
  await waitFor(page, "/^0:0[0-9] of 2:00$/.test(document.getElementById('playTime').textContent)");
  await page.click('#playPause');
  await goTo(page, 100);
  await waitFor(page, "document.querySelector('[data-id=\"7E8/RPM\"] .number')?.textContent === '900'");
  assert.deepEqual(page.problems, []);
  await page.close();
  child.kill('SIGTERM');
  await ended(child);
}

// By sign, word and colour, on gauge, number and chart, and for who listens.
async function testLimits(browser) {
  const set = start(['settings', 'limit.RPM', '1000']);
  await ended(set);
  const child = start(['dash', '--play', drive(), '--speed', '0.125', '--listen', '127.0.0.1:0']);
  const page = await openPage(browser, await firstLine(child));
  await waitFor(page, status('Live'));
  const card = 'document.querySelector(\'[data-id="7E8/RPM"]\')';
  const told = `${card}.querySelector('.face').getAttribute('aria-valuetext')`;
  await waitFor(page, `/^80[0-9] rpm$/.test(${told})`);
  assert.equal(await page.$eval('#playSpeed', (each) => each.selectedOptions[0]?.textContent), '0.125');
  assert.equal(await page.evaluate(`${card}.classList.contains('beyond')`), false);
  await goTo(page, 300);
  await waitFor(page, `/^1100 rpm, above its limit of 1000 rpm$/.test(${told})`);
  await waitFor(page, status('Live, 7E8 RPM beyond its limit'));
  assert.equal(await page.evaluate(`${card}.querySelector('.sign').textContent + ${card}.querySelector('.age').textContent`), '!above 1000');
  assert.equal(await page.evaluate(`${card}.querySelectorAll('.mark[visibility=visible]').length`), 1);
  const red = await page.evaluate("getComputedStyle(document.querySelector('.beyond .number')).color");
  assert.notEqual(red, await page.evaluate("getComputedStyle(document.querySelector('[data-id=\"7E8/SPEED\"] .number')).color"));
  await check(page, 'a gauge beyond its limit');
  await page.evaluate("location.hash = '/numbers'");
  await waitFor(page, "document.querySelector('tr[data-id=\"7E8/RPM\"] td.beyond')?.textContent === '! 1100, above its limit of 1000 rpm'");
  await page.evaluate("location.hash = '/chart'");
  await waitFor(page, "document.querySelector('#figures td.beyond')?.textContent.startsWith('! 1100')");
  await waitFor(page, `(() => { const c = document.getElementById('canvas'); const wanted = ${JSON.stringify(red)}.match(/[0-9]+/g).map(Number);
    const d = c.getContext('2d').getImageData(0, 0, c.width, c.height).data; let n = 0;
    for (let i = 0; i < d.length; i += 4) n += d[i + 3] === 255 && wanted.every((each, k) => Math.abs(d[i + k] - each) < 3); return n > 100; })()`);
  await page.screenshot({ path: path.join(pictures, 'chart-limit.png') });
  assert.deepEqual(page.problems, []);
  await page.close();
  child.kill('SIGTERM');
  await ended(child);
}

module.exports = { testDialogue, testLimits, testPlay };
