#include <exception>
#include <iostream>
#include <string_view>
#include <vector>

#include "apps/kelform/play.h"
#include "apps/kelform/terminal.h"

int main(int argc, char** argv) {
    std::ios::sync_with_stdio(false);
    std::vector<std::string_view> args(argv + 1, argv + argc);
    std::string_view command = args.empty() ? std::string_view() : args[0];
    try {
        if (command == "play") {
            const auto scripts = std::span(args).subspan(1);
            for (std::size_t i = 0; i < scripts.size(); ++i) {
                const std::string_view a = scripts[i];
                if (a == "--help" || a == "-h") {
                    kel::kelform::print_usage(std::cout);
                    return 0;
                }
                if (a == "--host" && i == 0) {
                    ++i;  // the host's name: play_command checks it
                    continue;
                }
                if (a.starts_with("-") && a != "-") {
                    std::cerr << "kelform play: unknown option '" << a << "'\n"
                              << "usage: kelform play [--host minimal|qt] SCRIPT.kfs ... ('-' reads standard input)\n";
                    return 2;
                }
            }
            return kel::kelform::play_command(scripts, std::cin, std::cout, std::cerr);
        }
        if (command == "--help" || command == "-h" || command == "help") {
            kel::kelform::print_usage(std::cout);
            return 0;
        }
        if (command == "--version") {
            kel::kelform::print_version(std::cout);
            return 0;
        }
        // `kelform`, `kelform run FILE`, their options and anything else: the terminal side.
        return kel::kelform::run_terminal(args);
    } catch (const std::exception& e) {
        std::cout.flush();
        std::cerr << "kelform: internal error: " << e.what() << '\n';
        return 2;
    }
}
