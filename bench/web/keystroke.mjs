// Keystroke cost of the controls in WebAssembly, measured as the browser page pays it: each
// keystroke one call of the web form (key down, press and up to the control, its handlers, the
// widget's edit) with its JSON reply of what changed, parsed, as the DOM view does before it
// draws; and the same keystrokes as one call (`type`), which leaves out the per-call reply.
// The same four setups and cycles as bench_keystroke (native): a value typed, then Backspace
// over it, again and again, close to 1,000 keystrokes an iteration.
// Runs under Node (node bench/web/keystroke.mjs build/wasm/web/kelweb.mjs) and in a page
// (build/wasm/web/bench/keystroke.html).
const SETUPS = [
  { name: 'KelAlphaNumeric', cls: 'KelAlphaNumeric', typed: 'Kel Text 42 road', props: [] },
  { name: 'KelNumeric', cls: 'KelNumeric', typed: '1234.56', props: [['NoOfDecimals', 2], ['MaxLength', 12]] },
  { name: 'KelDateMask', cls: 'KelDateMask', typed: '31122003', props: [] },
  { name: 'KelCombo', cls: 'KelCombo', typed: 'chq', props: [['AutoSearch', true]], list: true },
];
const FRUIT = ['Apple', 'Apricot', 'Banana', 'Bank Transfer', 'Cash', 'Cheque', 'Cherry', 'Credit Card', 'Debit Card',
  'Demand Draft', 'Grapes', 'Kiwi', 'Lemon', 'Mango', 'Melon', 'Orange', 'Papaya', 'Peach', 'Pear', 'Plum'];

function keyOf(ch) {
  const c = ch.charCodeAt(0);
  if (/[a-z]/.test(ch)) return [c - 32, 0, c];
  if (/[A-Z]/.test(ch)) return [c, 1, c];
  if (/[0-9]/.test(ch)) return [c, 0, c];
  if (ch === ' ') return [32, 0, 32];
  if (ch === '.') return [190, 0, 46];
  return [0, 0, c];
}

export function run(module, { iterations = 20, now = () => performance.now() } = {}) {
  const rows = [];
  for (const s of SETUPS) {
    const form = new module.WebForm();
    form.create(s.cls, 'c', 1800, 300);
    for (const [p, v] of s.props) form.set('c', p, v, null);
    if (s.list) for (const f of FRUIT) form.call('c', 'AddItem', [f]);
    form.focus('c');
    const cycle = 2 * s.typed.length + 1;
    const cycles = Math.floor(1000 / cycle);
    const keys = [];
    for (let i = 0; i < cycles; ++i) {
      for (const ch of s.typed) keys.push(keyOf(ch));
      for (let j = 0; j <= s.typed.length; ++j) keys.push([8, 0, 8]);
    }
    const perCall = [];
    const perType = [];
    for (let it = 0; it < iterations; ++it) {
      let t = now();
      for (const [code, shift, char] of keys) JSON.parse(form.keystroke(code, shift, char));
      perCall.push(((now() - t) * 1e6) / keys.length);
      // Typed text in one call each, Backspace one call each: the typed half without replies.
      t = now();
      for (let i = 0; i < cycles; ++i) {
        form.type(s.typed);
        for (let j = 0; j <= s.typed.length; ++j) form.keystroke(8, 0, 8);
      }
      perType.push(((now() - t) * 1e6) / keys.length);
    }
    const median = (a) => a.sort((x, y) => x - y)[Math.floor(a.length / 2)];
    rows.push({ control: s.name, keys: keys.length, perCallNs: Math.round(median(perCall)), typeNs: Math.round(median(perType)) });
    form.delete();
  }
  return rows;
}

export function table(rows) {
  return ['| control | keystrokes | per keystroke, one call each with its reply | typed in one call |', '|---|---|---|---|',
    ...rows.map((r) => `| \`${r.control}\` | ${r.keys} | ${r.perCallNs} ns | ${r.typeNs} ns |`)].join('\n');
}

if (typeof process !== 'undefined' && process.argv?.[1]?.endsWith('keystroke.mjs')) {
  // Emscripten 3.1.6's ES module expects CommonJS's require and __dirname under Node.
  const { createRequire } = await import('node:module');
  const path = await import('node:path');
  const file = path.resolve(process.argv[2]);
  globalThis.require = createRequire(file);
  globalThis.__dirname = path.dirname(file);
  const { default: createKelWeb } = await import(`file://${file}`);
  console.log(table(run(await createKelWeb())));
}
