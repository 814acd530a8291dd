// kelform-qt: a kelform form on the desktop (Qt Widgets), with the same form code and record
// files as the terminal form. kelform-qt --help says how.
#include <QApplication>
#include <cstdio>
#include <iostream>
#include <optional>
#include <string>

#include "apps/kelform-qt/desktop_form.h"
#include "apps/kelform/demo_form.h"
#include "apps/kelform/record.h"
#include "apps/kelform/text_file.h"
#include "keltext/library/catalogue.h"

namespace {

constexpr const char* kUsage = "usage: kelform-qt [FORM.kform] [--record FILE.json]";

void print_help() {
    std::cout << kUsage << "\n\n"
                 "Opens a form in a window: the built-in demo voucher, or a form file. Enter moves to\n"
                 "the next field, F4 drops a list or opens the calendar. With --record, what is typed\n"
                 "is kept in FILE.json (loaded first when it exists): Ctrl+S saves it, F10 saves it and\n"
                 "prints it. Without --record, F10 prints the values and writes nothing.\n\n"
                 "exit status: 0 finished with F10, 1 the window was closed, 2 a bad form file, record\n"
                 "or command line.\n";
}

}  // namespace

int main(int argc, char** argv) {
    using namespace kel;
    using namespace kel::kelform;
    std::optional<std::string> form_file, record;
    for (int i = 1; i < argc; ++i) {
        const std::string arg = argv[i];
        if (arg == "--help" || arg == "-h") {
            print_help();
            return 0;
        }
        if (arg == "--record") {
            if (i + 1 >= argc) {
                std::cerr << "kelform-qt: --record needs a file\n" << kUsage << "\n";
                return 2;
            }
            record = argv[++i];
        } else if (!arg.empty() && arg[0] == '-') {
            std::cerr << "kelform-qt: unknown option '" << arg << "'\n" << kUsage << "\n";
            return 2;
        } else if (form_file) {
            std::cerr << "kelform-qt: one form file at a time\n" << kUsage << "\n";
            return 2;
        } else {
            form_file = arg;
        }
    }

    QApplication app(argc, argv);
    Catalogue catalogue;
    const std::string name = form_file ? *form_file : std::string(kDemoFormName);
    SavedForm saved;
    std::unique_ptr<DesktopForm> form;
    try {
        const Date today = local_today();
        saved = form_file ? read_form_file(*form_file, catalogue.classes())
                          : parse_form(demo_form_text(), name, catalogue.classes());
        form = std::make_unique<DesktopForm>(saved, name, today, record);
    } catch (const FormFileError& e) {
        std::cerr << e.what() << '\n';
        return 2;
    } catch (const RecordError& e) {
        std::cerr << e.what() << '\n';
        return 2;
    } catch (const TextFileError& e) {
        std::cerr << (record ? *record + ": " : std::string()) << e.what() << '\n';
        return 2;
    }
    std::optional<QString> printed;
    QObject::connect(form.get(), &DesktopForm::finished, [&](const QString& json) {
        printed = json;
        QApplication::exit(0);
    });
    form->window().show();
    QApplication::exec();
    if (!printed) return 1;
    std::cout << printed->toStdString() << '\n';
    return 0;
}
