// Runs every golden script through the WebAssembly player and compares what it prints, byte
// for byte, and its exit status with the files the native tests use.
import createKelWeb from '../kelweb.mjs';

const log = document.getElementById('log');
const summary = document.getElementById('summary');
const bytes = async (url) => {
  const r = await fetch(url);
  return r.ok ? new Uint8Array(await r.arrayBuffer()) : null;
};
const same = (a, b) => a.length === b.length && a.every((x, i) => x === b[i]);

try {
  const module = await createKelWeb();
  const names = await (await fetch('scripts/index.json')).json();
  let passed = 0, failed = 0;
  for (const name of names) {
    const script = await bytes(`scripts/${name}.kfs`);
    const expected = await bytes(`scripts/${name}.out`);
    const statusFile = await bytes(`scripts/${name}.status`);
    const status = statusFile ? Number(new TextDecoder().decode(statusFile).trim()) : 0;
    const result = module.play(`${name}.kfs`, script);
    const ok = result.status === status && same(result.output, expected);
    if (ok) ++passed;
    else ++failed;
    log.textContent += `${ok ? 'ok  ' : 'FAIL'} ${name}${ok ? '' : ` (exit status ${result.status}, expected ${status})`}\n`;
    if (!ok) log.textContent += new TextDecoder('windows-1252').decode(result.output);
  }
  summary.textContent = `${passed} passed, ${failed} failed`;
} catch (e) {
  summary.textContent = `error: ${e}`;
}
