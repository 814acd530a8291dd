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
        if (command == "play")
            return kel::kelform::play_command(std::span(args).subspan(1), std::cin, std::cout, std::cerr);
        if (command == "--help" || command == "-h" || command == "help") {
            kel::kelform::print_usage(std::cout);
            return 0;
        }
        if (command == "--version") {
            kel::kelform::print_version(std::cout);
            return 0;
        }
        // `kelform`, `kelform run FILE` and anything else: the terminal side answers.
        return kel::kelform::run_terminal(argc, argv);
    } catch (const std::exception& e) {
        std::cout.flush();
        std::cerr << "kelform: internal error: " << e.what() << '\n';
        return 2;
    }
}
