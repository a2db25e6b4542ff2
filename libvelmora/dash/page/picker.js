// The list in which the sensors of a view are chosen.
import { byId, element } from './tables.js';
import { change, chosen } from './layout.js';
import { moduleCount, offered } from './store.js';

const most = { gauges: 24, chart: 6, numbers: 64 };
const titles = { gauges: 'Choose sensors for the gauges', chart: 'Choose sensors for the chart', numbers: 'Choose sensors for the table' };

let view = 'gauges';
let picked = [];

function fill() {
  const words = byId('find').value.toLowerCase().split(/\s+/).filter(Boolean);
  const several = moduleCount() > 1;
  const fits = (each) => words.every((word) => `${each.name} ${each.sensor} ${each.pid} ${each.module}`.toLowerCase().includes(word));
  byId('offered').replaceChildren(...offered.filter(fits).map((each) => {
    const box = element('input', { type: 'checkbox' });
    box.checked = picked.includes(each.id);
    box.disabled = !box.checked && picked.length >= most[view];
    box.addEventListener('change', () => {
      picked = box.checked ? [...picked, each.id] : picked.filter((id) => id !== each.id);
      note();
    });
    return element('li', {}, element('label', {}, box, each.name, element('small', {}, `${several ? each.module + ' ' : ''}${each.unit}`)));
  }));
}

function note() {
  byId('pickerNote').textContent = `${picked.length} chosen, ${most[view]} at most`;
  const full = picked.length >= most[view];
  for (const box of byId('offered').querySelectorAll('input')) box.disabled = full && !box.checked;
}

function show(name) {
  view = name;
  picked = [...chosen(name)];
  byId('pickerTitle').textContent = titles[name];
  byId('find').value = '';
  fill();
  note();
  byId('picker').showModal();
}

function done() {
  byId('picker').close();
  change({ [view]: picked });
}

export function start() {
  for (const each of document.querySelectorAll('[data-pick]')) each.addEventListener('click', () => show(each.dataset.pick));
  byId('find').addEventListener('input', fill);
  byId('pickerDone').addEventListener('click', done);
  byId('pickerCancel').addEventListener('click', () => byId('picker').close());
}
