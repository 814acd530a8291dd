#pragma once
// The interactive form in the terminal: `kelform` (the built-in demo form) and
// `kelform run FILE` (a saved form file), each with an optional record of what is typed.
#include <ostream>
#include <span>
#include <string_view>

namespace kel::kelform {

// The words after `kelform`: nothing or options (`--record FILE`), or "run" with the form file
// and options. Returns the exit status: 0 when the form ended with F10 (values printed), 1 when
// the person left with Escape or Ctrl+Q, 2 for a bad form file, record or command line, no
// terminal, or a signal that ended the form.
int run_terminal(std::span<const std::string_view> args);

// What `kelform run --help` prints.
void print_run_usage(std::ostream& out);

}  // namespace kel::kelform
