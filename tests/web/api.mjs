// The web form's calls and replies as a page uses them, and the view's key mapping.
import createKelWeb from '../kelweb.mjs';
import { keystrokeOf } from '../kelform_view.mjs';

const log = document.getElementById('log');
const summary = document.getElementById('summary');
let passed = 0, failed = 0;
function check(what, actual, expected) {
  const a = JSON.stringify(actual), e = JSON.stringify(expected);
  if (a === e) ++passed;
  else {
    ++failed;
    log.textContent += `FAIL ${what}: ${a}, expected ${e}\n`;
  }
}
const reply = (text) => JSON.parse(text);
const states = (r, control, part, member) =>
  r.changes.filter((c) => c.t === 'state' && c.c === control && c.p === part && c.m === member).map((c) => c.v);

try {
  const module = await createKelWeb();
  const form = new module.WebForm();

  // A numeric box: typed, then grouped when focus leaves; the reply carries the new text.
  form.create('KelNumeric', 'amt', 1900, 300);
  form.set('amt', 'NoOfDecimals', 2, null);
  form.set('amt', 'MaxLength', 12, null);
  form.set('amt', 'TxtFormat', true, null);
  check('focus moves', reply(form.focus('amt')).value, 'moved');
  check('focus stays', reply(form.focus('amt')).value, 'unchanged');
  check('typed', states(reply(form.type('1234567.5')), 'amt', 'txtNumeric', 'Text'), ['1234567.5']);
  const left = reply(form.focus(''));
  check('grouped on exit', states(left, 'amt', 'txtNumeric', 'Text'), ['12,34,567.50']);
  check('focus queued', left.changes.filter((c) => c.t === 'focus'), [{ t: 'focus', c: null }]);
  check('value', reply(form.get('amt', 'Text', null)).value, 1234567.5);

  // Form code changes KeyAscii: an 'x' dropped (the box shapes title case as it goes).
  const raised = [];
  form.onEvent((control, event, args) => {
    raised.push(event);
    if (event === 'KeyPress' && args.KeyAscii === 120) args.KeyAscii = 0;
  });
  form.create('KelAlphaNumeric', 'a', 1200, 300);
  form.focus('a');
  const typed = reply(form.type('axb'));
  check('KeyAscii 0 drops the key', reply(form.get('a', 'Text', null)).value, 'Ab');
  check('events reach the handler', raised.filter((e) => e === 'KeyPress').length, 3);
  check('events queued', typed.changes.filter((c) => c.t === 'event' && c.e === 'KeyPress').map((c) => c.a.KeyAscii),
    [97, 120, 98]);
  form.onEvent(null);

  // Text outside Windows-1252 is refused whole; é is held.
  check('refused', reply(form.type('a中')).error?.message, 'the character U+4E2D cannot be held: the form\'s text is Windows-1252');
  check('refused leaves the text', reply(form.get('a', 'Text', null)).value, 'Ab');
  form.paste('é');
  check('pasted', reply(form.get('a', 'Text', null)).value, 'Abé');
  check('selection queued', states(reply(form.select('a', 0, 2)), 'a', 'TxtCustom', 'SelLength'), [2]);
  check('nothing new', reply(form.changes(false)).changes, []);
  check('selection kept', reply(form.peek('a', 'TxtCustom', 'SelStart', null)).value, 0);

  // The combo's list entries and the selected entry.
  form.create('KelCombo', 'c', 1800, 300);
  form.call('c', 'AddItem', ['Cash']);
  const added = reply(form.call('c', 'AddItem', ['Cheque']));
  check('list entries', states(added, 'c', 'cboCustom', 'List'), [['Cash', 'Cheque']]);
  form.focus('c');
  check('completed', states(reply(form.type('ch')), 'c', 'cboCustom', 'Text').at(-1), 'Cheque');
  check('run-time error', reply(form.set('c', 'ListIndex', 7, null)).error?.number, 381);
  check('misuse', reply(form.focus('nobody')).error?.message, "no control named 'nobody'");
  const all = reply(form.changes(true));
  check('whole state on request', states(all, 'amt', 'txtNumeric', 'Text'), ['12,34,567.50']);
  check('disabled', states(reply(form.set('a', 'Enabled', false, null)), 'a', 'surface', 'Enabled'), [false]);
  check('no keys to a disabled control', reply(form.focus('a')).value, 'refused');

  // DOM key events as the controls' keystrokes.
  const key = (key, code, mods = {}) => keystrokeOf({ key, code, shiftKey: false, ctrlKey: false, altKey: false, ...mods });
  check('letter', key('a', 'KeyA'), { keyCode: 65, shift: 0, charCode: 97 });
  check('capital', key('A', 'KeyA', { shiftKey: true }), { keyCode: 65, shift: 1, charCode: 65 });
  check('point', key('.', 'Period'), { keyCode: 190, shift: 0, charCode: 46 });
  check('keypad point', key('.', 'NumpadDecimal'), { keyCode: 110, shift: 0, charCode: 46 });
  check('slash', key('/', 'Slash'), { keyCode: 191, shift: 0, charCode: 47 });
  check('euro', key('€', 'Digit4', { altKey: true }), { keyCode: 52, shift: 4, charCode: 128 });
  check('ctrl letter', key('c', 'KeyC', { ctrlKey: true }), { keyCode: 67, shift: 2, charCode: 3 });
  check('backspace', key('Backspace', 'Backspace'), { keyCode: 8, shift: 0, charCode: 8 });
  check('delete', key('Delete', 'Delete'), { keyCode: 46, shift: 0, charCode: -1 });
  check('F4', key('F4', 'F4'), { keyCode: 115, shift: 0, charCode: -1 });
  check('not Windows-1252', key('中', ''), { refused: true, character: '中' });
  check('modifier alone', key('Shift', 'ShiftLeft', { shiftKey: true }), null);
  summary.textContent = `${passed} passed, ${failed} failed`;
} catch (e) {
  summary.textContent = `error: ${e} ${e.stack ?? ''}`;
}
