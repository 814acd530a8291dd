#include "apps/kelform/tui.h"

#if KELFORM_HAVE_CURSES

#ifndef _XOPEN_SOURCE_EXTENDED
#define _XOPEN_SOURCE_EXTENDED 1
#endif
#ifndef NCURSES_WIDECHAR
#define NCURSES_WIDECHAR 1
#endif

#include <curses.h>
#include <langinfo.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <csignal>
#include <clocale>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <cwchar>
#include <map>
#include <string>
#include <memory>
#include <utility>

#include "keltext/widgetmodel/keyboard.h"

namespace kel::kelform {

namespace {

constexpr int kPollMs = 250;  // how long a read waits before the loop looks at signals

// Key codes of our own for the modifier sequences xterm-like terminals send and terminfo
// often does not name (Alt+Down opens the combo's list).
constexpr int kFirstCustomKey = KEY_MAX + 1;
struct ModifiedKey {
    const char* sequence;
    int16_t key;
    int16_t shift;
};
constexpr ModifiedKey kModifiedKeys[] = {
    {"\033[1;3A", kVkUp, kAltMask},          {"\033[1;3B", kVkDown, kAltMask},
    {"\033[1;3C", kVkRight, kAltMask},       {"\033[1;3D", kVkLeft, kAltMask},
    {"\033[1;5A", kVkUp, kCtrlMask},         {"\033[1;5B", kVkDown, kCtrlMask},
    {"\033[1;5C", kVkRight, kCtrlMask},      {"\033[1;5D", kVkLeft, kCtrlMask},
    {"\033[1;5H", kVkHome, kCtrlMask},       {"\033[1;5F", kVkEnd, kCtrlMask},
    {"\033[1;2A", kVkUp, kShiftMask},        {"\033[1;2B", kVkDown, kShiftMask},
    {"\033[1;2C", kVkRight, kShiftMask},     {"\033[1;2D", kVkLeft, kShiftMask},
    {"\033[1;2H", kVkHome, kShiftMask},      {"\033[1;2F", kVkEnd, kShiftMask},
    {"\033\033[A", kVkUp, kAltMask},         {"\033\033[B", kVkDown, kAltMask},
    {"\033[1;3H", kVkHome, kAltMask},        {"\033[1;3F", kVkEnd, kAltMask},
    {"\033[2;2~", kVkInsert, kShiftMask},    {"\033[3;2~", kVkDelete, kShiftMask},
    {"\033[2;5~", kVkInsert, kCtrlMask},
};

std::optional<Input> named_key(int code) {
    if (code >= kFirstCustomKey && code < kFirstCustomKey + static_cast<int>(std::size(kModifiedKeys))) {
        const ModifiedKey& m = kModifiedKeys[code - kFirstCustomKey];
        return Input::key_of(m.key, m.shift);
    }
    if (code >= KEY_F(1) && code <= KEY_F(12))
        return Input::key_of(static_cast<int16_t>(kVkF1 + (code - KEY_F(1))));
    switch (code) {
        case KEY_UP: return Input::key_of(kVkUp);
        case KEY_DOWN: return Input::key_of(kVkDown);
        case KEY_LEFT: return Input::key_of(kVkLeft);
        case KEY_RIGHT: return Input::key_of(kVkRight);
        case KEY_HOME: return Input::key_of(kVkHome);
        case KEY_END: return Input::key_of(kVkEnd);
        case KEY_SLEFT: return Input::key_of(kVkLeft, kShiftMask);
        case KEY_SRIGHT: return Input::key_of(kVkRight, kShiftMask);
        case KEY_SHOME: return Input::key_of(kVkHome, kShiftMask);
        case KEY_SEND: return Input::key_of(kVkEnd, kShiftMask);
        case KEY_IC: return Input::key_of(kVkInsert);
        case KEY_DC: return Input::key_of(kVkDelete);
        case KEY_PPAGE: return Input::key_of(kVkPageUp);
        case KEY_NPAGE: return Input::key_of(kVkPageDown);
        case KEY_BACKSPACE: return Input::key_of(kVkBackspace);
        case KEY_ENTER: return Input::key_of(kVkEnter);
        case KEY_BTAB: return Input::key_of(kVkTab, kShiftMask);
        default: return std::nullopt;
    }
}

std::optional<Input> character_key(wint_t ch) {
    switch (ch) {
        case 9: return Input::key_of(kVkTab);
        case 10:
        case 13: return Input::key_of(kVkEnter);
        case 8:
        case 127: return Input::key_of(kVkBackspace);
        case 27: return Input::key_of(kVkEscape);
        default: break;
    }
    if (ch >= 1 && ch <= 26) return Input::key_of(static_cast<int16_t>('A' + ch - 1), kCtrlMask);
    if (ch < 32) return std::nullopt;
    return Input::char_of(static_cast<char32_t>(ch));
}

// The terminal's colour for a host colour: the xterm 256-colour cube and grey ramp, or the
// nearest of the eight basic colours.
short colour_index(Colour c, int colours) {
    int r, g, b;
    if (is_system_colour(c)) {
        switch (c & 0xFF) {
            case 0x05: r = g = b = 255; break;  // window background
            case 0x0F: r = g = b = 212; break;  // button face
            case 0x11: r = g = b = 128; break;  // grey text
            default: r = g = b = 0; break;      // window text, button text and the rest
        }
    } else {
        r = c & 0xFF;
        g = (c >> 8) & 0xFF;
        b = (c >> 16) & 0xFF;
    }
    if (colours >= 256) {
        const auto level = [](int v) { return v < 48 ? 0 : v < 115 ? 1 : (v - 35) / 40; };
        const auto value = [](int l) { return l == 0 ? 0 : 55 + 40 * l; };
        const int cr = level(r), cg = level(g), cb = level(b);
        const int cube = 16 + 36 * cr + 6 * cg + cb;
        const auto sq = [](int x) { return x * x; };
        const int cube_err = sq(value(cr) - r) + sq(value(cg) - g) + sq(value(cb) - b);
        const int grey = (r + g + b) / 3;
        const int gi = std::clamp((grey - 3) / 10, 0, 23);
        const int gv = 8 + 10 * gi;
        const int grey_err = sq(gv - r) + sq(gv - g) + sq(gv - b);
        return static_cast<short>(grey_err < cube_err ? 232 + gi : cube);
    }
    if (colours >= 8) {
        const int bits = (r > 127 ? 1 : 0) | (g > 127 ? 2 : 0) | (b > 127 ? 4 : 0);
        // curses numbers: black 0, red 1, green 2, yellow 3, blue 4, magenta 5, cyan 6, white 7
        static constexpr short kBasic[] = {COLOR_BLACK, COLOR_RED,     COLOR_GREEN, COLOR_YELLOW,
                                           COLOR_BLUE,  COLOR_MAGENTA, COLOR_CYAN,  COLOR_WHITE};
        return kBasic[bits];
    }
    return -1;
}

// ASCII stand-ins where the terminal does not speak UTF-8.
wchar_t ascii_fallback(char32_t ch) {
    switch (ch) {
        case U'─': return L'-';
        case U'│': return L'|';
        case U'┌':
        case U'┐':
        case U'└':
        case U'┘': return L'+';
        case U'▲': return L'^';
        case U'▼': return L'v';
        case U'▦': return L'#';
        case U'◂': return L'<';
        case U'▸': return L'>';
        default: return ch < 0x80 ? static_cast<wchar_t>(ch) : L'?';
    }
}

class Terminal {
public:
    Terminal(FILE* out, FILE* in) : out_(out), in_(in) {}
    ~Terminal() { close(); }
    Terminal(const Terminal&) = delete;
    Terminal& operator=(const Terminal&) = delete;

