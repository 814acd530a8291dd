// The demo voucher in the browser: the form examples/voucher.kform defines (compiled into the
// module, as into kelform), drawn by the DOM view, with the forms' code the terminal and
// desktop forms share (apps/kelform/form_code.h, called through kelweb_app.cpp): the status
// line's messages for the controls' errors and for a value changed as focus left its box, the
// date box keeping focus once after a bad date, and its calendar; F10 prints the record as the
// same JSON as kelform's F10. The page holds none of these rules itself, so the three screens
// cannot drift apart. ?today=yyyy-mm-dd fixes the day the form sees.
import createKelWeb from './kelweb.mjs';
import { FormView } from './kelform_view.mjs';

const module = await createKelWeb();
const params = new URLSearchParams(location.search);
const today = params.get('today') ?? '';

// Every call of the view is one input of the person's (a key, a paste, a click that moves
// focus): it starts with a clear status line, so what the line shows is about this input, and
// it ends with the forms' rule for the box focus left.
class VoucherView extends FormView {
  call(method, ...args) {
    // A caret placed with the mouse follows a click already judged.
    if (this.inInput || method === 'select') return super.call(method, ...args);
    this.inInput = true;
    try {
      this.say('');
      code('inputStart');
      const reply = super.call(method, ...args);
      const status = code('inputEnd', this.status.textContent).value;
      if (status != null) this.say(status);
      return reply;
    } finally {
      this.inInput = false;
    }
  }

  // A call the page makes on its own behalf: no input, the status line stays.
  callQuietly(method, ...args) {
    const was = this.inInput;
    this.inInput = true;
    try {
      return super.call(method, ...args);
    } finally {
      this.inInput = was;
    }
  }
}

const view = new VoucherView(module, document.getElementById('form'), {
  onChanges(changes) {
    for (const c of changes) {
      if (c.t === 'error') view.say(module.handlerErrorStatus(c.where, c.number));
      if (c.t !== 'event') continue;
      const status = code('eventStatus', c.c, c.e).value;
      if (status != null) view.say(status);
      // The button's click is still being delivered: the calendar opens after it.
      else if (module.opensCalendar(c.e)) setTimeout(() => openCalendar(c.c));
    }
  },
  onKey(name, e) {
    if (e.key === 'F10') {
      finish();
      return true;
    }
    return false;
  },
});

// One call of the forms' code (kelweb_app.cpp). It goes through the web form as the view's
// calls do, so whatever it changes (a day picked, focus put back) reaches the DOM.
function code(name, ...args) {
  const reply = JSON.parse(module[name](view.form, ...args));
  view.apply(reply);
  return reply;
}

const pad = (n) => String(n).padStart(2, '0');
const isoDay = (d) => `${d.getFullYear()}-${pad(d.getMonth() + 1)}-${pad(d.getDate())}`;

function openCalendar(name) {
  const [y, m, d] = code('calendarStart', name, today).value.split('-').map(Number);
  view.openCalendar(name, {
    day: new Date(y, m - 1, d),
    // A day the box does not take keeps the calendar open, and the status line says why.
    onPick(day) {
      const refused = code('refuseDay', name, isoDay(day)).value;
      if (refused != null) {
        view.say(refused);
        return false;
      }
      view.say('');
      code('pickDay', name, isoDay(day));
      return true;
    },
  });
}

// Finishing completes the field being edited first (focus leaves it, so it formats and
// checks), as a form's OK button does, then shows the record; a date box left with a bad date
// keeps focus instead, and the status line says why.
function finish() {
  const was = view.focused;
  view.call('focus', '');
  if (view.focused) return;
  const json = module.recordJson(view.form);
  const record = document.getElementById('record');
  record.textContent = json;
  record.hidden = false;
  const link = document.getElementById('download');
  link.href = URL.createObjectURL(new Blob([json + '\n'], { type: 'application/json' }));
  link.hidden = false;
  if (was) view.callQuietly('focus', was);
}

const layout = view.open(module.demoFormText(), { file: 'voucher.kform', today });
document.getElementById('finish').addEventListener('click', finish);
document.title = `${layout.title} · KelText in the browser`;
view.call('focus', layout.controls[0].name);
document.body.dataset.ready = 'true';
