// The demo voucher page in headless chromium, typed into with real DOM key events
// (playwright-core driving Debian's chromium; it never downloads a browser).
// Usage: node demo_test.mjs WEB_ROOT NODE_MODULES OUT_DIR   (OUT_DIR receives voucher.png)
import { mkdirSync } from 'node:fs';
import { createRequire } from 'node:module';
import { join } from 'node:path';
import { CHROMIUM, CHROMIUM_FLAGS, serve } from './serve.mjs';

const [root, modules, outDir] = process.argv.slice(2);
let chromium;
try {
  ({ chromium } = createRequire(join(modules, 'index.js'))('playwright-core'));
} catch (e) {
  console.log(`playwright-core is not installed in ${modules} (the test web.npm_ci installs it): ${e.message}`);
  process.exit(1);
}

let failures = 0;
function check(what, actual, expected) {
  const ok = JSON.stringify(actual) === JSON.stringify(expected);
  if (!ok) ++failures;
  console.log(`${ok ? 'ok  ' : 'FAIL'} ${what}: ${JSON.stringify(actual)}${ok ? '' : `, expected ${JSON.stringify(expected)}`}`);
}

const server = await serve(root);
const browser = await chromium.launch({ executablePath: CHROMIUM, args: CHROMIUM_FLAGS, headless: true });
try {
  const page = await browser.newPage({ viewport: { width: 900, height: 720 } });
  page.on('pageerror', (e) => {
    ++failures;
    console.log(`FAIL page error: ${e.message}`);
  });
  await page.goto(`${server.url}/index.html?today=2026-05-20`);
  await page.waitForSelector('body[data-ready="true"]', { timeout: 30000 });
  const value = (name) => page.inputValue(`#kelform-${name}`);
  const status = () => page.textContent('.kelform-status');
  const focused = () => page.evaluate(() => document.activeElement?.id);

  check('focus starts on the first field', await focused(), 'kelform-Payee');
  await page.keyboard.type('ramesh kumar');
  check('title case as typed', await value('Payee'), 'Ramesh Kumar');
  await page.keyboard.press('Tab');
  await page.keyboard.type('abcde1234f');
  check('upper case', await value('PAN'), 'ABCDE1234F');
  await page.keyboard.press('Tab');
  // The status line speaks the forms' code shared with the terminal and desktop forms.
  await page.keyboard.type('x');
  check('a letter refused, in the forms\' words', await status(), 'Amount: key refused - up to 8 digits, a point and 2 decimals');
  await page.keyboard.type('1234567.5');
  check('amount as typed', await value('Amount'), '1234567.5');
  check('the next key clears the status line', await status(), '');
  await page.keyboard.press('Tab');
  check('amount grouped on Tab', await value('Amount'), '12,34,567.50');
  check('grouping is no change of value', await status(), '');
  check('focus follows the form', await focused(), 'kelform-VoucherDate');
  check('date starts at today', await value('VoucherDate'), '20/05/2026');
  await page.keyboard.type('15/06/2026');
  await page.keyboard.press('Tab');
  check('date typed with slashes is kept', await value('VoucherDate'), '15/06/2026');
  await page.keyboard.type('ch');
  check('combo completes', await value('PayMode'), 'Cheque');
  await page.keyboard.press('Tab');
  await page.keyboard.type('12x3456');
  check('digits only', await value('ChequeNo'), '123456');
  await page.keyboard.press('Tab');
  await page.keyboard.type('0526');
  check('month and year, the mask shown while editing', await value('Period'), '05/26_');
  // The mouse: a click on the amount puts focus there; the spin button steps by 100.
  await page.click('#kelform-Amount');
  await page.click('[data-control="Amount"] .UpClick');
  check('spin up, ungrouped while editing', await value('Amount'), '1234667.5');
  await page.keyboard.press('End');
  await page.keyboard.press('Backspace');
  await page.keyboard.press('Backspace');
  await page.keyboard.type('.25');
  check('edited with Backspace', await value('Amount'), '1234667.25');
  // A paste goes through the control's filter too.
  await page.click('#kelform-ChequeNo');
  await page.keyboard.press('End');
  for (let i = 0; i < 6; ++i) await page.keyboard.press('Backspace');
  check('erased', await value('ChequeNo'), '');
  await page.keyboard.type('654321');
  // The calendar: F4 on the date box, a day picked with the keyboard.
  await page.click('#kelform-VoucherDate');
  await page.keyboard.press('F4');
  await page.waitForSelector('.kelform-calendar');
  await page.keyboard.press('ArrowRight');
  await page.keyboard.press('Enter');
  check('day picked in the calendar', await value('VoucherDate'), '16/06/2026');
  // The combo's list: F4, Down, Enter.
  await page.click('#kelform-PayMode');
  await page.keyboard.press('F4');
  await page.waitForSelector('.kelform-list');
  await page.keyboard.press('ArrowDown');
  await page.keyboard.press('Enter');
  check('entry picked in the list', await value('PayMode'), 'Card');
  await page.keyboard.press('F4');
  await page.keyboard.press('ArrowUp');
  await page.keyboard.press('Enter');
  check('back to Cheque', await value('PayMode'), 'Cheque');
  await page.keyboard.press('F10');
  const record = JSON.parse(await page.textContent('#record'));
  check('record', record, {
    Payee: 'Ramesh Kumar', PAN: 'ABCDE1234F', Amount: 1234667.25, VoucherDate: '16/06/2026', PayMode: 'Cheque',
    ChequeNo: '654321', Period: '05/26 ',
  });
  mkdirSync(outDir, { recursive: true });
  await page.screenshot({ path: join(outDir, 'voucher.png'), fullPage: true });
  console.log(`screenshot: ${join(outDir, 'voucher.png')}`);
  // Month 13 is no period: F10 completes the field first, its DateError speaks and the box
  // keeps focus once; leaving again is let through.
  await page.click('#kelform-Period');
  await page.keyboard.press('Home');
  await page.keyboard.type('13');
  check('a bad month typed', await value('Period'), '13/26_');
  await page.keyboard.press('F10');
  check('the bad period keeps focus', await focused(), 'kelform-Period');
  check('and says why', await status(),
        'Period: give a month 01-12 and a two-digit year (mm/yy) - focus stays; leave again to keep it');
  await page.keyboard.press('Tab');
  check('leaving again is let through (to the first field)', await focused(), 'kelform-Payee');
  // Below the smallest cheque number: leaving clamps it, and the form says so.
  await page.click('#kelform-ChequeNo');
  await page.keyboard.press('End');
  for (let i = 0; i < 6; ++i) await page.keyboard.press('Backspace');
  await page.keyboard.type('12345');
  await page.keyboard.press('Tab');
  check('a clamped value is told', await status(), 'Cheque number: 12345 was changed to 100000');
} finally {
  await browser.close();
  server.close();
}
console.log(failures ? `${failures} failed` : 'all passed');
process.exit(failures ? 1 : 0);