    bool open(std::string& error) {
        std::setlocale(LC_ALL, "");
        const char* codeset = nl_langinfo(CODESET);
        utf8_ = codeset && (std::strcmp(codeset, "UTF-8") == 0 || std::strcmp(codeset, "utf8") == 0);
        screen_ = newterm(nullptr, out_, in_);
        if (!screen_) {
            const char* term = std::getenv("TERM");
            error = std::string("cannot drive this terminal (TERM=") + (term ? term : "") + ")";
            return false;
        }
        set_term(screen_);
        raw();  // Ctrl+S and Ctrl+Q reach the form instead of pausing the output
        noecho();
        nonl();
        keypad(stdscr, TRUE);
        set_escdelay(25);
        timeout(kPollMs);  // reads come back now and then, so that a signal is seen
        mousemask(BUTTON1_PRESSED | BUTTON1_CLICKED | BUTTON1_DOUBLE_CLICKED, nullptr);
        mouseinterval(0);
        for (std::size_t i = 0; i < std::size(kModifiedKeys); ++i)
            define_key(kModifiedKeys[i].sequence, kFirstCustomKey + static_cast<int>(i));
        if (has_colors()) {
            start_color();
            use_default_colors();
            colours_ = COLORS;
        }
        return true;
    }

    void close() {
        if (!screen_) return;
        endwin();
        delscreen(screen_);
        screen_ = nullptr;
    }

