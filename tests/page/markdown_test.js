// The Markdown report, read by a parser of Markdown with tables and HTML switched on.
//   node markdown_test.js VELMORA
// NODE_PATH names the folder with markdown-it.
'use strict';

const assert = require('node:assert/strict');
const { execFileSync } = require('node:child_process');
const fs = require('node:fs');
const os = require('node:os');
const path = require('node:path');
const MarkdownIt = require('markdown-it');
const { carsIn, expectRows, wicked } = require('./reportrows.js');

const [program] = process.argv.slice(2);
const folder = fs.mkdtempSync(path.join(os.tmpdir(), 'velmora-markdown-'));
const owner = '<script>alert(1)</script> | `rm` *x* [y](http://evil.test) & "co"';

function makeReport(name, port) {
  const files = ['md', 'json'].map((ending) => path.join(folder, `${name}.${ending}`));
  execFileSync(program, ['-q', '-p', port, 'scan', '--inspection', 'us-california', '--model-year', '2015', '--vehicle', owner,
    ...files.flatMap((file) => ['--report', file])], {
    stdio: ['ignore', 'ignore', 'inherit'],
    env: { ...process.env, VELMORA_SETTINGS: path.join(folder, 'none.toml') },
  });
  return { text: fs.readFileSync(files[0], 'utf8'), json: JSON.parse(fs.readFileSync(files[1], 'utf8')) };
}

// What a reader sees of an inline token; the only HTML in a report are its own anchors, the only links lead to them.
function read(inline, anchors, links) {
  let text = '';
  for (const token of inline.children) {
    if (token.type === 'html_inline') {
      const anchor = /^(?:<a id="([\w-]+)">|<\/a>)$/.exec(token.content);
      assert.ok(anchor, `HTML: ${token.content}`);
      if (anchor[1]) anchors.push(anchor[1]);
    } else if (token.type === 'link_open') {
      links.push(token.attrGet('href'));
    } else {
      assert.match(token.type, /^(text|text_special|softbreak|link_close|strong_open|strong_close)$/, token.content);
      text += token.content;
    }
  }
  return text;
}

function parse(text) {
  const tables = new Map([['', []]]);
  const anchors = [];
  const links = [];
  const said = [];
  let current = '';
  let row = null;
  let heads = 0;
  for (const token of new MarkdownIt({ html: true }).parse(text, {})) {
    assert.match(token.type, /^(inline|hr|(heading|paragraph|table|thead|tbody|tr|th|td|bullet_list|list_item)_(open|close))$/, token.content);
    if (token.type === 'inline') {
      const before = anchors.length;
      const shown = read(token, anchors, links);
      said.push(shown);
      if (row) row.push(shown.trim());
      const anchor = anchors.length > before ? anchors[anchors.length - 1] : '';
      if (anchor.startsWith('info-')) {
        current = anchor.slice('info-'.length);
        tables.set(current, []);
      } else if (anchor === 'adapter') {
        current = '';
      }
    } else if (token.type === 'tr_open') {
      row = [];
    } else if (token.type === 'tr_close') {
      tables.get(current).push(row);
      row = null;
    } else if (token.type === 'thead_open') {
      heads = 0;
    } else if (token.type === 'th_open') {
      ++heads;
    }
    if (token.type === 'tr_close') assert.equal(tables.get(current).at(-1).length, heads, 'each row is as long as its head');
  }
  return { tables, anchors, links, said: said.join('\n') };
}

// A parser cuts what a row has too much and fills what it lacks, so that is counted in the lines themselves.
function expectWholeRows(text, name) {
  let columns = 0;
  for (const line of text.split('\n')) {
    if (!line.startsWith('|')) {
      columns = 0;
      continue;
    }
    const borders = line.replace(/\\./g, '').split('|').length;
    columns ||= borders;
    assert.equal(borders, columns, `${name}: ${line}`);
  }
}

function main() {
  for (const [name, port] of Object.entries(carsIn(folder))) {
    const { text, json } = makeReport(name, port);
    const { tables, anchors, links, said } = parse(text);
    expectWholeRows(text, name);
    assert.ok(expectRows(json, tables, name) >= 5, `${name} tells something`);
    assert.ok(said.includes(owner), `${name}: the owner's name of the car stays text`);
    for (const link of links) assert.ok(link.startsWith('#') && anchors.includes(link.slice(1)), `${name}: ${link} leads nowhere`);
    for (const finding of json.findings) {
      for (const evidence of finding.evidence) if (evidence.text) assert.ok(said.includes(evidence.text), `${name}: ${evidence.text}`);
    }
    if (name === 'wicked') assert.ok(said.includes(wicked.name) && said.includes(wicked.calibration), 'what a module says stays text');
  }
}

try {
  main();
} finally {
  fs.rmSync(folder, { recursive: true, force: true });
}
