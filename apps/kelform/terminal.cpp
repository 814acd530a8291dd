#include "apps/kelform/terminal.h"

#include <unistd.h>

#include <cstdio>
#include <iostream>
#include <string>
#include <string_view>

#include "apps/kelform/demo_form.h"
#include "apps/kelform/form_file.h"
#include "apps/kelform/play.h"
#include "apps/kelform/terminal_session.h"
#include "apps/kelform/tui.h"
#include "keltext/library/catalogue.h"
#include "keltext/minihost/form.h"

namespace kel::kelform {

int run_terminal(int argc, char** argv) {
    std::optional<std::string> path;
    if (argc >= 2) {
        const std::string_view command = argv[1];
        if (command != "run") {
            std::cerr << "kelform: unknown command '" << command << "' (try kelform --help)\n";
            return 2;
        }
        if (argc != 3) {
            std::cerr << "kelform run: give one form file (usage: kelform run FORM.kform)\n";
            return 2;
        }
        path = argv[2];
    }

    // The form is read and opened before the screen is touched, so that a bad form file is
    // reported on a plain terminal.
    Catalogue catalogue;
    const std::string name = path ? *path : std::string(kDemoFormName);
    const Date today = local_today();
    const std::optional<std::size_t> limit = max_file_bytes_setting(std::cerr);
    if (!limit) return 2;
    SavedForm saved;
    mini::Form form;
    try {
        saved = path ? read_form_file(*path, catalogue.classes(), *limit)
                    : parse_form(demo_form_text(), name, catalogue.classes());
        open_form(form, saved, catalogue.classes(), name, today);
    } catch (const FormFileError& e) {
        std::cerr << e.what() << '\n';
        return 2;
    }

    if (!isatty(STDIN_FILENO)) {
        std::cerr << "kelform: no terminal to show the form on; to run a form without one, use "
                     "`kelform play SCRIPT.kfs` (see kelform --help)\n";
        return 2;
    }

    TerminalSession session(form, saved, today);
    std::string error;
    const auto outcome = run_tui(session, error);
    if (!outcome) {
        std::cerr << "kelform: " << error << "; to run a form without a terminal, use `kelform play SCRIPT.kfs`\n";
        return 2;
    }
    if (*outcome == TerminalSession::Outcome::quit) return 1;

    std::cout << session.values_json() << '\n';
    std::cout.flush();
    if (path) {
        try {
            write_form_file(*path, capture_form(form, saved));
        } catch (const FormFileError& e) {
            std::cerr << e.what() << '\n';
            return 2;
        }
    }
    return 0;
}

}  // namespace kel::kelform
