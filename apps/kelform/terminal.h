#pragma once
// The interactive form in the terminal: `kelform` (the built-in demo form) and
// `kelform run FILE` (a saved form file).

namespace kel::kelform {

// argv as main() got it; argv[1] may be "run" followed by the form file. Returns the exit
// status: 0 when the form ended with F10 (values printed), 1 when the person left with
// Escape, 2 for a bad form file, bad arguments or no terminal.
int run_terminal(int argc, char** argv);

}  // namespace kel::kelform
