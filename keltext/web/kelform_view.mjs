// The DOM view of a web form (keltext/web/web_form.h). It holds no rules of its own: every key,
// paste, click and caret move goes to the form in WebAssembly, and the view draws what the
// form's replies say changed. The browser's own editing (typing, undo, drag and drop,
// autofill) never touches a field.

// Virtual key codes of the named keys.
const NAMED_KEYS = {
  Backspace: 8, Tab: 9, Enter: 13, Escape: 27, PageUp: 33, PageDown: 34, End: 35, Home: 36,
  ArrowLeft: 37, ArrowUp: 38, ArrowRight: 39, ArrowDown: 40, Insert: 45, Delete: 46, NumLock: 144,
  F1: 112, F2: 113, F3: 114, F4: 115, F5: 116, F6: 117, F7: 118, F8: 119, F9: 120, F10: 121, F11: 122, F12: 123,
};
// Keys that make a character of their own.
const KEY_CHARS = { Backspace: 8, Enter: 13, Escape: 27 };
// Key codes of the keys of the US layout, by physical key.
const CODE_KEYS = {
  Space: 32, Semicolon: 186, Equal: 187, Comma: 188, Minus: 189, Period: 190, Slash: 191, Backquote: 192,
  BracketLeft: 219, Backslash: 220, BracketRight: 221, Quote: 222, NumpadMultiply: 106, NumpadAdd: 107,
  NumpadSubtract: 109, NumpadDecimal: 110, NumpadDivide: 111, NumpadEnter: 13,
};
// Windows-1252 from 0x80 to 0x9F (undefined where the set has no character).
const CP1252_HIGH = [
  0x20ac, undefined, 0x201a, 0x0192, 0x201e, 0x2026, 0x2020, 0x2021, 0x02c6, 0x2030, 0x0160, 0x2039, 0x0152, undefined,
  0x017d, undefined, undefined, 0x2018, 0x2019, 0x201c, 0x201d, 0x2022, 0x2013, 0x2014, 0x02dc, 0x2122, 0x0161, 0x203a,
  0x0153, undefined, 0x017e, 0x0178,
];

// The Windows-1252 byte of a Unicode code point, or undefined.
export function cp1252(codePoint) {
  if (codePoint < 0x80 || (codePoint >= 0xa0 && codePoint <= 0xff)) return codePoint;
  const i = CP1252_HIGH.indexOf(codePoint);
  return i < 0 ? undefined : 0x80 + i;
}

function keyCodeOfCode(code) {
  if (/^Key[A-Z]$/.test(code)) return code.charCodeAt(3);
  if (/^Digit[0-9]$/.test(code)) return code.charCodeAt(5);
  if (/^Numpad[0-9]$/.test(code)) return 96 + Number(code[6]);
  return CODE_KEYS[code] ?? 0;
}

// The control's keystroke for a DOM key event: {keyCode, shift, charCode} (charCode -1 when
// the key makes no character), {refused: true} for a character Windows-1252 lacks, or null
// for a key the form leaves alone (a modifier on its own, a dead key).
export function keystrokeOf(event) {
  const shift = (event.shiftKey ? 1 : 0) | (event.ctrlKey ? 2 : 0) | (event.altKey ? 4 : 0);
  const key = event.key;
  if ([...key].length === 1) {
    const byte = cp1252(key.codePointAt(0));
    if (byte === undefined) return { refused: true, character: key };
    let keyCode = keyCodeOfCode(event.code);
    if (!keyCode && /^[a-z]$/i.test(key)) keyCode = key.toUpperCase().charCodeAt(0);
    if (!keyCode && /^[0-9]$/.test(key)) keyCode = key.charCodeAt(0);
    let charCode = byte;
    if (event.ctrlKey) charCode = /^[a-z]$/i.test(key) ? key.toUpperCase().charCodeAt(0) - 64 : -1;
    return { keyCode, shift, charCode };
  }
  if (key in NAMED_KEYS) return { keyCode: NAMED_KEYS[key], shift, charCode: KEY_CHARS[key] ?? -1 };
  return null;
}

