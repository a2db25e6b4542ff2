// What a report must show: the rows that its JSON document asks of the tables of the other forms, and the cars whose
// reports are held against that.
'use strict';

const assert = require('node:assert/strict');
const fs = require('node:fs');
const path = require('node:path');

const vehicles = path.join(__dirname, '..', '..', 'simulator', 'vehicles');
const dialogues = path.join(__dirname, '..', 'dialogues');

// A car whose names and identifiers are what HTML and Markdown would take for marks.
const wicked = { name: '<i>|', calibration: '<script>|*_x&#' };

function wickedCar(folder) {
  const file = path.join(folder, 'wicked.toml');
  const text = fs.readFileSync(path.join(vehicles, 'petrol-can11.toml'), 'utf8')
    .replace('"ECM-EngineControl"', `"${wicked.name}-*_\`[x](#y)"`)
    .replace('"VS16-MT-0420"', `"${wicked.calibration}"`);
  fs.writeFileSync(file, text);
  return file;
}

// A recording whose path is one long word, as some are: it must not make the page wider than a phone.
function farAway(folder, name) {
  const far = path.join(folder, 'a'.repeat(100));
  fs.mkdirSync(far);
  fs.copyFileSync(path.join(dialogues, name), path.join(far, name));
  return path.join(far, name);
}

// Cars with much and with little to tell.
const carsIn = (folder) => ({
  petrol: 'sim:petrol-can11?instant',
  diesel: 'sim:diesel-can29?instant',
  legacy: 'sim:petrol-iso9141?instant',
  two: 'sim:two-can29-250?instant',
  wicked: `sim:${wickedCar(folder)}?instant`,
  recorded: `replay:${farAway(folder, 'can11-jaguar-2014-two-modules-come-and-go.dialogue')}`,
});

const shown = (text) => text ?? '-';

function counterRow({ name, value }) {
  const half = / (Completion (Conditions? )?Counts|Conditions Encountered Counts)/;
  return half.test(name) && !name.startsWith('OBD ') ? [name.replace(half, ''), String(value)] : [name, String(value)];
}

const testRow = (test) => [test.result ?? 'constant', `${test.id} ${test.description ?? ''}`.trim(), shown(test.value),
  shown(test.minimum), shown(test.maximum), shown(test.unit)];

// The rows of one control module: cells that stand in one row, in this order.
function rowsOf(module) {
  const rows = [];
  for (const [kind, title] of [['confirmed', 'Confirmed'], ['pending', 'Pending'], ['permanent', 'Permanent']]) {
    for (const code of module.codes[kind]?.codes ?? []) rows.push([title, code.code]);
  }
  if (module.freeze.freeze) rows.push([module.freeze.freeze.code.code]);
  for (const reading of module.freeze.freeze?.readings ?? []) rows.push([reading.name, shown(reading.value), shown(reading.unit)]);
  for (const each of module.readiness.monitors) rows.push([each.name, each.sinceCleared, shown(each.thisCycle)]);
  for (const value of module.values) rows.push([value.name, shown(value.value), shown(value.unit)]);
  for (const monitor of module.monitors.monitors) {
    rows.push([`${monitor.id} ${monitor.description ?? ''}`.trim()]);
    rows.push(...monitor.tests.map(testRow));
  }
  for (const sensor of module.oxygen.sensors) rows.push(...(sensor.tests ?? []).map(testRow));
  rows.push(...module.counters.counters.map(counterRow));
  if (module.info.vin) rows.push(['VIN', module.info.vin]);
  for (const each of module.info.calibrations) {
    if (each.id) rows.push(['Calibration', each.id]);
    if (each.verification) rows.push(['Verification number', each.verification]);
  }
  return rows;
}

const holds = (row, cells) => {
  let next = 0;
  for (const cell of row) if (next < cells.length && cell === cells[next]) ++next;
  return next === cells.length;
};

// tables: the rows of a form (heads are rows, too) by the control module that they stand under, the others under ''.
function expectRows(json, tables, what) {
  let count = 0;
  for (const module of json.modules) {
    const rows = tables.get(module.id) ?? [];
    for (const cells of rowsOf(module)) {
      assert.ok(rows.some((row) => holds(row, cells)), `${what}, ${module.id}: no row with ${JSON.stringify(cells)}`);
      ++count;
    }
    const named = `${module.id}${module.name ? ` ${module.name}` : ''}`;
    assert.ok(tables.get('').some((row) => row[0] === named), `${what}: ${named} is not among the modules`);
  }
  for (const finding of json.findings.filter((each) => !each.suggestion)) {
    assert.ok(tables.get('').some((row) => holds(row, [finding.what, finding.module, finding.text])), `${what}: ${finding.text}`);
  }
  return count;
}

module.exports = { carsIn, expectRows, wicked };
