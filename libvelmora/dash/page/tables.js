// Makes pieces of the page. Texts are always texts: what a car or an adapter says never becomes markup.

export const byId = (id) => document.getElementById(id);

// element('td', {class: 'right'}, 'text', otherElement)
export function element(name, attributes = {}, ...children) {
  const made = document.createElement(name);
  for (const [key, value] of Object.entries(attributes)) {
    if (value === true) made.setAttribute(key, '');
    else if (value !== false && value != null) made.setAttribute(key, value);
  }
  made.append(...children.filter((child) => child != null));
  return made;
}

export function svg(name, attributes = {}, ...children) {
  const made = document.createElementNS('http://www.w3.org/2000/svg', name);
  for (const [key, value] of Object.entries(attributes)) made.setAttribute(key, value);
  made.append(...children);
  return made;
}

// Only what differs is touched: a reader of the screen and the layout are left alone by what stays the same.
export function setText(node, text) {
  if (node.textContent !== text) node.textContent = text;
}

export function button(label, action, attributes = {}) {
  const made = element('button', { type: 'button', ...attributes }, label);
  made.addEventListener('click', action);
  return made;
}

// heads: texts, or [text, class]. rows: lists of cells, the first one being the row's head.
export function table(heads, rows, label) {
  const pair = (each) => (Array.isArray(each) ? each : [each, null]);
  const head = element('tr', {}, ...heads.map(pair).map(([text, type]) => element('th', { scope: 'col', class: type }, text)));
  const body = rows.map((row) => element('tr', {}, ...row.map(pair).map(([content, type], index) =>
    element(index === 0 ? 'th' : 'td', { scope: index === 0 ? 'row' : null, class: type }, content ?? ''))));
  const made = element('table', {}, element('thead', {}, head), element('tbody', {}, ...body));
  return element('div', { class: 'scroll', role: 'region', 'aria-label': label, tabindex: '0' }, made);
}

export function facts(pairs) {
  const told = pairs.filter(([, value]) => value != null && value !== '');
  return element('dl', { class: 'facts' }, ...told.flatMap(([name, value]) => [element('dt', {}, name), element('dd', {}, value)]));
}

export function tag(text, level) {
  return element('span', { class: `tag ${level}` }, text);
}