    void draw(const Canvas& canvas) {
        for (int r = 0; r < canvas.rows(); ++r)
            for (int c = 0; c < canvas.cols(); ++c) {
                // The bottom-right cell would scroll some terminals: leave it.
                if (r == canvas.rows() - 1 && c == canvas.cols() - 1) continue;
                put(r, c, canvas.at(r, c));
            }
        if (const auto cursor = canvas.cursor()) {
            curs_set(1);
            move(cursor->first, cursor->second);
        } else {
            curs_set(0);
            move(canvas.rows() - 1, 0);
        }
        refresh();
    }

    // The next piece of input, or nothing for a resize or a key with no meaning here.
    std::optional<Input> read() {
        wint_t ch = 0;
        const int r = get_wch(&ch);
        if (r == ERR) return std::nullopt;
        if (r == KEY_CODE_YES) return key_code(static_cast<int>(ch));
        if (ch == 27) {
            // Escape alone, or Alt with the key that follows at once.
            timeout(30);
            wint_t next = 0;
            const int r2 = get_wch(&next);
            timeout(kPollMs);
            if (r2 == ERR) return Input::key_of(kVkEscape);
            if (r2 == OK && (next == '[' || next == 'O')) {
                // An escape sequence curses does not know (a key with modifiers it has no name
                // for, a mouse report in SGR form): read it whole so that none of it is typed.
                if (auto in = unknown_sequence(static_cast<wchar_t>(next))) return in;
                return std::nullopt;
            }
            std::optional<Input> in = r2 == KEY_CODE_YES ? key_code(static_cast<int>(next)) : character_key(next);
            if (!in) return std::nullopt;
            if (in->kind == Input::Kind::character) {
                // Alt with a character: the key of that character, with Alt held.
                const model::Keystroke k = next < 128 ? model::keystroke_for_char(static_cast<uint8_t>(next))
                                                     : model::Keystroke{};
                return Input::key_of(k.key_code, static_cast<int16_t>(k.shift | kAltMask));
            }
            in->shift = static_cast<int16_t>(in->shift | kAltMask);
            return in;
        }
        return character_key(ch);
    }

private:
    std::optional<Input> unknown_sequence(wchar_t introducer) {
        std::wstring body;
        timeout(30);
        for (int i = 0; i < 32; ++i) {
            wint_t c = 0;
            if (get_wch(&c) != OK) break;
            body += static_cast<wchar_t>(c);
            // The final byte of a control sequence; after ESC O a single key follows.
            if (introducer == 'O' || (c >= 0x40 && c <= 0x7E)) break;
        }
        timeout(-1);
        if (body.empty()) {
            // Alt with '[' or 'O' alone.
            return Input::key_of(introducer == '[' ? int16_t{219} : int16_t{'O'}, kAltMask);
        }
        // SGR mouse report: ESC [ < button ; column ; row M (press) or m (release).
        int button = 0, x = 0, y = 0;
        wchar_t final = 0;
        if (introducer == '[' && body[0] == L'<' &&
            std::swscanf(body.c_str() + 1, L"%d;%d;%d%lc", &button, &x, &y, &final) == 4 && final == L'M' &&
            button == 0)
            return Input::click_at(y - 1, x - 1);
        return std::nullopt;
    }

    std::optional<Input> key_code(int code) {
        if (code == KEY_RESIZE) return std::nullopt;
        if (code == KEY_MOUSE) {
            MEVENT ev{};
            if (getmouse(&ev) != OK) return std::nullopt;
            if (ev.bstate & (BUTTON1_PRESSED | BUTTON1_CLICKED | BUTTON1_DOUBLE_CLICKED))
                return Input::click_at(ev.y, ev.x);
            return std::nullopt;
        }
        return named_key(code);
    }

