// Opens a test page in headless chromium (--dump-dom, no npm packages needed) and checks the
// line it ends with: "N passed, M failed". Usage: node run_page.mjs ROOT PAGE EXPECTED_COUNT
// Exit status 0 when M is 0 and N the count expected, 77 (skipped) without chromium.
import { execFile } from 'node:child_process';
import { existsSync, mkdtempSync, rmSync } from 'node:fs';
import { tmpdir } from 'node:os';
import { join } from 'node:path';
import { CHROMIUM, CHROMIUM_FLAGS, serve } from './serve.mjs';

const [root, page, expectedCount] = process.argv.slice(2);
if (!existsSync(CHROMIUM)) {
  console.log(`${CHROMIUM} not found: tools/setup --web installs chromium`);
  process.exit(77);
}
const server = await serve(root);
const profile = mkdtempSync(join(tmpdir(), 'keltext-chromium-'));
const args = ['--headless', ...CHROMIUM_FLAGS, `--user-data-dir=${profile}`, '--virtual-time-budget=120000', '--dump-dom',
  `${server.url}/${page}`];
const dom = await new Promise((resolve) => {
  execFile(CHROMIUM, args, { timeout: 180000, maxBuffer: 64 << 20 }, (error, stdout, stderr) => {
    if (error && !stdout) console.log(`chromium failed: ${error.message}\n${stderr}`);
    resolve(stdout ?? '');
  });
});
server.close();
rmSync(profile, { recursive: true, force: true });
const log = /<pre id="log">([\s\S]*?)<\/pre>/.exec(dom)?.[1] ?? '';
console.log(log.replaceAll('&lt;', '<').replaceAll('&gt;', '>').replaceAll('&quot;', '"').replaceAll('&amp;', '&'));
const summary = /(\d+) passed, (\d+) failed/.exec(dom);
if (!summary) {
  console.log(`${page}: the page printed no summary`);
  process.exit(1);
}
console.log(summary[0]);
const ok = Number(summary[2]) === 0 && (!expectedCount || Number(summary[1]) === Number(expectedCount));
if (!ok && Number(summary[2]) === 0) console.log(`expected ${expectedCount} to pass`);
process.exit(ok ? 0 : 1);
