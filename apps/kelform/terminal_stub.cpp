#include <cstdio>

#include "apps/kelform/terminal.h"

namespace kel::kelform {

// Stands in until the terminal form runner is built.
int run_terminal(int /*argc*/, char** /*argv*/) {
    std::fputs("kelform: the terminal form runner is not available in this build (try kelform --help)\n", stderr);
    return 2;
}

}  // namespace kel::kelform
