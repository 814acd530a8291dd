#!/usr/bin/env bash
# Drives `kelform` in a real terminal (a private tmux server) as a person would: types into
# every field of the demo voucher, checks what the screen shows, finishes with F10 and checks
# the JSON printed; then fills in a form file with a record, saves it, opens it again with
# the record, and leaves one with Escape.
# usage: tui_tmux.sh KELFORM VOUCHER.kform
# Exit 77 (skipped) when tmux is missing.
set -euo pipefail
export LC_ALL=C.UTF-8

kelform=$1
voucher=$2
if ! command -v tmux >/dev/null 2>&1; then
  echo "tmux is not installed: skipping the terminal test (tools/setup installs it)"
  exit 77
fi

work=$(mktemp -d)
sock=$work/tmux.0.sock
runs=0
unset TMUX
tm() { tmux -S "$sock" -f /dev/null "$@"; }
cleanup() {
  for s in "$work"/tmux.*.sock; do
    [ -S "$s" ] && tmux -S "$s" kill-server >/dev/null 2>&1 || true
  done
  rm -rf "$work"
}
trap cleanup EXIT

fail() {
  echo "FAIL: $*"
  echo "---- screen ----"
  tm capture-pane -p -t kf 2>/dev/null || echo "(no screen)"
  echo "----------------"
  exit 1
}

# Starts kelform with the given arguments in a fresh 80x24 terminal; its standard output goes
# to $work/out, its exit status to $work/status.
start() {
  rm -f "$work/out" "$work/status"
  # Each run gets a server of its own: a server being killed cannot take the next one along.
  tm kill-server >/dev/null 2>&1 || true
  runs=$((runs + 1))
  sock=$work/tmux.$runs.sock
  tm new-session -d -s kf -x 80 -y 24 \
    "cd '$work' && LANG=C.UTF-8 LC_ALL=C.UTF-8 '$kelform' $* > '$work/out'; echo \$? > '$work/status'; sleep 60"
}

screen() { tm capture-pane -p -t kf; }

wait_for() {
  local text=$1
  for _ in $(seq 1 300); do
    if screen | grep -qF -- "$text"; then return 0; fi
    sleep 0.1
  done
  fail "the screen never showed '$text'"
}

# The line of the screen that holds a label.
line_of() { screen | grep -F -- "$1" | head -n 1; }

expect_line() {
  local label=$1 text=$2
  for _ in $(seq 1 200); do
    if line_of "$label" | grep -qF -- "$text"; then return 0; fi
    sleep 0.1
  done
  fail "the line of '$label' does not show '$text': '$(line_of "$label")'"
}

send() { tm send-keys -t kf "$@"; sleep 0.15; }