// A colour of the host (0x00BBGGRR) as CSS.
function cssColour(value) {
  if (typeof value !== 'number' || value < 0) return '';
  const r = value & 0xff, g = (value >> 8) & 0xff, b = (value >> 16) & 0xff;
  return `rgb(${r}, ${g}, ${b})`;
}

const EDIT_TYPES = new Set(['EditBox', 'MaskedEdit', 'ComboBox']);

export class FormView {
  // module: the loaded WebAssembly module (createKelWeb()); root: the element to draw in.
  // options.onEvent(control, event, args): the page's form code, run while the control raises
  // the event (it may change args.KeyAscii); options.onChanges(changes): every change applied.
  constructor(module, root, options = {}) {
    this.module = module;
    this.root = root;
    this.options = options;
    this.form = new module.WebForm();
    this.form.onEvent((control, event, args) => this.options.onEvent?.(control, event, args));
    this.state = {};        // state[control][part][member]
    this.fields = {};       // per control: {input, keyboard, parts, element}
    this.focused = null;
    this.popup = null;
    this.busy = false;
  }

  // Opens a form file's text (kelform's .kform) and draws it. Returns the layout.
  open(text, { file = 'form.kform', today = '' } = {}) {
    const reply = JSON.parse(this.module.openForm(this.form, text, file, today));
    if (reply.error) throw new Error(reply.error.message);
    this.layout = reply.value;
    this.controls = JSON.parse(this.form.describe());
    this.build();
    this.apply(reply);
    this.apply(JSON.parse(this.form.changes(true)));
    return this.layout;
  }

  // Runs one call of the form (a method name of WebForm and its arguments) and applies its
  // reply. Returns the reply.
  call(method, ...args) {
    const reply = JSON.parse(this.form[method](...args));
    this.apply(reply);
    return reply;
  }

  build() {
    this.root.replaceChildren();
    this.root.classList.add('kelform');
    const title = document.createElement('div');
    title.className = 'kelform-title';
    title.textContent = this.layout.title;
    this.root.append(title);
    const grid = document.createElement('div');
    grid.className = 'kelform-grid';
    this.root.append(grid);
    const placed = Object.fromEntries(this.layout.controls.map((c) => [c.name, c]));
    this.controls.forEach((c, order) => {
      const place = placed[c.name] ?? { row: order * 2 + 1, col: 20, label: c.name, width: 1200 };
      const label = document.createElement('label');
      label.className = 'kelform-label';
      label.textContent = place.label;
      label.style.gridRow = String(place.labelRow ?? place.row);
      label.style.gridColumn = `${place.labelCol ?? 1} / ${place.col}`;
      const field = document.createElement('span');
      field.className = 'kelform-field';
      field.dataset.control = c.name;
      field.style.gridRow = String(place.row);
      field.style.gridColumn = `${place.col} / -1`;
      grid.append(label, field);
      const entry = { element: field, parts: {}, keyboard: c.keyboard, input: null };
      this.fields[c.name] = entry;
      for (const part of c.parts) entry.parts[part.type] = part.name;
      if (c.keyboard) {
        const input = document.createElement('input');
        input.type = 'text';
        input.id = `kelform-${c.name}`;
        input.name = c.name;
        input.autocomplete = 'off';
        input.spellcheck = false;
        input.setAttribute('autocorrect', 'off');
        input.setAttribute('autocapitalize', 'off');
        input.tabIndex = order + 1;
        // A character cell is 120 twips wide, as in the terminal form.
        input.style.width = `calc(${Math.max(2, Math.round(place.width / 120))}ch + 0.7rem)`;
        label.htmlFor = input.id;
        field.append(input);
        entry.input = input;
        this.wire(c.name, input);
      }
      const spin = entry.parts.SpinButton;
      if (spin) {
        for (const [glyph, notification] of [['▲', 'UpClick'], ['▼', 'DownClick']]) {
          const b = this.button(glyph, `kelform-spin ${notification}`);
          b.addEventListener('mousedown', (e) => e.preventDefault());
          b.addEventListener('click', () => this.call('notify', c.name, spin, notification));
          field.append(b);
        }
      }
      const image = entry.parts.Image;
      if (image) {
        const b = this.button('▦', 'kelform-calendar-button');
        b.addEventListener('mousedown', (e) => e.preventDefault());
        b.addEventListener('click', () => {
          this.focusControl(c.name);
          this.call('click', c.name, image);
        });
        field.append(b);
      }
      if (entry.parts.ComboBox) {
        const b = this.button('▼', 'kelform-combo-button');
        b.addEventListener('mousedown', (e) => e.preventDefault());
        b.addEventListener('click', () => {
          this.focusControl(c.name);
          this.dropDown(c.name);
        });
        field.append(b);
      }
    });
    this.status = document.createElement('div');
    this.status.className = 'kelform-status';
    this.status.setAttribute('role', 'status');
    this.root.append(this.status);
  }

