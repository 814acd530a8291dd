#pragma once
// The curses side of the terminal form: opens the terminal, turns what it reports (keys,
// characters, mouse clicks, resizes) into Input for the session and copies the session's
// canvas to the screen, until the person finishes or quits.
#include <optional>
#include <string>

#include "apps/kelform/terminal_session.h"

namespace kel::kelform {

// True when this build has the terminal form (curses was found).
bool terminal_ui_available();

// Runs the session on the terminal. Nothing, with `error` set, when no terminal can be
// opened; the screen is restored before it returns in every case.
std::optional<TerminalSession::Outcome> run_tui(TerminalSession& session, std::string& error);

}  // namespace kel::kelform