# A mouse click (press and release, in the terminal's basic mouse report) on the first cell
# that shows CHAR on the line of LABEL.
click_on() {
  local label=$1 char=$2 line row prefix col
  row=$(screen | grep -nF -- "$label" | head -n 1 | cut -d: -f1)
  [ -n "$row" ] || fail "no line shows '$label'"
  row=$((row - 1))
  line=$(line_of "$label")
  case $line in *"$char"*) ;; *) fail "the line of '$label' shows no '$char'" ;; esac
  prefix=${line%%"$char"*}
  col=${#prefix}
  local x y
  x=$(printf '\\x%x' $((33 + col)))
  y=$(printf '\\x%x' $((33 + row)))
  tm send-keys -t kf -l "$(printf "\\e[M $x$y\\e[M#$x$y")"
  sleep 0.15
}

wait_exit() {
  for _ in $(seq 1 300); do
    if [ -s "$work/status" ]; then cat "$work/status"; return 0; fi
    sleep 0.1
  done
  fail "kelform did not end"
}

# The demo's dates hang on today (its financial year, the date it starts with): the test runs
# on a fixed day, so that it does not change when the year turns.
export KELFORM_TODAY=2026-12-06
fy=2026

# ---- 1. the demo form, every field, F10 --------------------------------------------------
start
wait_for "Payment voucher"
wait_for "F10 finish"
send -l "ramesh kumar"
expect_line "Payee name" "Ramesh Kumar"
send Tab
send -l "abcde1234f"
expect_line "PAN" "ABCDE1234F"
send Tab
send -l "1234567.5"
send Tab
expect_line "Amount (Rs)" "12,34,567.50"          # grouped when focus left the box
expect_line "Voucher date" "06/12/$fy"            # starts at today
send -l "31/4/$fy"                                # typed with slashes over the whole date
send Tab
expect_line "Voucher date" "30/04/$fy"            # 31 April corrected to the 30th
send -l "ch"
expect_line "Pay mode" "Cheque"                   # completed from the list
send Tab
send -l "123456"
send Tab
send -l "1326"
send Tab
wait_for "two-digit year"                         # the form's status line on DateError
send Home
send -l "0526"
send F2
wait_for "Events (F2 hides)"
send F2
send F10
status=$(wait_exit)
[ "$status" = 0 ] || fail "exit status $status after F10"
expected=$(cat <<EOF
{
  "Payee": "Ramesh Kumar",
  "PAN": "ABCDE1234F",
  "Amount": 1234567.5,
  "VoucherDate": "30/04/$fy",
  "PayMode": "Cheque",
  "ChequeNo": "123456",
  "Period": "05/26 "
}
EOF
)
actual=$(cat "$work/out")
if [ "$actual" != "$expected" ]; then
  echo "expected:"; echo "$expected"; echo "printed:"; echo "$actual"
  fail "the JSON printed differs"
fi

# ---- 2. a form file with a record: fill in, Ctrl+S, F10, reopen -----------------------------
cp "$voucher" "$work/v.kform"
cp "$voucher" "$work/pristine.kform"
start run v.kform --record rec.json
wait_for "Payment voucher"
send -l "anil"
click_on "Amount (Rs)" "▲"                         # the spin buttons, by mouse
click_on "Amount (Rs)" "▲"
expect_line "Amount (Rs)" "101"                   # empty: the lower bound 1, then 100 up
send Tab Tab Tab Tab
send F4                                           # the combo's list
wait_for "UPI"
send Down Down Enter
expect_line "Pay mode" "Card"
send BTab
send F4                                           # the calendar of the voucher date
wait_for "Su Mo Tu We Th Fr Sa"
send Home Enter
day1=01/12/$fy
expect_line "Voucher date" "$day1"
send Tab Tab
send -l "654321"
send Tab
send -l "0626"
send C-s
wait_for "Saved to rec.json"
[ -s "$work/rec.json" ] || fail "Ctrl+S wrote no record"
send F10
status=$(wait_exit)
[ "$status" = 0 ] || fail "exit status $status after F10 on a form file"
grep -qF '"Payee": "Anil"' "$work/out" || fail "payee not printed: $(cat "$work/out")"
grep -qF '"Amount": 101,' "$work/out" || fail "spin buttons not applied: $(cat "$work/out")"
grep -qF "\"VoucherDate\": \"$day1\"" "$work/out" || fail "calendar day not printed: $(cat "$work/out")"
cmp -s "$work/out" "$work/rec.json" || fail "the record saved differs from the values printed"
cmp -s "$work/v.kform" "$work/pristine.kform" || fail "filling the form in changed the form file"

# Opened again with its record, every field comes back as it was left; F10 at once prints
# the same record again.
cp "$work/rec.json" "$work/first.json"
start run v.kform --record rec.json
wait_for "Payment voucher"
expect_line "Payee name" "Anil"
expect_line "Amount (Rs)" "101.00"
expect_line "Voucher date" "$day1"
expect_line "Pay mode" "Card"
expect_line "Cheque number" "654321"
expect_line "Period (mm/yy)" "06/26"
send F10
status=$(wait_exit)
[ "$status" = 0 ] || fail "exit status $status after F10 on a reopened record"
cmp -s "$work/out" "$work/first.json" || fail "the reopened record differs: $(cat "$work/out")"

# A blank amount stays blank: null in the record, empty when opened again.
sed 's/"Amount": 101,/"Amount": null,/' "$work/first.json" > "$work/rec.json"
start run v.kform --record rec.json
wait_for "Payment voucher"
expect_line "Payee name" "Anil"
send F10
status=$(wait_exit)
[ "$status" = 0 ] || fail "exit status $status after F10 on a record with a blank amount"
grep -qF '"Amount": null,' "$work/out" || fail "the blank amount came back as: $(cat "$work/out")"

# ---- 3. Escape asks before changes are dropped, and drops nothing else ----------------------
cp "$work/rec.json" "$work/before.json"
start run v.kform --record rec.json
wait_for "Payment voucher"
send -l "x"
send Tab Tab Tab                                  # to the voucher date, selected whole
send -l "5/8/$fy"
send Tab
expect_line "Voucher date" "05/08/$fy"
send Escape
wait_for "Discard changes? y/n"
send -l "y"
status=$(wait_exit)
[ "$status" = 1 ] || fail "exit status $status after Escape"
[ ! -s "$work/out" ] || fail "Escape printed: $(cat "$work/out")"
cmp -s "$work/rec.json" "$work/before.json" || fail "Escape changed the record"
cmp -s "$work/v.kform" "$work/pristine.kform" || fail "Escape changed the form file"

# A record that cannot be saved where it is: said before anything is typed.
start run v.kform --record nodir/rec.json
wait_for "nodir/rec.json cannot be saved: No such file or directory"
send C-q
status=$(wait_exit)
[ "$status" = 1 ] || fail "exit status $status after Ctrl+Q"

# A record that names no control of the form: reported, the form not opened, the file kept.
printf '{"Nobody": "x"}\n' > "$work/bad.json"
start run v.kform --record bad.json
status=$(wait_exit)
[ "$status" = 2 ] || fail "exit status $status for a bad record"
printf '{"Nobody": "x"}\n' | cmp -s - "$work/bad.json" || fail "a bad record was rewritten"

echo "kelform in tmux: all steps passed"