  button(text, className) {
    const b = document.createElement('button');
    b.type = 'button';
    b.tabIndex = -1;
    b.className = className;
    b.textContent = text;
    return b;
  }

  say(text) {
    if (this.status) this.status.textContent = text;
  }

  // The DOM's input routed through the control.
  wire(name, input) {
    input.addEventListener('keydown', (e) => this.keydown(name, e));
    input.addEventListener('keypress', (e) => e.preventDefault());
    input.addEventListener('beforeinput', (e) => {
      e.preventDefault();
      // Text that arrives without a key event of its own (an input method, a virtual keyboard).
      if (e.inputType === 'insertText' && e.data && !this.keyHandled) this.call('type', e.data);
    });
    input.addEventListener('paste', (e) => {
      e.preventDefault();
      this.call('paste', e.clipboardData?.getData('text/plain') ?? '');
    });
    input.addEventListener('cut', (e) => {
      e.preventDefault();
      e.clipboardData?.setData('text/plain', input.value.slice(input.selectionStart, input.selectionEnd));
      this.call('keystroke', 46, 0, -1);
    });
    for (const type of ['drop', 'dragstart', 'dragover']) input.addEventListener(type, (e) => e.preventDefault());
    input.addEventListener('focus', () => this.focusControl(name));
    // A caret placed or a selection made with the mouse.
    input.addEventListener('mouseup', () => this.syncSelection(name));
    input.addEventListener('select', () => this.syncSelection(name));
  }

  focusControl(name) {
    if (this.busy || this.focused === name) return;
    this.call('focus', name);
  }

  syncSelection(name) {
    const entry = this.fields[name];
    const part = this.state[name]?.[entry.keyboard] ?? {};
    const input = entry.input;
    const start = input.selectionStart, length = input.selectionEnd - input.selectionStart;
    if (this.focused === name && (part.SelStart !== start || part.SelLength !== length))
      this.call('select', name, start, length);
  }

  keydown(name, e) {
    this.keyHandled = true;
    setTimeout(() => (this.keyHandled = false));
    if (this.popup && this.popup.keydown(e)) {
      e.preventDefault();
      return;
    }
    if (e.key === 'Tab') {
      e.preventDefault();
      this.call('tab', !e.shiftKey);
      return;
    }
    // Paste and copy are the clipboard's; the paste arrives as its own event.
    if ((e.ctrlKey && (e.key === 'v' || e.key === 'c')) || (e.shiftKey && e.key === 'Insert')) return;
    if (e.ctrlKey && e.key === 'x') return;
    if (this.options.onKey?.(name, e)) {
      e.preventDefault();
      return;
    }
    if (e.key === 'F4' || (e.altKey && e.key === 'ArrowDown')) {
      e.preventDefault();
      if (this.fields[name].parts.ComboBox) this.dropDown(name);
      else if (this.fields[name].parts.Image) this.call('click', name, this.fields[name].parts.Image);
      return;
    }
    const k = keystrokeOf(e);
    if (!k) return;
    e.preventDefault();
    if (k.refused) {
      this.say(`"${k.character}" cannot be typed here: the form's text is Windows-1252`);
      return;
    }
    this.call('keystroke', k.keyCode, k.shift, k.charCode);
  }

