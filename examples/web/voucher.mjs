// The demo voucher in the browser: the form examples/voucher.kform defines (compiled into the
// module, as into kelform), drawn by the DOM view, with the form code the terminal demo has:
// a status line for the controls' errors, the date box's calendar, and F10 printing the record
// as the same JSON as kelform's F10. ?today=yyyy-mm-dd fixes the day the form sees.
import createKelWeb from './kelweb.mjs';
import { FormView } from './kelform_view.mjs';

const module = await createKelWeb();
const params = new URLSearchParams(location.search);
const labels = {};

function dateOf(text) {
  const m = /^(\d\d)\/(\d\d)\/(\d{4})$/.exec(text ?? '');
  return m ? new Date(Number(m[3]), Number(m[2]) - 1, Number(m[1])) : null;
}
const pad = (n) => String(n).padStart(2, '0');
const ddmmyyyy = (d) => `${pad(d.getDate())}/${pad(d.getMonth() + 1)}/${d.getFullYear()}`;
const isoDate = (s) => (typeof s === 'string' && /^\d{4}-\d\d-\d\d$/.test(s) ? new Date(`${s}T00:00:00`) : null);

const view = new FormView(module, document.getElementById('form'), {
  onChanges(changes) {
    for (const c of changes) {
      if (c.t !== 'event') continue;
      if (c.e === 'ControlError') view.say(`${labels[c.c] ?? c.c}: that key is not taken here`);
      else if (c.e === 'DateError') view.say(`${labels[c.c] ?? c.c}: not a date in the range the form takes`);
      else if (c.e === 'ButtonClick') setTimeout(() => openCalendar(c.c));
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

function openCalendar(name) {
  const get = (p) => JSON.parse(view.form.get(name, p, null)).value;
  const text = view.state[name]?.[view.fields[name].keyboard]?.Text;
  const min = isoDate(get('MinDate')), max = isoDate(get('MaxDate'));
  const day = dateOf(text) ?? min ?? new Date();
  view.openCalendar(name, { day, min, max, onPick: (d) => view.call('set', name, 'Text', ddmmyyyy(d), null) });
}

// Finishing completes the field being edited first (focus leaves it, so it formats and
// checks), as a form's OK button does, then shows the record.
function finish() {
  const was = view.focused;
  view.call('focus', '');
  const json = module.recordJson(view.form);
  const record = document.getElementById('record');
  record.textContent = json;
  record.hidden = false;
  const link = document.getElementById('download');
  link.href = URL.createObjectURL(new Blob([json + '\n'], { type: 'application/json' }));
  link.hidden = false;
  if (was) view.call('focus', was);
}

const layout = view.open(module.demoFormText(), { file: 'voucher.kform', today: params.get('today') ?? '' });
for (const c of layout.controls) labels[c.name] = c.label;
document.getElementById('finish').addEventListener('click', finish);
document.title = `${layout.title} · KelText in the browser`;
view.call('focus', layout.controls[0].name);
document.body.dataset.ready = 'true';
