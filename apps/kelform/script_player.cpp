#include "apps/kelform/script_player.h"

#include <algorithm>
#include <cmath>
#include <limits>

#include "keltext/host/conversions.h"
#include "keltext/host/errors.h"
#include "keltext/host/font.h"

namespace kel::kelform {
namespace {

bool same_value(const Variant& a, const Variant& b) {
    if (a.is_object() && b.is_object()) {
        auto fa = font_of(a), fb = font_of(b);
        if (fa && fb) return fa->same_as(*fb);
        return a.object() == b.object();
    }
    return a == b;
}

// Numeric arguments of commands (sizes, positions, buttons, codes): a numeric literal, checked
// against the range of what it feeds.
double number_arg(Args& a, std::string_view what) {
    std::string_view word = a.next(what);
    Variant v = parse_value(word);
    if (!v.is_number()) throw ScriptError("expected a number for " + std::string(what) + ", got '" + shown(word) + "'");
    return v.number();
}

int32_t int32_arg(Args& a, std::string_view what) {
    double d = number_arg(a, what);
    if (d != std::floor(d) || d < std::numeric_limits<int32_t>::min() || d > std::numeric_limits<int32_t>::max())
        throw ScriptError("expected a whole number for " + std::string(what));
    return static_cast<int32_t>(d);
}

int16_t int16_arg(Args& a, std::string_view what) {
    double d = number_arg(a, what);
    if (d != std::floor(d) || d < std::numeric_limits<int16_t>::min() || d > std::numeric_limits<int16_t>::max())
        throw ScriptError("expected a 16-bit whole number for " + std::string(what));
    return static_cast<int16_t>(d);
}

float float_arg(Args& a, std::string_view what) {
    double d = number_arg(a, what);
    if (std::fabs(d) > std::numeric_limits<float>::max())
        throw ScriptError("number out of range for " + std::string(what));
    return static_cast<float>(d);
}

bool on_off(Args& a, std::string_view what) {
    std::string_view w = a.next(what);
    if (same_name(w, "on")) return true;
    if (same_name(w, "off")) return false;
    throw ScriptError("expected on or off, got '" + shown(w) + "'");
}

// The by-reference argument keeps the kind the control gave it.
Variant as_kind_of(const Variant& original, const Variant& value) {
    switch (original.kind()) {
    case VarKind::Byte: return Variant(to_byte(value));
    case VarKind::Int16: return Variant(to_int16(value));
    case VarKind::Int32: return Variant(to_int32(value));
    case VarKind::Single: return Variant(to_single(value));
    case VarKind::Double: return Variant(to_double(value));
    case VarKind::Boolean: return Variant(to_bool(value));
    default: return value;
    }
}

}  // namespace

// ---- Args ----

std::optional<std::string_view> Args::peek() const {
    if (done()) return std::nullopt;
    return words_[pos_];
}

std::string_view Args::next(std::string_view what) {
    if (done()) throw ScriptError("missing argument: " + std::string(what));
    return words_[pos_++];
}

std::string_view Args::name(std::string_view what) {
    std::string_view w = next(what);
    if (!is_name(w)) throw ScriptError("malformed name '" + shown(w) + "'");
    return w;
}

void Args::finish() const {
    if (!done()) throw ScriptError("extra argument '" + shown(words_[pos_]) + "'");
}

std::span<const std::string_view> Args::rest() const {
    return std::span<const std::string_view>(words_).subspan(std::min(pos_, words_.size()));
}

// ---- Player ----

struct Player::Member {
    mini::HostedControl* control = nullptr;
    const PropertyInfo* property = nullptr;  // a property of the control, or
    model::Part* part = nullptr;              // a member of one of its parts
    std::string member;
    std::optional<Variant> index;
    std::string label;  // as printed: NAME.Prop(0), NAME.part.Member
};

struct Player::Handler {
    enum Kind { set_argument, get_member, set_member, echo } kind = echo;
    mini::HostedControl* control = nullptr;
    std::string event;
    std::string argument;  // set_argument
    Member target;         // get_member, set_member
    Variant value;         // set_argument, set_member
    std::string text;      // echo
};

Player::Player(std::span<const ClassInfo> classes, std::ostream& out, const FormMaker& make_form)
    : classes_(classes), out_(out) {
    auto* observer = static_cast<model::FormObserver*>(this);
    form_ = make_form ? make_form(observer) : std::make_unique<mini::Form>(observer);
    add_builtin_commands();
}

Player::~Player() {
    form_->set_observer(nullptr);
    form_.reset();
}

void Player::add_command(std::string name, CommandFn run) { commands_[name_key(name)] = std::move(run); }

void Player::add_builtin_commands() {
    // The whole command table: a command is its name and the member that runs it.
    using M = void (Player::*)(Args&);
    const std::pair<const char*, M> simple[] = {
        {"mode", &Player::cmd_mode},       {"save", &Player::cmd_save},       {"set", &Player::cmd_set},
        {"get", &Player::cmd_get},         {"call", &Player::cmd_call},       {"peek", &Player::cmd_peek},
        {"poke", &Player::cmd_poke},       {"resize", &Player::cmd_resize},   {"focus", &Player::cmd_focus},
        {"type", &Player::cmd_type},       {"key", &Player::cmd_key},         {"keypress", &Player::cmd_keypress},
        {"insert", &Player::cmd_insert},   {"paste", &Player::cmd_paste},     {"select", &Player::cmd_select},
        {"notify", &Player::cmd_notify},   {"on", &Player::cmd_on},           {"off", &Player::cmd_off},
        {"trace", &Player::cmd_trace},     {"echo", &Player::cmd_echo},       {"expect", &Player::cmd_expect},
        {"page", &Player::cmd_page},       {"apply", &Player::cmd_apply},     {"clipboard", &Player::cmd_clipboard},
    };
    for (const auto& entry : simple) {
        M fn = entry.second;
        add_command(entry.first, [fn](Player& p, Args& a) { (p.*fn)(a); });
    }
    add_command("new", [](Player& p, Args& a) { p.cmd_new(a, false); });
    add_command("load", [](Player& p, Args& a) { p.cmd_new(a, true); });
    add_command("keydown", [](Player& p, Args& a) { p.cmd_key_half(a, true); });
    add_command("keyup", [](Player& p, Args& a) { p.cmd_key_half(a, false); });
    add_command("click", [](Player& p, Args& a) { p.cmd_click(a, false); });
    add_command("dblclick", [](Player& p, Args& a) { p.cmd_click(a, true); });
    add_command("mousedown", [](Player& p, Args& a) { p.cmd_mouse(a, true); });
    add_command("mouseup", [](Player& p, Args& a) { p.cmd_mouse(a, false); });
}

int Player::run_script(std::string_view text, std::string_view file, std::ostream& err) {
    file_ = std::string(file);
    line_ = 0;
    std::size_t start = 0;
    for (;;) {
        std::size_t end = text.find('\n', start);
        std::string_view line = text.substr(start, end == std::string_view::npos ? text.npos : end - start);
        if (!line.empty() && line.back() == '\r') line.remove_suffix(1);
        ++line_;
        try {
            run_line(line);
        } catch (const ScriptError& e) {
            out_.flush();
            err << file << ':' << line_ << ": " << e.what() << '\n';
            return 2;
        }
        if (end == std::string_view::npos) break;
        start = end + 1;
    }
    out_.flush();
    return expect_failed_ ? 1 : 0;
}

void Player::run_line(std::string_view line) {
    std::vector<std::string_view> words = split_words(line);
    if (words.empty()) return;
    Args args(std::vector<std::string_view>(words.begin() + 1, words.end()));
    try {
        run_command(words[0], args);
        mini::HostedControl* f = form_->focused();
        guarded(f ? std::string_view(f->name()) : std::string_view("form"), [this] { form_->run_pending(); });
    } catch (const mini::FormError& e) {
        throw ScriptError(e.what());
    }
}

void Player::run_command(std::string_view word, Args& args) {
    auto it = commands_.find(name_key(word));
    if (it == commands_.end()) throw ScriptError("unknown command '" + shown(word) + "'");
    it->second(*this, args);
}

const ClassInfo& Player::find_class(std::string_view name) const {
    for (const ClassInfo& c : classes_)
        if (same_name(c.name, name)) return c;
    throw ScriptError("unknown class '" + shown(name) + "'");
}

mini::HostedControl& Player::find_control(std::string_view name) {
    mini::HostedControl* c = form_->find(name);
    if (!c) throw ScriptError("unknown control '" + shown(name) + "'");
    return *c;
}

void Player::guarded(std::string_view label, const std::function<void()>& action) {
    try {
        action();
    } catch (const RuntimeError& e) {
        out_ << label << " -> " << format_error(e.number()) << '\n';
    }
}

// ---- resolving members ----

Player::PartRef Player::resolve_part(std::string_view control_name, std::string_view part_name) {
    mini::HostedControl& c = find_control(control_name);
    model::Part* part = c.part(part_name);
    if (!part) throw ScriptError("unknown part '" + c.name() + "." + shown(part_name) + "'");
    std::string spelled;
    for (const auto& [name, p] : c.parts())
        if (p == part) spelled = name;
    if (spelled.empty()) spelled = name_key(part_name);  // "surface", "page"
    return PartRef{&c, part, c.name() + "." + spelled};
}

Player::Member Player::resolve(std::string_view word, bool allow_part, bool allow_property) {
    Target t = parse_target(word);
    Member m;
    if (t.index) m.index = parse_value(*t.index);
    std::string index_text = m.index ? "(" + format_index(*m.index) + ")" : "";
    if (t.names.size() == 2 && allow_property) {
        mini::HostedControl& c = find_control(t.names[0]);
        const PropertyInfo* p = c.info().find_property(t.names[1]);
        if (!p) throw ScriptError("unknown property '" + c.name() + "." + shown(t.names[1]) + "'");
        if (p->indexed && !m.index) throw ScriptError("property '" + c.name() + "." + p->name + "' needs an index");
        if (!p->indexed && m.index) throw ScriptError("property '" + c.name() + "." + p->name + "' takes no index");
        m.control = &c;
        m.property = p;
        m.label = c.name() + "." + p->name + index_text;
        return m;
    }
    if (t.names.size() == 3 && allow_part) {
        PartRef ref = resolve_part(t.names[0], t.names[1]);
        std::optional<std::string> member = model::find_member(*ref.part, t.names[2]);
        if (!member) throw ScriptError("unknown member '" + ref.label + "." + shown(t.names[2]) + "'");
        m.control = ref.control;
        m.part = ref.part;
        m.member = *member;
        m.label = ref.label + "." + *member + index_text;
        return m;
    }
    std::string shape = allow_property && allow_part ? "NAME.Prop or NAME.part.Member"
                        : allow_property             ? "NAME.Prop"
                                                     : "NAME.part.Member";
    throw ScriptError("expected " + shape + ", got '" + shown(word) + "'");
}

std::pair<Variant, std::optional<int>> Player::read(const Member& m) {
    try {
        if (m.property) return {m.control->dispatch().get(m.property->name, m.index ? &*m.index : nullptr), {}};
        std::optional<int32_t> index;
        if (m.index) index = to_int32(*m.index);
        return {m.part->peek(m.member, index), {}};
    } catch (const RuntimeError& e) {
        return {Variant(), e.number()};
    }
}

void Player::write(const Member& m, const Variant& value) {
    struct Shown {
        model::FormDriver& form;
        ~Shown() { form.members_changed(); }
    } shown{*form_};
    if (m.property) {
        m.control->dispatch().set(m.property->name, value, m.index ? &*m.index : nullptr);
        return;
    }
    std::optional<int32_t> index;
    if (m.index) index = to_int32(*m.index);
    m.part->poke(m.member, value, index);
}

std::pair<Variant, std::optional<int>> Player::read_checked(const Member& m) {
    form_->check_views(*m.control);
    return read(m);
}

// ---- form observer ----

void Player::event_raised(mini::HostedControl& control, int /*number*/, std::string_view event,
                          std::span<EventArg> args) {
    if (trace_events_) {
        out_ << "event " << control.name() << '.' << event;
        for (const EventArg& a : args) out_ << ' ' << a.name << '=' << format_plain(a.value);
        out_ << '\n';
    }
    // Handlers that set properties can raise the events that run them again: the form stops
    // such a chain with error 28 (out of stack space), as the host would. Handlers are added
    // and removed only by script lines, but running a copy keeps this loop safe whatever the
    // form does meanwhile.
    std::vector<const Handler*> matching;
    for (const Handler& h : handlers_)
        if (h.control == &control && same_name(h.event, event)) matching.push_back(&h);
    if (matching.empty()) return;
    std::vector<Handler> running;
    running.reserve(matching.size());
    for (const Handler* h : matching) running.push_back(*h);
    for (const Handler& h : running) run_handler(h, args);
}

void Player::run_handler(const Handler& h, std::span<EventArg> args) {
    switch (h.kind) {
    case Handler::set_argument:
        for (EventArg& a : args)
            if (same_name(a.name, h.argument))
                guarded(h.control->name() + "." + h.event, [&] { a.value = as_kind_of(a.value, h.value); });
        break;
    case Handler::get_member: {
        auto [value, error] = read(h.target);
        out_ << h.target.label << (error ? " -> " + format_error(*error) : " = " + format_value(value)) << '\n';
        break;
    }
    case Handler::set_member: guarded(h.target.label, [&] { write(h.target, h.value); }); break;
    case Handler::echo: out_ << h.text << '\n'; break;
    }
}

void Player::keys_sent(mini::HostedControl& control, std::string_view keys) {
    if (trace_sendkeys_) out_ << "sendkeys " << control.name() << ' ' << quote(keys) << '\n';
}

void Player::property_changed(mini::HostedControl& control, std::string_view property) {
    if (trace_changed_) out_ << "changed " << control.name() << '.' << property << '\n';
}

void Player::handler_error(std::string_view where, int number) {
    out_ << where << " -> " << format_error(number) << '\n';
}

void Player::focus_refused(mini::HostedControl& control) {
    refusal_reported_ = true;
    out_ << "focus " << control.name() << " refused\n";
}

// ---- commands: controls and the form ----

void Player::cmd_mode(Args& a) {
    std::string_view w = a.next("design or run");
    a.finish();
    if (same_name(w, "design"))
        form_->set_user_mode(false);
    else if (same_name(w, "run"))
        form_->set_user_mode(true);
    else
        throw ScriptError("expected design or run, got '" + shown(w) + "'");
}

void Player::cmd_new(Args& a, bool load) {
    const ClassInfo& cls = find_class(a.next("class"));
    std::string name(a.name("control name"));
    if (cls.is_page) throw ScriptError("class '" + cls.name + "' is a property page: open it with page");
    if (!cls.create) throw ScriptError("class '" + cls.name + "' cannot be created");
    if (form_->find(name)) throw ScriptError("a control named '" + name + "' already exists");
    float width = 1200, height = 300;
    // load's optional size stands before its Key=value words: a word that starts like a number.
    auto next = a.peek();
    bool sized = next && (!load || (!next->empty() && std::string_view("0123456789.+-").find((*next)[0]) !=
                                                           std::string_view::npos));
    if (sized) {
        width = float_arg(a, "width");
        height = float_arg(a, "height");
    }
    mini::StoredValues store;
    while (load && !a.done()) {
        std::string_view w = a.next("Key=value");
        std::size_t eq = w.find('=');
        if (eq == std::string_view::npos || !is_name(w.substr(0, eq)))
            throw ScriptError("expected Key=value, got '" + shown(w) + "'");
        store.emplace_back(std::string(w.substr(0, eq)), parse_value(w.substr(eq + 1)));
    }
    a.finish();
    guarded(name, [&] {
        if (load)
            form_->load(cls, name, store, width, height);
        else
            form_->create(cls, name, width, height);
    });
}

void Player::cmd_save(Args& a) {
    mini::HostedControl& c = find_control(a.next("control name"));
    a.finish();
    guarded(c.name(), [&] {
        for (const auto& [key, value] : form_->save(c))
            out_ << "saved " << c.name() << ' ' << key << " = " << format_value(value) << '\n';
    });
}

void Player::cmd_set(Args& a) {
    Member m = resolve(a.next("NAME.Prop"), false, true);
    Variant value = a.value("value");
    a.finish();
    if (m.property->read_only()) throw ScriptError("property '" + m.label + "' is read-only");
    guarded(m.label, [&] { write(m, value); });
}

void Player::cmd_get(Args& a) {
    Member m = resolve(a.next("NAME.Prop"), false, true);
    a.finish();
    auto [value, error] = read_checked(m);
    out_ << m.label << (error ? " -> " + format_error(*error) : " = " + format_value(value)) << '\n';
}

void Player::cmd_call(Args& a) {
    std::string_view word = a.next("NAME.Method");
    Target t = parse_target(word);
    if (t.names.size() != 2 || t.index) throw ScriptError("expected NAME.Method, got '" + shown(word) + "'");
    mini::HostedControl& c = find_control(t.names[0]);
    const MethodInfo* method = c.info().find_method(t.names[1]);
    if (!method) throw ScriptError("unknown method '" + c.name() + "." + shown(t.names[1]) + "'");
    std::vector<Variant> values;
    while (!a.done()) {
        if (values.size() >= method->args.size()) a.finish();
        values.push_back(a.value("value"));
    }
    for (std::size_t i = values.size(); i < method->args.size(); ++i)
        if (!method->args[i].optional) throw ScriptError("missing argument: " + method->args[i].name);
    guarded(c.name() + "." + method->name, [&] { c.dispatch().call(method->name, values); });
    form_->members_changed();
}

void Player::cmd_peek(Args& a) {
    Member m = resolve(a.next("NAME.part.Member"), true, false);
    a.finish();
    auto [value, error] = read_checked(m);
    out_ << m.label << (error ? " -> " + format_error(*error) : " = " + format_value(value)) << '\n';
}

void Player::cmd_poke(Args& a) {
    Member m = resolve(a.next("NAME.part.Member"), true, false);
    Variant value = a.value("value");
    a.finish();
    guarded(m.label, [&] { write(m, value); });
}

void Player::cmd_resize(Args& a) {
    mini::HostedControl& c = find_control(a.next("control name"));
    float width = float_arg(a, "width");
    float height = float_arg(a, "height");
    a.finish();
    guarded(c.name(), [&] { form_->resize(c, width, height); });
}

// ---- commands: user input ----

mini::HostedControl& Player::focused_for_input() {
    mini::HostedControl* c = form_->focused();
    if (!c) throw ScriptError("no control has focus");
    return *c;
}

void Player::keystroke(const model::Keystroke& k) {
    // Tab and Shift+Tab belong to the form: they move focus and reach no control.
    if (k.key_code == kVkTab && (k.shift & (kCtrlMask | kAltMask)) == 0) {
        guarded("form", [&] { form_->tab((k.shift & kShiftMask) == 0); });
        return;
    }
    mini::HostedControl& c = focused_for_input();
    guarded(c.name(), [&] { form_->keystroke(k); });
}

void Player::cmd_focus(Args& a) {
    std::string_view w = a.next("control name or none");
    a.finish();
    if (same_name(w, "none")) {
        guarded("form", [&] { form_->focus(nullptr); });
        return;
    }
    mini::HostedControl& c = find_control(w);
    refusal_reported_ = false;
    guarded(c.name(), [&] {
        if (form_->focus(&c) == mini::Form::FocusResult::refused && !refusal_reported_) focus_refused(c);
    });
}

void Player::cmd_type(Args& a) {
    std::string text = a.text("text");
    a.finish();
    for (char ch : text) {
        keystroke(model::keystroke_for_char(static_cast<uint8_t>(ch)));
    }
}

void Player::cmd_key(Args& a) {
    std::string_view w = a.next("key");
    a.finish();
    std::optional<model::Keystroke> k = model::parse_key(w);
    if (!k) throw ScriptError("unknown key '" + shown(w) + "'");
    keystroke(*k);
}

void Player::cmd_key_half(Args& a, bool down) {
    std::string_view w = a.next("key");
    a.finish();
    std::optional<model::Keystroke> k = model::parse_key(w);
    if (!k) throw ScriptError("unknown key '" + shown(w) + "'");
    mini::HostedControl& c = focused_for_input();
    guarded(c.name(), [&] {
        if (down)
            form_->key_down(k->key_code, k->shift);
        else
            form_->key_up(k->key_code, k->shift);
    });
}

void Player::cmd_keypress(Args& a) {
    int16_t code = int16_arg(a, "character code");
    a.finish();
    mini::HostedControl& c = focused_for_input();
    guarded(c.name(), [&] { form_->key_press(code); });
}

void Player::cmd_insert(Args& a) {
    bool on = on_off(a, "on or off");
    a.finish();
    form_->set_insert(on);
}

void Player::cmd_paste(Args& a) {
    std::string text = a.text("text");
    a.finish();
    mini::HostedControl& c = focused_for_input();
    guarded(c.name(), [&] { form_->paste(text); });
}

void Player::cmd_clipboard(Args& a) {
    if (a.done()) {
        out_ << "clipboard = " << format_value(Variant(form_->clipboard())) << '\n';
        return;
    }
    std::string text = a.text("text");
    a.finish();
    form_->set_clipboard(text);
}

void Player::cmd_select(Args& a) {
    mini::HostedControl& c = find_control(a.next("control name"));
    int32_t start = int32_arg(a, "start");
    int32_t length = int32_arg(a, "length");
    a.finish();
    guarded(c.name(), [&] { form_->select(c, start, length); });
}

void Player::cmd_click(Args& a, bool dbl) {
    std::string_view word = a.next("NAME.part");
    a.finish();
    Target t = parse_target(word);
    if (t.names.size() != 2 || t.index) throw ScriptError("expected NAME.part, got '" + shown(word) + "'");
    PartRef ref = resolve_part(t.names[0], t.names[1]);
    guarded(ref.label + (dbl ? ".DblClick" : ".Click"), [&] {
        if (dbl)
            form_->dbl_click(*ref.control, *ref.part);
        else
            form_->click(*ref.control, *ref.part);
    });
}

void Player::cmd_notify(Args& a) {
    std::string_view word = a.next("NAME.part.Notification");
    a.finish();
    Target t = parse_target(word);
    if (t.names.size() != 3 || t.index)
        throw ScriptError("expected NAME.part.Notification, got '" + shown(word) + "'");
    PartRef ref = resolve_part(t.names[0], t.names[1]);
    std::optional<std::string> n = model::find_notification(*ref.part, t.names[2]);
    if (!n) throw ScriptError("unknown notification '" + ref.label + "." + shown(t.names[2]) + "'");
    guarded(ref.label + "." + *n, [&] { form_->notify(*ref.control, *ref.part, *n); });
}

void Player::cmd_mouse(Args& a, bool down) {
    std::string_view word = a.next("NAME.part");
    Target t = parse_target(word);
    if (t.names.size() != 2 || t.index) throw ScriptError("expected NAME.part, got '" + shown(word) + "'");
    int16_t button = int16_arg(a, "button");
    int16_t shift = int16_arg(a, "shift");
    float x = float_arg(a, "x");
    float y = float_arg(a, "y");
    a.finish();
    PartRef ref = resolve_part(t.names[0], t.names[1]);
    guarded(ref.label + (down ? ".MouseDown" : ".MouseUp"),
            [&] { form_->mouse(*ref.control, *ref.part, down, button, shift, x, y); });
}

// ---- commands: form code, events and output ----

void Player::cmd_on(Args& a) {
    std::string_view word = a.next("NAME.Event");
    Target t = parse_target(word);
    if (t.names.size() != 2 || t.index) throw ScriptError("expected NAME.Event, got '" + shown(word) + "'");
    mini::HostedControl& c = find_control(t.names[0]);
    const EventInfo* ev = c.info().find_event(t.names[1]);
    if (!ev) throw ScriptError("unknown event '" + c.name() + "." + shown(t.names[1]) + "'");
    Handler h;
    h.control = &c;
    h.event = ev->name;
    std::string_view action = a.next("action");
    if (same_name(action, "set")) {
        std::string_view what = a.next("argument or NAME.Prop");
        if (what.find('.') == std::string_view::npos && what.find('(') == std::string_view::npos) {
            auto arg = std::find_if(ev->args.begin(), ev->args.end(),
                                    [&](const ArgInfo& i) { return same_name(i.name, what); });
            if (arg == ev->args.end())
                throw ScriptError("unknown argument '" + shown(what) + "' of " + c.name() + "." + ev->name);
            h.kind = Handler::set_argument;
            h.argument = arg->name;
        } else {
            h.kind = Handler::set_member;
            h.target = resolve(what, false, true);
            if (h.target.property->read_only())
                throw ScriptError("property '" + h.target.label + "' is read-only");
        }
        h.value = a.value("value");
    } else if (same_name(action, "get")) {
        h.kind = Handler::get_member;
        h.target = resolve(a.next("NAME.Prop"), true, true);
    } else if (same_name(action, "echo")) {
        h.kind = Handler::echo;
        h.text = a.text("text");
    } else {
        throw ScriptError("unknown action '" + shown(action) + "'");
    }
    a.finish();
    handlers_.push_back(std::move(h));
}

void Player::cmd_off(Args& a) {
    std::string_view word = a.next("NAME.Event");
    a.finish();
    Target t = parse_target(word);
    if (t.names.size() != 2 || t.index) throw ScriptError("expected NAME.Event, got '" + shown(word) + "'");
    mini::HostedControl& c = find_control(t.names[0]);
    const EventInfo* ev = c.info().find_event(t.names[1]);
    if (!ev) throw ScriptError("unknown event '" + c.name() + "." + shown(t.names[1]) + "'");
    std::erase_if(handlers_, [&](const Handler& h) { return h.control == &c && h.event == ev->name; });
}

void Player::cmd_trace(Args& a) {
    std::string_view what = a.next("events, sendkeys or changed");
    bool on = on_off(a, "on or off");
    a.finish();
    if (same_name(what, "events"))
        trace_events_ = on;
    else if (same_name(what, "sendkeys"))
        trace_sendkeys_ = on;
    else if (same_name(what, "changed"))
        trace_changed_ = on;
    else
        throw ScriptError("expected events, sendkeys or changed, got '" + shown(what) + "'");
}

void Player::cmd_echo(Args& a) {
    std::string text = a.text("text");
    a.finish();
    out_ << text << '\n';
}

void Player::cmd_expect(Args& a) {
    std::string_view word = a.next("NAME.Prop or NAME.part.Member");
    Expected expected = parse_expected(a.next("value"));
    a.finish();
    Member m = resolve(word, true, true);
    auto [value, error] = read_checked(m);
    bool held = expected.error ? error == expected.error : !error && same_value(value, expected.value);
    if (held) return;
    expect_failed_ = true;
    out_ << "FAIL " << file_ << ':' << line_ << ": " << m.label << " = "
         << (error ? format_error(*error) : format_value(value)) << ", expected " << format_expected(expected) << '\n';
}

// ---- commands: the property page ----

void Player::cmd_page(Args& a) {
    std::string name(a.name("page name"));
    std::vector<mini::HostedControl*> selected;
    do selected.push_back(&find_control(a.next("control name")));
    while (!a.done());
    const ClassInfo* page = nullptr;
    for (const ClassInfo& c : classes_)
        if (c.is_page) {
            page = &c;
            break;
        }
    if (!page) throw ScriptError("no property page class is known");
    if (!page->create) throw ScriptError("class '" + page->name + "' cannot be created");
    if (form_->find(name)) throw ScriptError("a control named '" + name + "' already exists");
    guarded(name, [&] { form_->open_page(*page, name, selected); });
}

void Player::cmd_apply(Args& a) {
    mini::HostedControl& page = find_control(a.next("page name"));
    a.finish();
    if (!page.info().is_page) throw ScriptError("'" + page.name() + "' is not a property page");
    guarded(page.name(), [&] { form_->apply_page(page); });
}

}  // namespace kel::kelform
