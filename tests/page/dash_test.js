// The page in a real browser, against the real program and the real simulator.
//   node dash_test.js VELMORA SCREENSHOT_FOLDER
// NODE_PATH names the folder with puppeteer-core and axe-core.
'use strict';

const fs = require('node:fs');
const { folder, launch, pictures, running, startDash } = require('./dashrig.js');
const { testDoors } = require('./dashdoors.js');
const { testHands } = require('./dashhands.js');
const { testCarStops, testProgramStops } = require('./dashloss.js');
const { testDialogue, testLimits, testPlay } = require('./dashplay.js');
const { testPoints } = require('./dashpoints.js');
const { testLayout, testLooks, testViews } = require('./dashviews.js');

async function main() {
  fs.mkdirSync(pictures, { recursive: true });
  const browsers = [await launch(), await launch()];
  const timer = setTimeout(() => {
    console.error('This takes too long');
    for (const child of running) child.kill('SIGKILL');
    process.exit(1);
  }, 270000);
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
  await step('keeps the points of a chart', testPoints);
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
  await step('plays a dialogue', () => testDialogue(browsers[0]));
  await step('marks values beyond their limits', () => testLimits(browsers[0]));
  await step('is worked by hand, and draws no more than it must', () => testHands(browsers[0]));
  await step('lets in nobody without the token', () => testDoors(browsers[1]));
  clearTimeout(timer);
  for (const child of running) child.kill('SIGKILL');
  await Promise.all(browsers.map((browser) => browser.close()));
  fs.rmSync(folder, { recursive: true, force: true });
  process.exit(failed === 0 ? 0 : 1);
}

main();