  // Applies a reply's changes to the DOM.
  apply(reply) {
    if (reply.error) this.say(reply.error.message);
    const touched = new Set();
    for (const change of reply.changes ?? []) {
      if (change.t === 'state') {
        ((this.state[change.c] ??= {})[change.p] ??= {})[change.m] = change.v;
        touched.add(change.c);
      } else if (change.t === 'focus') {
        this.focused = change.c;
        touched.add(change.c);
      } else if (change.t === 'error') {
        this.say(`${change.where}: run-time error ${change.number}`);
      }
    }
    for (const name of touched) if (name && this.fields[name]) this.draw(name);
    if (this.focused && this.fields[this.focused]?.input && document.activeElement !== this.fields[this.focused].input) {
      this.busy = true;
      this.fields[this.focused].input.focus();
      this.busy = false;
      this.draw(this.focused);
    } else if (!this.focused && this.root.contains(document.activeElement)) {
      this.busy = true;
      document.activeElement.blur();
      this.busy = false;
    }
    this.options.onChanges?.(reply.changes ?? [], reply);
  }

  draw(name) {
    const entry = this.fields[name];
    const parts = this.state[name] ?? {};
    const surface = parts.surface ?? {};
    entry.element.classList.toggle('disabled', surface.Enabled === false);
    entry.element.classList.toggle('focused', this.focused === name);
    const edit = entry.keyboard ? parts[entry.keyboard] ?? {} : null;
    if (!edit) return;
    const input = entry.input;
    if (typeof edit.Text === 'string' && input.value !== edit.Text) input.value = edit.Text;
    input.disabled = edit.Enabled === false || surface.Enabled === false;
    input.style.display = edit.Visible === false ? 'none' : '';
    input.style.backgroundColor = cssColour(edit.BackColor);
    input.style.color = cssColour(edit.ForeColor);
    if (this.focused === name && document.activeElement === input && typeof edit.SelStart === 'number') {
      const start = Math.min(edit.SelStart, input.value.length);
      const end = Math.min(start + (edit.SelLength ?? 0), input.value.length);
      if (input.selectionStart !== start || input.selectionEnd !== end) input.setSelectionRange(start, end);
    }
    if (this.popup?.control === name) this.popup.refresh?.();
  }

  // The combo's list as a DOM popup: DropDown first, as a combo does, then the list on the
  // selected entry; picking an entry sets the list's ListIndex.
  dropDown(name) {
    const entry = this.fields[name];
    const part = entry.parts.ComboBox;
    this.call('notify', name, part, 'DropDown');
    const state = this.state[name]?.[part] ?? {};
    const list = document.createElement('ul');
    list.className = 'kelform-popup kelform-list';
    list.setAttribute('role', 'listbox');
    let current = Math.max(0, state.ListIndex ?? 0);
    const items = (state.List ?? []).map((text, i) => {
      const li = document.createElement('li');
      li.textContent = text;
      li.setAttribute('role', 'option');
      li.addEventListener('mousedown', (e) => e.preventDefault());
      li.addEventListener('click', () => pick(i));
      list.append(li);
      return li;
    });
    const mark = () => items.forEach((li, i) => li.classList.toggle('current', i === current));
    const pick = (i) => {
      this.closePopup();
      this.call('poke', name, part, 'ListIndex', i);
    };
    mark();
    this.openPopup(name, list, {
      keydown: (e) => {
        if (e.key === 'ArrowDown') current = Math.min(items.length - 1, current + 1);
        else if (e.key === 'ArrowUp') current = Math.max(0, current - 1);
        else if (e.key === 'Enter' || e.key === 'F4') pick(current);
        else if (e.key === 'Escape') this.closePopup();
        else return false;
        mark();
        return true;
      },
    });
  }

