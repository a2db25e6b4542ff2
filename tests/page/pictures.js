// Makes README's two pictures: node pictures.js VELMORA TERMINAL_CAPTURE FOLDER. scripts/pictures calls it.
'use strict';

const { spawn } = require('node:child_process');
const fs = require('node:fs');
const os = require('node:os');
const path = require('node:path');
const puppeteer = require('puppeteer-core');

const [program, capture, target] = process.argv.slice(2);
const folder = fs.mkdtempSync(path.join(os.tmpdir(), 'velmora-pictures-'));

async function main() {
  const env = { ...process.env, STATE_DIRECTORY: folder, VELMORA_SETTINGS: path.join(folder, 'settings.toml') };
  const dash = spawn(program, ['--port', 'sim:petrol-can11', 'dash', '--listen', '127.0.0.1:0'], { stdio: ['ignore', 'pipe', 'ignore'], env });
  const link = await new Promise((resolve) => dash.stdout.once('data', (data) => resolve(String(data).trim())));
  const browser = await puppeteer.launch({ executablePath: '/usr/bin/chromium', headless: true, args: ['--no-sandbox', '--disable-dev-shm-usage'] });
  const page = await browser.newPage();
  await page.setViewport({ width: 1000, height: 560 });
  await page.emulateMediaFeatures([{ name: 'prefers-color-scheme', value: 'dark' }]);
  await page.goto(link);
  // The simulated drive sets off after some seconds.
  await page.waitForFunction("Number(document.querySelector('[data-id=\"7E8/SPEED\"] .number')?.textContent) > 60", { timeout: 120000 });
  await page.screenshot({ path: path.join(target, 'dash.png') });

  const text = fs.readFileSync(capture, 'utf8').replace(/[&<]/g, (each) => (each === '&' ? '&amp;' : '&lt;'));
  await page.setContent(`<body style="margin:0;background:#10151b"><pre style="margin:16px;color:#dfe7ee;font:15px/1.2 'DejaVu Sans Mono',monospace;display:inline-block">${text}</pre></body>`);
  await (await page.$('body')).screenshot({ path: path.join(target, 'live.png'), clip: { x: 0, y: 0, width: 770, height: 470 } });
  await browser.close();
  dash.kill('SIGTERM');
  fs.rmSync(folder, { recursive: true, force: true });
}

main();
