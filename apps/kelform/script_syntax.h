#pragma once
// The lexical side of form scripts: splitting a line into words, reading value literals and
// targets (NAME.Prop(index), NAME.part.Member), and printing values the way scripts print them.
// Everything here is linear in the length of the line and never recurses on its input, so any
// bytes at all can be thrown at it.
#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

#include "keltext/host/variant.h"

namespace kel::kelform {

// A mistake in the script itself (as opposed to a run-time error of a control): reported as
// FILE:LINE: message, and the script stops.
class ScriptError : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

// The words of one line, as written (quotes and escapes kept). A word runs up to a blank;
// a quoted part of a word may hold blanks and '#'. A '#' outside a string ends the line.
// An unterminated string is a ScriptError.
std::vector<std::string_view> split_words(std::string_view line);

// True for a word that is a quoted string and nothing else.
bool is_string_literal(std::string_view word);
// The bytes of a quoted string word (escapes \" \\ \t \n \r \xHH). ScriptError when the word
// is not exactly one well-formed quoted string.
std::string decode_string(std::string_view word);

// A value literal: empty, true, false, integers (typed as a BASIC literal: 16-bit when it fits,
// else 32-bit, else double), 0x hex (a 32-bit bit pattern), doubles, strings, u8: i16: i32:
// f32: f64: date:Y-M-D and font:"Name":size[:bold][:italic]. ScriptError when malformed.
Variant parse_value(std::string_view word);

// What `expect` compares with: a value, or a run-time error number (written error:N).
struct Expected {
    Variant value;
    std::optional<int> error;
};
Expected parse_expected(std::string_view word);

// Printed forms: "i16 5", "str \"a\\x09b\"", "font \"Fixedsys\" 9 bold", "empty", ...
std::string format_value(const Variant& v);
std::string format_expected(const Expected& e);
// A read that raised run-time error N prints as "error N".
std::string format_error(int number);
// `"text"` with the printing escapes: " and \ escaped, bytes below 0x20 and from 0x7F as \xHH.
std::string quote(std::string_view bytes);
// An event argument: a number as its plain number text, anything else as format_value does.
std::string format_plain(const Variant& v);
// An index as the script would write it back: numbers plain, strings quoted.
std::string format_index(const Variant& v);

// True for a non-empty run of letters, digits and '_'.
bool is_name(std::string_view word);

// NAME.Prop, NAME.Prop(index), NAME.part, NAME.part.Member(index): the dotted names and the
// raw index text (without the parentheses). ScriptError when malformed.
struct Target {
    std::vector<std::string_view> names;
    std::optional<std::string_view> index;
};
Target parse_target(std::string_view word);

// A word made safe for a message: bytes outside printable ASCII as \xHH, cut when very long.
std::string shown(std::string_view word);

}  // namespace kel::kelform