  // A month calendar under the field; days outside [min, max] cannot be picked. `onPick`
  // receives the day as a Date; when it returns false (the form does not take that day) the
  // calendar stays open for another.
  openCalendar(name, { day, min, max, onPick }) {
    let shown = new Date(day.getFullYear(), day.getMonth(), 1);
    let current = new Date(day);
    const box = document.createElement('div');
    box.className = 'kelform-popup kelform-calendar';
    const inRange = (d) => (!min || d >= min) && (!max || d <= max);
    const pick = (d) => {
      if (onPick(d) !== false) this.closePopup();
    };
    const render = () => {
      box.replaceChildren();
      const head = document.createElement('div');
      head.className = 'kelform-calendar-head';
      const prev = this.button('‹', ''), next = this.button('›', '');
      const caption = document.createElement('span');
      caption.textContent = shown.toLocaleDateString('en-GB', { month: 'long', year: 'numeric' });
      prev.addEventListener('mousedown', (e) => e.preventDefault());
      next.addEventListener('mousedown', (e) => e.preventDefault());
      prev.addEventListener('click', () => { shown = new Date(shown.getFullYear(), shown.getMonth() - 1, 1); render(); });
      next.addEventListener('click', () => { shown = new Date(shown.getFullYear(), shown.getMonth() + 1, 1); render(); });
      head.append(prev, caption, next);
      box.append(head);
      const grid = document.createElement('div');
      grid.className = 'kelform-calendar-days';
      for (const d of ['Mo', 'Tu', 'We', 'Th', 'Fr', 'Sa', 'Su']) {
        const h = document.createElement('span');
        h.textContent = d;
        h.className = 'weekday';
        grid.append(h);
      }
      const blanks = (shown.getDay() + 6) % 7;
      for (let i = 0; i < blanks; ++i) grid.append(document.createElement('span'));
      const days = new Date(shown.getFullYear(), shown.getMonth() + 1, 0).getDate();
      for (let n = 1; n <= days; ++n) {
        const d = new Date(shown.getFullYear(), shown.getMonth(), n);
        const b = this.button(String(n), 'day');
        b.disabled = !inRange(d);
        b.classList.toggle('current', d.getTime() === current.getTime());
        b.addEventListener('mousedown', (e) => e.preventDefault());
        b.addEventListener('click', () => pick(d));
        grid.append(b);
      }
      box.append(grid);
    };
    render();
    const move = (days, months = 0) => {
      const d = new Date(current.getFullYear(), current.getMonth() + months, current.getDate() + days);
      current = d;
      shown = new Date(d.getFullYear(), d.getMonth(), 1);
      render();
    };
    this.openPopup(name, box, {
      keydown: (e) => {
        if (e.key === 'ArrowLeft') move(-1);
        else if (e.key === 'ArrowRight') move(1);
        else if (e.key === 'ArrowUp') move(-7);
        else if (e.key === 'ArrowDown') move(7);
        else if (e.key === 'PageUp') move(0, -1);
        else if (e.key === 'PageDown') move(0, 1);
        else if (e.key === 'Enter' || e.key === ' ') {
          if (inRange(current)) pick(new Date(current));
        } else if (e.key === 'Escape') this.closePopup();
        else return false;
        return true;
      },
    });
  }

  openPopup(name, element, handlers) {
    this.closePopup();
    this.fields[name].element.append(element);
    this.popup = { control: name, element, ...handlers };
    this.outside = (e) => {
      if (!element.contains(e.target)) this.closePopup();
    };
    document.addEventListener('mousedown', this.outside, true);
  }

  closePopup() {
    if (!this.popup) return;
    this.popup.element.remove();
    this.popup = null;
    document.removeEventListener('mousedown', this.outside, true);
  }
}
