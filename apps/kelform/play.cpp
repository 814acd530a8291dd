#include "apps/kelform/play.h"

#include <cstdlib>
#include <memory>
#include <optional>
#include <string>

#include "apps/kelform/form_file.h"
#include "apps/kelform/qt_host.h"
#include "apps/kelform/text_file.h"
#include "apps/kelform/version.h"
#include "keltext/library/catalogue.h"

namespace kel::kelform {
namespace {

}  // namespace

int play(std::span<const std::string_view> scripts, std::span<const ClassInfo> classes, std::istream& in,
         std::ostream& out, std::ostream& err, const PlayerSetup& setup, std::size_t max_file_bytes,
         const Player::FormMaker& make_form) {
    int status = 0;
    for (std::string_view script : scripts) {
        bool from_stdin = script == "-";
        std::string name = from_stdin ? "<stdin>" : std::string(script);
        std::string text;
        try {
            text = decode_text(from_stdin ? read_limited(in, max_file_bytes) : read_limited(name, max_file_bytes));
        } catch (const TextFileError& e) {
            out.flush();
            switch (e.fault()) {
                case TextFileError::Fault::unreadable: err << name << ": cannot read the script\n"; break;
                case TextFileError::Fault::too_large: err << name << ": " << e.what() << '\n'; break;
                case TextFileError::Fault::bad_text: err << name << ':' << e.line() << ": " << e.what() << '\n'; break;
            }
            status = 2;
            continue;
        }
        Player player(classes, out, make_form);
        if (setup) setup(player);
        int s = player.run_script(text, name, err);
        if (s > status) status = s;
    }
    out.flush();
    return status;
}

int play_command(std::span<const std::string_view> args, std::istream& in, std::ostream& out, std::ostream& err) {
    Player::FormMaker make_form;
    if (!args.empty() && args.front() == "--host") {
        if (args.size() < 2) {
            err << "kelform play: --host needs a host name (minimal or qt)\n";
            return 2;
        }
        const std::string_view host = args[1];
        args = args.subspan(2);
        if (host == "qt") {
            make_form = qt_form_maker(err);
            if (!make_form) return 2;
        } else if (host != "minimal") {
            err << "kelform play: unknown host '" << host << "' (minimal or qt)\n";
            return 2;
        }
    }
    if (args.empty()) {
        err << "kelform play: no script given (usage: kelform play [--host minimal|qt] SCRIPT.kfs ...)\n";
        return 2;
    }
    const std::optional<std::size_t> limit = max_file_bytes_setting(err);
    if (!limit) return 2;
    Catalogue catalogue;
    return play(
        args, catalogue.classes(), in, out, err,
        [&catalogue, limit](Player& p) { add_form_commands(p, catalogue.classes(), *limit); }, *limit, make_form);
}

std::optional<std::size_t> max_file_bytes_setting(std::ostream& err) {
    const char* setting = std::getenv(kMaxFileBytesVariable);
    if (!setting) return kDefaultMaxFileBytes;
    if (const auto limit = parse_max_file_bytes(setting)) return limit;
    err << "kelform: " << kMaxFileBytesVariable << " must be a whole number of bytes above 0, not '" << setting
        << "'\n";
    return std::nullopt;
}

void print_usage(std::ostream& out) {
    out << "usage: kelform [--record FILE.json]   open the demo form in the terminal\n"
           "       kelform run FORM.kform [--record FILE.json]\n"
           "                                      open a form file in the terminal\n"
           "       kelform play [--host minimal|qt] SCRIPT.kfs ...\n"
           "                                      run form scripts headless and print what happens\n"
           "                                      ('-' reads the script from standard input); --host qt\n"
           "                                      runs them through real Qt widgets (offscreen when\n"
           "                                      there is no display)\n"
           "       kelform --help                 show this help (also: run --help, play --help)\n"
           "       kelform --version              show the version\n"
           "\n"
           "--record keeps what is typed in FILE.json, loaded first when it exists: Ctrl+S saves\n"
           "it, F10 saves it and prints it. The form file itself is never rewritten.\n"
           "\n"
           "exit status:\n"
           "  kelform, run  0 finished with F10, 1 left with Escape or Ctrl+Q, 2 a bad form file,\n"
           "                record or command line, no terminal, or a signal that ended the form\n"
           "  play          0 every script ran and every expect held, 1 an expect failed, 2 a\n"
           "                script could not be read or has an error (FILE:LINE: message)\n"
           "  --help, --version  0\n"
           "\n"
           "scripts and form files: a file that starts with the UTF-8 byte-order mark is read\n"
           "as UTF-8; a file above 256 MiB is refused (KELFORM_MAX_FILE_BYTES=N sets the limit).\n"
           "\n"
           "script commands (one a line, # starts a comment):\n"
           "  mode design|run                       new CLASS NAME [width height]\n"
           "  load CLASS NAME [width height] [Key=value ...]\n"
           "  save NAME                             resize NAME width height\n"
           "  set NAME.Prop[(index)] value          get NAME.Prop[(index)]\n"
           "  call NAME.Method [values ...]         peek NAME.part.Member[(index)]\n"
           "  poke NAME.part.Member[(index)] value  focus NAME|none\n"
           "  type \"text\"    key KEY    keydown KEY    keyup KEY    keypress CODE\n"
           "  insert on|off    paste \"text\"    select NAME start length    clipboard [\"text\"]\n"
           "  click NAME.part    dblclick NAME.part    notify NAME.part.Notification\n"
           "  mousedown NAME.part button shift x y    mouseup NAME.part button shift x y\n"
           "  on NAME.Event ACTION    off NAME.Event\n"
           "      ACTION: set ARG value | set NAME.Prop value | get NAME.Prop | echo \"text\"\n"
           "  trace events|sendkeys|changed on|off    echo \"text\"    expect EXPR value|error:N\n"
           "  page PAGE NAME [NAME ...]    apply PAGE\n"
           "  loadform FILE    saveform FILE\n"
           "\n"
           "values: empty true false 12 -7 0xC00000 12.5 1e3 \"text\" u8:5 i16:5 i32:5 f32:2.5\n"
           "        f64:2.5 date:2003-01-31 font:\"Arial\":12[:bold][:italic]\n"
           "strings: \\\" \\\\ \\t \\n \\r \\xHH (one byte of Windows-1252)\n";
}

void print_version(std::ostream& out) { out << "kelform " << version() << '\n'; }

}  // namespace kel::kelform
