#pragma once
// `kelform play SCRIPT.kfs ...`: runs form scripts headless, each on a form of its own.
#include <cstddef>
#include <functional>
#include <optional>
#include <istream>
#include <ostream>
#include <span>
#include <string_view>

#include "apps/kelform/script_player.h"
#include "apps/kelform/text_file.h"
#include "keltext/host/members.h"

namespace kel::kelform {

// Adds commands beyond the built-in ones to each script's player (form files and the like).
using PlayerSetup = std::function<void(Player&)>;

// Runs the scripts in order ("-" reads `in`), printing to `out` and script errors to `err`.
// Returns 0 when every script ran and every expect held, 1 when an expect failed, 2 when a
// script could not be read or had an error (the remaining scripts still run). A script longer
// than `max_file_bytes` is not run.
int play(std::span<const std::string_view> scripts, std::span<const ClassInfo> classes, std::istream& in,
         std::ostream& out, std::ostream& err, const PlayerSetup& setup = {},
         std::size_t max_file_bytes = kDefaultMaxFileBytes, const Player::FormMaker& make_form = {});

// `kelform play [--host minimal|qt] ...` with the library's own classes.
int play_command(std::span<const std::string_view> args, std::istream& in, std::ostream& out, std::ostream& err);

// The most bytes kelform reads from a file: KELFORM_MAX_FILE_BYTES when set, else the default.
// Nothing (and a message on `err`) when the variable is malformed.
std::optional<std::size_t> max_file_bytes_setting(std::ostream& err);

// `kelform --help` and `kelform --version`.
void print_usage(std::ostream& out);
void print_version(std::ostream& out);

}  // namespace kel::kelform
