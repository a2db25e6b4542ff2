// The HTML report: held against two checkers of HTML, opened and printed by a real browser.
//   node report_test.js VELMORA [FOLDER_FOR_PICTURES]
// NODE_PATH names the folder with html-validate, vnu-jar, puppeteer-core and axe-core. Needs java, chromium and pdftotext.
'use strict';

const assert = require('node:assert/strict');
const { execFileSync, spawnSync } = require('node:child_process');
const fs = require('node:fs');
const os = require('node:os');
const path = require('node:path');
const { pathToFileURL } = require('node:url');
const { HtmlValidate } = require('html-validate');
const vnuJar = require('vnu-jar');
const puppeteer = require('puppeteer-core');
const { carsIn, expectRows } = require('./reportrows.js');

const [program, pictures] = process.argv.slice(2);
const axeSource = fs.readFileSync(require.resolve('axe-core/axe.min.js'), 'utf8');
const folder = fs.mkdtempSync(path.join(os.tmpdir(), 'velmora-report-'));

function makeReports() {
  const reports = {};
  for (const [name, port] of Object.entries(carsIn(folder))) {
    const html = path.join(folder, `${name}.html`);
    const json = path.join(folder, `${name}.json`);
    execFileSync(program, ['-q', '-p', port, 'scan', '--inspection', 'us-california', '--model-year', '2015', '--vehicle',
      '<script>alert(1)</script> & "co"', '--report', html, '--report', json], {
      stdio: ['ignore', 'ignore', 'inherit'],
      env: { ...process.env, VELMORA_SETTINGS: path.join(folder, 'none.toml') },
    });
    reports[name] = { html, url: pathToFileURL(html).href, json: JSON.parse(fs.readFileSync(json, 'utf8')) };
  }
  return reports;
}

async function holdAgainstCheckers(reports) {
  const files = Object.values(reports).map((report) => report.html);
  const vnu = spawnSync('java', ['-jar', String(vnuJar), '--stdout', '--Werror', '--format', 'text', ...files], { encoding: 'utf8' });
  assert.equal(vnu.status, 0, `vnu: ${vnu.error ?? vnu.stdout + vnu.stderr}`);
  const validator = new HtmlValidate({ extends: ['html-validate:recommended', 'html-validate:document'] });
  for (const file of files) {
    const result = await validator.validateFile(file);
    const messages = result.results.flatMap((each) => each.messages.map((m) => `${m.line}: ${m.ruleId} ${m.message}`));
    assert.deepEqual(messages, [], file);
  }
}

// What a person must find again: codes, values and modules, each text once.
function wantedTexts(json) {
  const texts = new Set();
  for (const module of json.modules) {
    texts.add(module.id);
    for (const kind of ['confirmed', 'pending', 'permanent']) {
      for (const code of module.codes[kind]?.codes ?? []) texts.add(code.code);
    }
    for (const value of module.values) texts.add(value.value);
    for (const monitor of module.monitors.monitors) {
      for (const test of monitor.tests) texts.add(test.value);
    }
    for (const counter of module.counters.counters) texts.add(String(counter.value));
    for (const reading of module.freeze.freeze?.readings ?? []) texts.add(reading.value);
  }
  for (const finding of json.findings) finding.evidence.forEach((each) => texts.add(each.text));
  texts.delete(null);
  return [...texts];
}

const joined = (text) => text.replace(/\s+/g, '');

async function openPage(browser, report, problems) {
  const page = await browser.newPage();
  page.on('pageerror', (error) => problems.push(error.message));
  page.on('request', (request) => request.url() === report.url || problems.push(`asks for ${request.url()}`));
  page.on('dialog', (dialog) => problems.push(`a script ran: ${dialog.message()}`));
  await page.goto(report.url);
  return page;
}

async function checkScreen(page, name) {
  for (const scheme of ['light', 'dark']) {
    await page.emulateMediaFeatures([{ name: 'prefers-color-scheme', value: scheme }]);
    for (const width of [360, 1100]) {
      await page.setViewport({ width, height: 900 });
      const wide = await page.evaluate('document.documentElement.scrollWidth - innerWidth');
      assert.ok(wide <= 0, `${name} is ${wide} too wide at ${width}`);
      if (pictures) await page.screenshot({ path: path.join(pictures, `report-${name}-${scheme}-${width}.png`), fullPage: true });
    }
    await page.evaluate(axeSource);
    const axe = await page.evaluate("axe.run(document,{runOnly:['wcag2a','wcag2aa','wcag21aa','wcag22aa','best-practice']})");
    assert.deepEqual(axe.violations.map((each) => `${each.id}: ${each.nodes[0].html}`), [], `${name} ${scheme}`);
  }
}

// The texts of each table's head and rows, as they are to be found on paper.
const tablesOf = (page) => page.evaluate(() => [...document.querySelectorAll('table')].map((table) => ({
  head: table.tHead?.innerText ?? '',
  rows: [...table.tBodies[0].rows].map((row) => [...row.cells].map((cell) => cell.innerText)),
})));