    short pair_for(const CellStyle& s) {
        if (colours_ <= 0 || (!s.fg && !s.bg)) return 0;
        const short fg = s.fg ? colour_index(*s.fg, colours_) : -1;
        const short bg = s.bg ? colour_index(*s.bg, colours_) : -1;
        const auto key = std::make_pair(fg, bg);
        if (auto it = pairs_.find(key); it != pairs_.end()) return it->second;
        if (next_pair_ >= COLOR_PAIRS || next_pair_ > 32000) return 0;  // out of pairs: plain
        const short pair = static_cast<short>(next_pair_++);
        init_pair(pair, fg, bg);
        pairs_.emplace(key, pair);
        return pair;
    }

    void put(int row, int col, const Cell& cell) {
        attr_t attrs = A_NORMAL;
        if (cell.style.bold) attrs |= A_BOLD;
        if (cell.style.reverse) attrs |= A_REVERSE;
        if (cell.style.underline) attrs |= A_UNDERLINE;
        if (cell.style.dim) attrs |= A_DIM;
        wchar_t text[2] = {utf8_ ? static_cast<wchar_t>(cell.ch) : ascii_fallback(cell.ch), L'\0'};
        cchar_t cc;
        if (setcchar(&cc, text, attrs, pair_for(cell.style), nullptr) != OK) return;
        mvadd_wch(row, col, &cc);
    }

    FILE* out_;
    FILE* in_;
    SCREEN* screen_ = nullptr;
    bool utf8_ = true;
    int colours_ = 0;
    int next_pair_ = 1;
    std::map<std::pair<short, short>, short> pairs_;
};

struct FileCloser {
    void operator()(FILE* f) const {
        if (f) std::fclose(f);
    }
};

volatile std::sig_atomic_t g_signal = 0;

extern "C" void note_signal(int sig) { g_signal = sig; }

// SIGHUP and SIGTERM noted while the form runs; the earlier handlers back afterwards.
class SignalGuard {
public:
    SignalGuard() {
        struct sigaction sa {};
        sa.sa_handler = note_signal;
        sigemptyset(&sa.sa_mask);
        sa.sa_flags = 0;  // no restart: a read in progress returns at once
        sigaction(SIGHUP, &sa, &old_hup_);
        sigaction(SIGTERM, &sa, &old_term_);
    }
    ~SignalGuard() { restore(); }
    SignalGuard(const SignalGuard&) = delete;
    SignalGuard& operator=(const SignalGuard&) = delete;
    void restore() {
        if (restored_) return;
        restored_ = true;
        sigaction(SIGHUP, &old_hup_, nullptr);
        sigaction(SIGTERM, &old_term_, nullptr);
    }

private:
    struct sigaction old_hup_ {};
    struct sigaction old_term_ {};
    bool restored_ = false;
};

}  // namespace

bool terminal_ui_available() { return true; }

std::optional<TerminalSession::Outcome> run_tui(TerminalSession& session, std::string& error) {
    if (!isatty(STDIN_FILENO)) {
        error = "no terminal";
        return std::nullopt;
    }
    // The screen goes to the terminal even when standard output is redirected, so that the
    // values printed at the end can go to a file or a pipe.
    std::unique_ptr<FILE, FileCloser> tty;
    FILE* out = stdout;
    if (!isatty(STDOUT_FILENO)) {
        tty.reset(std::fopen("/dev/tty", "w"));
        if (!tty) {
            error = "no terminal";
            return std::nullopt;
        }
        out = tty.get();
    }
    std::fflush(stdout);
    // A hang-up or a kill request ends the form with the terminal restored (the alternate
    // screen left, mouse reports off), then the signal ends the process as it would have.
    g_signal = 0;
    SignalGuard guard;
    auto outcome = TerminalSession::Outcome::going_on;
    {
        Terminal terminal(out, stdin);
        if (!terminal.open(error)) return std::nullopt;
        while (outcome == TerminalSession::Outcome::going_on && g_signal == 0) {
            Canvas canvas(LINES, COLS);
            session.render(canvas);
            terminal.draw(canvas);
            const std::optional<Input> input = terminal.read();
            if (input) outcome = session.handle(*input);
        }
    }
    if (const int sig = g_signal; sig != 0) {
        guard.restore();
        std::raise(sig);
        return TerminalSession::Outcome::signalled;
    }
    return outcome;
}

}  // namespace kel::kelform

#else  // no curses in this build

namespace kel::kelform {

bool terminal_ui_available() { return false; }

std::optional<TerminalSession::Outcome> run_tui(TerminalSession&, std::string& error) {
    error = "this kelform was built without a terminal library (ncurses)";
    return std::nullopt;
}

}  // namespace kel::kelform

#endif
