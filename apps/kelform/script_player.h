#pragma once
// The form script player: runs the commands of a form script against a form (the minimal
// host's, or another host's through its form driver) and prints what happens (events, queued
// keystrokes, property reads, run-time errors, failed expectations). The terminal UI and form files reuse it and add their own commands.
#include <functional>
#include <map>
#include <memory>
#include <optional>
#include <ostream>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "apps/kelform/script_syntax.h"
#include "keltext/host/members.h"
#include "keltext/minihost/form.h"

namespace kel::kelform {

class Player;

// The words of one command after the command word, read one at a time.
class Args {
public:
    explicit Args(std::vector<std::string_view> words) : words_(std::move(words)) {}
    bool done() const { return pos_ >= words_.size(); }
    std::optional<std::string_view> peek() const;
    // The next word; ScriptError "missing argument: WHAT" when there is none.
    std::string_view next(std::string_view what);
    Variant value(std::string_view what) { return parse_value(next(what)); }
    std::string text(std::string_view what) { return decode_string(next(what)); }
    std::string_view name(std::string_view what);  // letters, digits and '_'
    // ScriptError "extra argument 'X'" when words are left.
    void finish() const;
    // The words not read yet.
    std::span<const std::string_view> rest() const;

private:
    std::vector<std::string_view> words_;
    std::size_t pos_ = 0;
};

using CommandFn = std::function<void(Player&, Args&)>;

class Player : private model::FormObserver {
public:
    // Makes the form a player drives, telling it the observer to report to.
    using FormMaker = std::function<std::unique_ptr<model::FormDriver>(model::FormObserver*)>;

    // `classes` are what `new`, `load` and `page` can create; they must outlive the player.
    // Without `make_form` the form is the minimal host's.
    Player(std::span<const ClassInfo> classes, std::ostream& out, const FormMaker& make_form = {});
    ~Player() override;
    Player(const Player&) = delete;
    Player& operator=(const Player&) = delete;

    // Adds a command (or replaces one of the same name): `loadform FILE` and the like.
    void add_command(std::string name, CommandFn run);

    // Runs a whole script. A script error is written to `err` as FILE:LINE: message and ends
    // the script. Returns 0 (all well), 1 (an expect failed) or 2 (script error).
    int run_script(std::string_view text, std::string_view file, std::ostream& err);
    // Runs one line (ScriptError for a mistake in it). Synthetic keystrokes queued meanwhile
    // are delivered before it returns.
    void run_line(std::string_view line);

    model::FormDriver& form() { return *form_; }
    std::ostream& out() { return out_; }
    bool expect_failed() const { return expect_failed_; }

    // Lookups that fail with a ScriptError naming what is missing.
    const ClassInfo& find_class(std::string_view name) const;
    mini::HostedControl& find_control(std::string_view name);
    // Runs `action`, printing "LABEL -> error N" for a run-time error that reaches it.
    void guarded(std::string_view label, const std::function<void()>& action);

private:
    struct Handler;
    struct Member;

    // FormObserver.
    void event_raised(mini::HostedControl& control, int number, std::string_view event,
                      std::span<EventArg> args) override;
    void keys_sent(mini::HostedControl& control, std::string_view keys) override;
    void property_changed(mini::HostedControl& control, std::string_view property) override;
    void handler_error(std::string_view where, int number) override;
    void focus_refused(mini::HostedControl& control) override;

    void add_builtin_commands();
    void run_command(std::string_view word, Args& args);
    void run_handler(const Handler& h, std::span<EventArg> args);

    // Commands.
    void cmd_mode(Args& a);
    void cmd_new(Args& a, bool load);
    void cmd_save(Args& a);
    void cmd_set(Args& a);
    void cmd_get(Args& a);
    void cmd_call(Args& a);
    void cmd_peek(Args& a);
    void cmd_poke(Args& a);
    void cmd_resize(Args& a);
    void cmd_focus(Args& a);
    void cmd_type(Args& a);
    void cmd_key(Args& a);
    void cmd_key_half(Args& a, bool down);
    void cmd_keypress(Args& a);
    void cmd_insert(Args& a);
    void cmd_paste(Args& a);
    void cmd_clipboard(Args& a);
    void cmd_select(Args& a);
    void cmd_click(Args& a, bool dbl);
    void cmd_notify(Args& a);
    void cmd_mouse(Args& a, bool down);
    void cmd_on(Args& a);
    void cmd_off(Args& a);
    void cmd_trace(Args& a);
    void cmd_echo(Args& a);
    void cmd_expect(Args& a);
    void cmd_page(Args& a);
    void cmd_apply(Args& a);

    // NAME.Prop[(index)] or NAME.part.Member[(index)], resolved to the library's spelling.
    Member resolve(std::string_view word, bool allow_part, bool allow_property);
    struct PartRef {
        mini::HostedControl* control;
        model::Part* part;
        std::string label;  // NAME.part
    };
    PartRef resolve_part(std::string_view control_name, std::string_view part_name);
    // Reads a member; a run-time error comes back as its number.
    std::pair<Variant, std::optional<int>> read(const Member& m);
    // The same for a command of the script: a host with views first checks that they show it.
    std::pair<Variant, std::optional<int>> read_checked(const Member& m);
    void write(const Member& m, const Variant& value);
    mini::HostedControl& focused_for_input();
    void keystroke(const model::Keystroke& k);

    std::span<const ClassInfo> classes_;
    std::ostream& out_;
    std::map<std::string, CommandFn, std::less<>> commands_;  // keyed by lower-case name
    std::vector<Handler> handlers_;
    bool trace_events_ = true;
    bool trace_sendkeys_ = true;
    bool trace_changed_ = false;
    bool expect_failed_ = false;
    bool refusal_reported_ = false;
    std::string file_;
    std::size_t line_ = 0;
    std::unique_ptr<model::FormDriver> form_;  // last: destroyed first, while the rest is still whole
};

}  // namespace kel::kelform
