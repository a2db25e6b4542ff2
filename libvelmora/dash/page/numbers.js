// All sensors that are read, as a table with their statistics.
import { byId, element, setText } from './tables.js';
import { chosen } from './layout.js';
import { ageText, isStale } from './gauges.js';
import { drawValue, makeValue } from './limits.js';
import { sensors, titleOf } from './store.js';
import { inOrder, show, unitOf } from './units.js';

const heads = [['Sensor', null], ['Value', 'right'], ['Unit', null], ['Lowest', 'right'], ['Mean', 'right'], ['Highest', 'right'], ['Age', 'right']];
const rows = new Map();

function makeRow(id) {
  const cells = heads.map(([, type], index) =>
    element(index === 0 ? 'th' : 'td', { class: index === 1 ? 'right value' : type, scope: index === 0 ? 'row' : null }));
  const value = makeValue();
  cells[1].append(...value.nodes);
  return { row: element('tr', { 'data-id': id }, ...cells), cells, value };
}

export function rebuild() {
  const table = byId('numbers');
  if (!table.tHead) {
    table.append(element('thead', {}, element('tr', {}, ...heads.map(([text, type]) => element('th', { scope: 'col', class: type }, text)))), element('tbody'));
  }
  const ids = chosen('numbers');
  const body = table.tBodies[0];
  for (const [id, { row }] of rows) {
    if (!ids.includes(id)) {
      row.remove();
      rows.delete(id);
    }
  }
  ids.forEach((id, index) => {
    if (!rows.has(id)) rows.set(id, makeRow(id));
    const { row } = rows.get(id);
    if (body.children[index] !== row) body.insertBefore(row, body.children[index] ?? null);
  });
}

export function update(now) {
  if (chosen('numbers').length !== rows.size) rebuild();
  for (const [id, { row, cells, value }] of rows) {
    const sensor = sensors.get(id);
    if (!sensor) continue;
    const { min, max, sum, count } = sensor.stats;
    const [low, high] = inOrder(sensor, min, max);
    const stale = sensor.time > 0 && isStale(sensor, now);
    row.classList.toggle('stale', stale);
    drawValue(value, sensor, sensor.value);
    const texts = [titleOf(sensor), null, unitOf(sensor), show(sensor, low),
      show(sensor, count ? sum / count : null), show(sensor, high), sensor.time === 0 ? 'never' : stale ? ageText(now - sensor.time) : 'now'];
    texts.forEach((text, index) => text !== null && setText(cells[index], text));
  }
}
