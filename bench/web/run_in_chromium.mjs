// Runs bench/web/keystroke.html in headless chromium in real time (a --dump-dom run would use
// virtual time, in which performance.now() stands still) and prints its table.
// Usage: node bench/web/run_in_chromium.mjs [build/wasm]   (after the wasm workflow, whose
// test step installs playwright-core into build/wasm/npm)
import { createRequire } from 'node:module';
import { join, resolve } from 'node:path';
import { CHROMIUM, CHROMIUM_FLAGS, serve } from '../../tests/web/serve.mjs';

const build = resolve(process.argv[2] ?? 'build/wasm');
const { chromium } = createRequire(join(build, 'npm', 'node_modules', 'index.js'))('playwright-core');
const server = await serve(join(build, 'web'));
const browser = await chromium.launch({ executablePath: CHROMIUM, args: CHROMIUM_FLAGS, headless: true });
try {
  const page = await browser.newPage();
  await page.goto(`${server.url}/bench/keystroke.html`);
  await page.waitForFunction(() => !document.getElementById('log').textContent.startsWith('running'), null, { timeout: 300000 });
  console.log(await page.textContent('#log'));
} finally {
  await browser.close();
  server.close();
}
