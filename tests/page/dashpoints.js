// What the page keeps for its chart, without a browser.
'use strict';

const assert = require('node:assert/strict');
const fs = require('node:fs');
const path = require('node:path');

async function testPoints() {
  const source = fs.readFileSync(path.join(__dirname, '../../libvelmora/dash/page/points.js'), 'utf8');
  const { Points } = await import(`data:text/javascript,${encodeURIComponent(source)}`);
  const listed = (points) => Array.from({ length: points.size }, (_, i) => [points.time(i), points.value(i)]);

  const few = new Points();
  [[10, 1], [20, 2], [20, 9], [15, 9], [30, 3]].forEach(([time, value]) => few.add(time, value));
  assert.deepEqual(listed(few), [[10, 1], [20, 2], [30, 3]]); // nothing behind, nothing twice
  assert.deepEqual([5, 10, 11, 30, 31].map((time) => few.indexFrom(time)), [0, 0, 1, 2, 3]);
  few.merge([5, 20, 25], [0.5, 7, 2.5]);
  assert.deepEqual(listed(few), [[5, 0.5], [10, 1], [20, 2], [25, 2.5], [30, 3]]);

  const many = new Points();
  for (let i = 0; i < 20000; ++i) {
    many.add(i, i === 19500 ? 1000 : i % 7);
    many.trim(i - 15000, 6000);
  }
  assert.equal(many.size, 6000);
  assert.deepEqual([many.time(0), many.value(0), many.time(5999)], [14000, 0, 19999]);
  const taken = [];
  many.thinned(0, many.size, 100, (time, value) => taken.push([time, value]));
  assert.ok(taken.length > 120 && taken.length <= 4 * 61, `${taken.length} points`);
  assert.ok(taken.some(([time, value]) => time === 19500 && value === 1000), 'a peak is kept');
  assert.ok(taken.every(([time], index) => index === 0 || time > taken[index - 1][0]), 'in the order of time');
  many.trim(19990, 6000);
  assert.equal(many.size, 10);
}

module.exports = { testPoints };
