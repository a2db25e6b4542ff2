// Who is let in to the page, and what for.
'use strict';

const assert = require('node:assert/strict');
const { ended, openPage, show, startDash, status, waitFor } = require('./dashrig.js');

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

module.exports = { testDoors };
