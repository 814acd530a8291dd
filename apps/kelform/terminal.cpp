#include "apps/kelform/terminal.h"

#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <iostream>
#include <string>
#include <string_view>

#include "apps/kelform/demo_form.h"
#include "apps/kelform/form_file.h"
#include "apps/kelform/play.h"
#include "apps/kelform/record.h"
#include "apps/kelform/safe_file.h"
#include "apps/kelform/terminal_session.h"
#include "apps/kelform/text_file.h"
#include "apps/kelform/tui.h"
#include "keltext/library/catalogue.h"
#include "keltext/minihost/form.h"

namespace kel::kelform {
namespace {

constexpr std::string_view kUsage = "usage: kelform [--record FILE.json] | kelform run FORM.kform [--record FILE.json]";

struct Options {
    std::optional<std::string> form_file;
    std::optional<std::string> record;
    bool help = false;
};

// Parses what follows `kelform` (and `run`); a message on a bad command line.
std::optional<Options> parse_options(std::span<const std::string_view> args, std::string& error) {
    Options o;
    std::size_t i = 0;
    if (i < args.size() && args[i] == "run") {
        ++i;
        if (i < args.size() && (args[i] == "--help" || args[i] == "-h")) {
            o.help = true;
            return o;
        }
        if (i >= args.size() || args[i].starts_with("-")) {
            error = "kelform run: give one form file";
            return std::nullopt;
        }
        o.form_file = std::string(args[i++]);
    }
    for (; i < args.size(); ++i) {
        const std::string_view a = args[i];
        if (a == "--help" || a == "-h") {
            o.help = true;
        } else if (a == "--record") {
            if (++i >= args.size()) {
                error = "kelform: --record needs a file name";
                return std::nullopt;
            }
            o.record = std::string(args[i]);
        } else if (a.starts_with("--record=")) {
            o.record = std::string(a.substr(9));
        } else if (a.starts_with("-")) {
            error = "kelform: unknown option '" + std::string(a) + "'";
            return std::nullopt;
        } else {
            error = o.form_file ? "kelform run: give one form file" : "kelform: unknown command '" + std::string(a) + "'";
            return std::nullopt;
        }
    }
    if (o.record && o.record->empty()) {
        error = "kelform: --record needs a file name";
        return std::nullopt;
    }
    return o;
}

// Why the record could not be saved where it is, found before anything is typed; "" when it can.
std::string record_problem(const std::string& path) {
    namespace fs = std::filesystem;
    std::error_code ec;
    fs::path target = fs::weakly_canonical(fs::path(path), ec);
    if (ec) target = path;
    const fs::file_status st = fs::status(target, ec);
    if (fs::exists(st) && !fs::is_regular_file(st)) return "it is not a regular file";
    if (fs::exists(st) && access(target.c_str(), W_OK) != 0) return std::strerror(errno);
    fs::path dir = target.parent_path();
    if (dir.empty()) dir = ".";
    if (access(dir.c_str(), W_OK | X_OK) != 0) return std::strerror(errno);
    return {};
}

}  // namespace

void print_run_usage(std::ostream& out) {
    out << kUsage << "\n"
           "\n"
           "Opens a form in the terminal: the built-in demo voucher, or a form file. With --record,\n"
           "what is typed is kept in FILE.json (loaded first when it exists): Ctrl+S saves it and\n"
           "the form stays open, F10 saves it, restores the screen and prints it. Without --record,\n"
           "F10 prints the values and writes nothing. The form file itself is never rewritten.\n"
           "\n"
           "exit status: 0 finished with F10, 1 left with Escape or Ctrl+Q, 2 a bad form file,\n"
           "record or command line, no terminal, or a signal that ended the form.\n";
}

int run_terminal(std::span<const std::string_view> args) {
    std::string error;
    const std::optional<Options> options = parse_options(args, error);
    if (!options) {
        std::cerr << error << "\n" << kUsage << "\n";
        return 2;
    }
    if (options->help) {
        print_run_usage(std::cout);
        return 0;
    }
    const std::optional<std::string>& path = options->form_file;

    // The form and the record are read and opened before the screen is touched, so that a bad
    // file is reported on a plain terminal, and a bad record is never overwritten.
    Catalogue catalogue;
    const std::string name = path ? *path : std::string(kDemoFormName);
    const std::optional<std::size_t> limit = max_file_bytes_setting(std::cerr);
    if (!limit) return 2;
    Date today;
    SavedForm saved;
    mini::Form form;
    try {
        today = local_today();
        saved = path ? read_form_file(*path, catalogue.classes(), *limit)
                    : parse_form(demo_form_text(), name, catalogue.classes());
        open_form(form, saved, catalogue.classes(), name, today);
    } catch (const FormFileError& e) {
        std::cerr << e.what() << '\n';
        return 2;
    }
    std::string warning;
    if (options->record) {
        std::error_code ec;
        if (std::filesystem::exists(*options->record, ec)) {
            try {
                load_record(form, read_limited(*options->record, *limit), *options->record);
            } catch (const TextFileError& e) {
                std::cerr << *options->record << ": " << e.what() << '\n';
                return 2;
            } catch (const RecordError& e) {
                std::cerr << e.what() << '\n';
                return 2;
            }
        }
        if (const std::string why = record_problem(*options->record); !why.empty())
            warning = "Warning: " + *options->record + " cannot be saved: " + why;
    }

    if (!isatty(STDIN_FILENO)) {
        std::cerr << "kelform: no terminal to show the form on; to run a form without one, use "
                     "`kelform play SCRIPT.kfs` (see kelform --help)\n";
        return 2;
    }

    TerminalSession session(form, saved, today);
    if (options->record)
        session.set_record_file(*options->record, [](const std::string& file, const std::string& json) {
            write_file_safely(file, json + "\n");
        });
    if (!warning.empty()) session.warn(warning);
    const auto outcome = run_tui(session, error);
    if (!outcome) {
        std::cerr << "kelform: " << error << "; to run a form without a terminal, use `kelform play SCRIPT.kfs`\n";
        return 2;
    }
    if (*outcome == TerminalSession::Outcome::quit) return 1;
    if (*outcome == TerminalSession::Outcome::signalled) return 2;

    std::cout << session.values_json() << '\n';
    std::cout.flush();
    return 0;
}

}  // namespace kel::kelform