// The same by control module: the sections of one follow its own.
const rowsByModule = (page) => page.evaluate(() => {
  const all = [['', []]];
  let current = all[0];
  for (const section of document.querySelectorAll('section')) {
    if (section.id.startsWith('info-')) all.push(current = [section.id.slice('info-'.length), []]);
    else if (section.id === 'adapter') current = all[0];
    const rows = [...section.querySelectorAll('tr')];
    current[1].push(...rows.map((row) => [...row.cells].map((cell) => cell.textContent.replace(/\s+/g, ' ').trim())));
  }
  return all;
});

async function checkPaper(page, report, name, format) {
  const file = path.join(folder, `${name}-${format}.pdf`);
  await page.pdf({ path: file, format, printBackground: false, preferCSSPageSize: true });
  const size = execFileSync('pdfinfo', [file], { encoding: 'utf8' }).match(/Page size: +([\d.]+) x ([\d.]+)/);
  const expected = format === 'A4' ? [595, 842] : [612, 792];
  expected.forEach((points, i) => assert.ok(Math.abs(size[i + 1] - points) < 2, `${format} is ${size[0]}`));
  const pages = execFileSync('pdftotext', ['-layout', file, '-'], { encoding: 'utf8' }).split('\f').slice(0, -1);
  const raw = joined(execFileSync('pdftotext', ['-raw', file, '-'], { encoding: 'utf8' }));
  for (const table of await tablesOf(page)) {
    for (const cell of table.rows.flat()) {
      for (const word of cell.split(/\s+/)) assert.ok(raw.includes(word), `${name} ${format}: "${word}" is cut`);
    }
  }
  for (const text of wantedTexts(report.json)) assert.ok(raw.includes(joined(text)), `${name} ${format}: "${text}"`);
  return pages;
}

// A table that goes on on the next page begins there with its head again.
async function checkHeads(browser, report) {
  const page = await browser.newPage();
  const long = fs.readFileSync(report.html, 'utf8').replace(/(<th scope="col">Monitor<\/th>[^]*?<tbody>\n)(<tr>.*<\/tr>\n)/,
    (all, head, row) => head + Array.from({ length: 120 }, (_, i) => row.replace(/<td>[^<]*<\/td>/, `<td>Long${i}</td>`)).join(''));
  const file = path.join(folder, 'long.html');
  fs.writeFileSync(file, long);
  await page.goto(pathToFileURL(file).href);
  for (const format of ['A4', 'Letter']) {
    const pdf = path.join(folder, 'long.pdf');
    await page.pdf({ path: pdf, format, printBackground: false });
    const pages = execFileSync('pdftotext', ['-layout', pdf, '-'], { encoding: 'utf8' }).split('\f');
    const found = pages.filter((each) => /Long\d/.test(each));
    assert.ok(found.length > 2, `${found.length} pages with rows`);
    for (const each of found) assert.ok(each.search(/Since codes were/) >= 0 && each.search(/Since codes were/) < each.search(/Long\d/), each);
    for (let i = 0; i < 120; ++i) assert.ok(pages.some((each) => new RegExp(`Long${i}\\b`).test(each)), `row ${i}`);
  }
  await page.close();
}

async function checkInBrowser(reports) {
  const browser = await puppeteer.launch({
    executablePath: '/usr/bin/chromium', headless: true, args: ['--no-sandbox', '--disable-dev-shm-usage'],
  });
  try {
    for (const [name, report] of Object.entries(reports)) {
      const problems = [];
      const page = await openPage(browser, report, problems);
      const text = joined(await page.evaluate('document.body.textContent'));
      for (const wanted of wantedTexts(report.json)) assert.ok(text.includes(joined(wanted)), `${name}: "${wanted}"`);
      assert.ok(text.includes(joined('<script>alert(1)</script> & "co"')), 'the name stays text');
      assert.ok(expectRows(report.json, new Map(await rowsByModule(page)), name) >= 5, `${name} tells something`);
      await checkScreen(page, name);
      await page.emulateMediaType('print');
      for (const [format, width] of [['A4', 703], ['Letter', 725]]) {
        await page.setViewport({ width, height: 1000 });
        const wide = await page.evaluate('document.documentElement.scrollWidth - innerWidth');
        assert.ok(wide <= 0, `${name} is ${wide} too wide for ${format}`);
        await checkPaper(page, report, name, format);
      }
      assert.deepEqual(problems, [], name);
      await page.close();
    }
    await checkHeads(browser, reports.petrol);
  } finally {
    await browser.close();
  }
}

async function main() {
  if (pictures) fs.mkdirSync(pictures, { recursive: true });
  const reports = makeReports();
  await holdAgainstCheckers(reports);
  await checkInBrowser(reports);
}

main()
  .catch((error) => {
    console.error(error);
    process.exitCode = 1;
  })
  .finally(() => fs.rmSync(folder, { recursive: true, force: true }));
