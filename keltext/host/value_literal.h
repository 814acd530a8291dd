#pragma once
// Values written as text that reads back as the same kind and value: the literals of form
// files' `store` lines, of scripts, and of a Qt control's kelSettings. Everything here is
// linear in the length of its input and never recurses on it, so any bytes at all can be
// thrown at it.
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

#include "keltext/host/variant.h"

namespace kel {

// A malformed literal: the message quotes it ("malformed value 'x'").
class ValueLiteralError : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

// The words of one line, as written (quotes and escapes kept). A word runs up to a blank;
// a quoted part of a word may hold blanks and '#'. A '#' outside a string ends the line.
// An unterminated string is a ValueLiteralError.
std::vector<std::string_view> split_words(std::string_view line);

// True for a word that is a quoted string and nothing else.
bool is_string_literal(std::string_view word);
// The bytes of a quoted string word (escapes \" \\ \t \n \r \xHH).
std::string decode_string(std::string_view word);

// A value literal: empty, true, false, integers (typed as a BASIC literal: 16-bit when it fits,
// else 32-bit, else double), 0x hex (a 32-bit bit pattern), doubles, strings, u8: i16: i32:
// f32: f64: date:Y-M-D and font:"Name":size[:bold][:italic].
Variant parse_value(std::string_view word);

// The literal of a value: parse_value of it gives the same kind and value back. `key` only
// chooses the hex form for colours.
std::string value_literal(const Variant& v, std::string_view key = {});
// A quoted string with the escapes above; bytes outside printable ASCII as \xHH.
std::string string_literal(std::string_view s);
// The shortest text that reads back as the same float.
std::string float_text(float v);

// A word made safe for a message: bytes outside printable ASCII as \xHH, cut when very long.
std::string shown_word(std::string_view word);

}  // namespace kel
