// What hands do on the page, and how often it draws by itself.
'use strict';

const assert = require('node:assert/strict');
const { ended, openPage, show, startDash, status, waitFor } = require('./dashrig.js');

const wait = (ms) => new Promise((resolve) => setTimeout(resolve, ms));
const theChart = "window.Chart.getChart('canvas')";
const span = `(${theChart}.scales.x.max - ${theChart}.scales.x.min)`;

// How often texts and chart are drawn in two seconds, of a car that tells more than that.
async function testRates(page) {
  await page.evaluate(() => {
    window.texts = 0; // a gauge sets its arc each time that it is drawn
    new MutationObserver((list) => (window.texts += list.length))
      .observe(document.querySelector('[data-id="7E8/RPM"] .arc'), { attributeFilter: ['stroke-dashoffset'] });
  });
  await wait(2000);
  const texts = await page.evaluate('window.texts');
  assert.ok(texts > 2 && texts <= 22, `texts are drawn ${texts} times in two seconds`);
  await show(page, 'chart');
  await waitFor(page, `window.Chart && ${theChart}?.data.datasets.some((each) => each.data.length > 3)`);
  await page.evaluate(() => {
    const chart = window.Chart.getChart('canvas');
    const update = chart.update.bind(chart);
    window.draws = 0;
    chart.update = (...all) => update(...all, (window.draws += 1));
  });
  await wait(2000);
  const draws = await page.evaluate('window.draws');
  assert.ok(draws > 1 && draws <= 9, `${draws} redraws in two seconds`);
}

// By the mouse over the chart, and by buttons.
async function testZoom(page) {
  assert.ok(await page.evaluate(`Object.keys(${theChart}.scales).length >= 4`), 'an axis for each unit');
  const whole = await page.evaluate(span);
  const box = await (await page.$('#plot')).boundingBox();
  await page.mouse.move(box.x + box.width * 0.4, box.y + box.height / 2);
  await page.mouse.down();
  await page.mouse.move(box.x + box.width * 0.6, box.y + box.height / 2, { steps: 4 });
  await page.mouse.up();
  await waitFor(page, `${span} < ${whole / 3}`);
  const held = await page.evaluate(`${theChart}.scales.x.min`);
  await wait(600);
  assert.equal(await page.evaluate(`${theChart}.scales.x.min`), held); // what is looked at stands still
  await page.click('[data-zoom="in"]');
  await waitFor(page, `${span} < ${whole / 6}`);
  const nearer = await page.evaluate(`${theChart}.scales.x.min`);
  await page.click('[data-zoom="back"]');
  await waitFor(page, `${theChart}.scales.x.min < ${nearer}`);
  await page.click('[data-zoom="live"]');
  await waitFor(page, `Math.abs(${span} - ${whole}) < 10`);
}

async function testDrag(page) {
  await show(page, 'gauges');
  await page.click('#arrange');
  const ids = "[...document.querySelectorAll('#gauges > li')].map((each) => each.dataset.id)";
  const before = await page.evaluate(ids);
  await page.evaluate(() => {
    const cards = document.querySelectorAll('#gauges > li');
    const dataTransfer = new DataTransfer();
    const send = (card, name) => card.dispatchEvent(new DragEvent(name, { bubbles: true, cancelable: true, dataTransfer }));
    if (!cards[2].draggable) return;
    send(cards[2], 'dragstart');
    send(cards[0], 'dragover');
    send(cards[0], 'drop');
  });
  await waitFor(page, `${ids}.join() === ${JSON.stringify([before[2], before[0], before[1], ...before.slice(3)].join())}`);
}

// A tab that nobody sees gives its stream back, and takes it again.
async function testHidden(page) {
  const hide = (hidden) => page.evaluate((value) => {
    Object.defineProperty(document, 'hidden', { value, configurable: true });
    document.dispatchEvent(new Event('visibilitychange'));
  }, hidden);
  await hide(true);
  await waitFor(page, status('No connection to the program'), 4000);
  await hide(false);
  await waitFor(page, status('Live'));
}

async function testHands(browser) {
  const dash = await startDash('sim:petrol-can11?instant');
  const page = await openPage(browser, dash.link);
  await waitFor(page, status('Live'));
  await testRates(page);
  await testZoom(page);
  await testDrag(page);
  await testHidden(page);
  assert.deepEqual(page.problems, []);
  await page.close();
  dash.child.kill('SIGTERM');
  await ended(dash.child);
}

module.exports = { testHands };
