// Units on the page, held against the companion's labels:
//   node units_test.mjs UNITS_JS UNITLABEL_H
import assert from 'node:assert/strict';
import fs from 'node:fs';

const [script, header] = process.argv.slice(2);
const source = fs.readFileSync(script, 'utf8');
const units = await import(`data:text/javascript,${encodeURIComponent(source)}`);
const labels = new Set([...fs.readFileSync(header, 'utf8').matchAll(/return "([^"]+)"/g)].map((each) => each[1]));
const sensor = (unit, precision = 1) => ({ sensor: 'X', unit, precision, stats: { min: null, max: null } });

const table = source.slice(source.indexOf('const imperial = {'), source.indexOf('};', source.indexOf('const imperial = {')));
const metric = [...table.matchAll(/^ {2}'?([^':]+)'?: \['/gm)].map((each) => each[1]);
assert.ok(metric.length > 9 && metric.includes('l/100 km') && metric.includes('°C'), metric.join());
units.setSystem('imperial');
for (const unit of metric) {
  const shown = units.unitOf(sensor(unit));
  assert.notEqual(shown, unit);
  assert.ok(labels.has(shown), `${shown} is no label of the companion`);
}
assert.equal(units.withUnit(sensor('km/h', 0), 100), '62 mph');
assert.equal(units.withUnit(sensor('°C', 0), -40), '-40 °F');

// Consumption turns round: the less fuel, the more miles; an idling engine's is no number of miles.
const consumption = sensor('l/100 km');
assert.equal(units.withUnit(consumption, 10), '23.5 mpg');
assert.equal(units.withUnit(consumption, 0.9), '0.0 mpg');
assert.deepEqual(units.inOrder(consumption, 5, 10), [10, 5]);
assert.deepEqual(units.inOrder(consumption, 0.5, 10), [0.5, null]);
assert.deepEqual(units.inOrder(consumption, null, null), [null, null]);
assert.deepEqual(units.inOrder(sensor('km/h'), 5, 10), [5, 10]);
assert.ok(units.turnsRound(consumption) && !units.turnsRound(sensor('km/h')));
const dial = units.dialOf(consumption, [0, 20]);
assert.ok(dial.at(5) > dial.at(10) && dial.at(10) > dial.at(0.5) && dial.at(0.5) === 0);
assert.equal(dial.at(2), 1);
assert.deepEqual([dial.low, dial.high], [0, 60]);
const speed = units.dialOf(sensor('km/h'), [0, 200]);
assert.equal(Math.round(speed.high), 124);
assert.equal(speed.at(100), 0.5);

// Air by the height of a column, all else of pressure by its force; the whole parameter's key counts for its sensors.
const pressure = (key) => ({ ...sensor('kPa', 0), sensor: key });
assert.equal(units.withUnit(pressure('INTAKE_PRESSURE'), 100), '29.5 inHg');
assert.equal(units.withUnit(pressure('PID_6F_2'), 100), '29.5 inHg');
assert.equal(units.withUnit(pressure('FUEL_PRESSURE'), 100), '14.5 psi');
assert.equal(units.withUnit(pressure('PID_53'), 100), '401 inH2O');
assert.equal(units.withUnit({ ...sensor('V'), sensor: 'INTAKE_PRESSURE' }, 1), '1.0 V');

// Those of the United Kingdom differ by their gallon alone.
units.setSystem('imperial-uk');
assert.equal(units.withUnit(consumption, 10), '28.2 mpg (UK)');
assert.equal(units.withUnit(consumption, 0.9), '0.0 mpg (UK)');
assert.deepEqual(units.inOrder(consumption, 5, 10), [10, 5]);
assert.ok(labels.has('mpg') && units.isImperial('mpg (UK)') && !units.isImperial('l/100 km'));
assert.equal(units.withUnit(sensor('km/h', 0), 100), '62 mph');
assert.equal(units.withUnit(pressure('BAROMETRIC_PRESSURE'), 101), '29.8 inHg');

units.setSystem('metric');
assert.equal(units.withUnit(pressure('INTAKE_PRESSURE'), 100), '100 kPa');
assert.ok(!units.turnsRound(consumption));
assert.equal(units.withUnit(consumption, 10), '10.0 l/100 km');
assert.deepEqual(units.inOrder(consumption, 5, 10), [5, 10]);
assert.equal(units.dialOf(consumption, [0, 20]).at(10), 0.5);
