// What the page tells when the program or the car is gone.
'use strict';

const assert = require('node:assert/strict');
const { ended, firstLine, openPage, start, startDash, status, waitFor } = require('./dashrig.js');

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

module.exports = { testCarStops, testProgramStops };
