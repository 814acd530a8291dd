// Form scripts on any bytes: the player runs them to the end or stops at a clean script
// error; no crash, no hang, no exception that escapes, and the exit status is one of 0, 1, 2.
// The line-level pieces (words, value literals, targets) are exercised by themselves too,
// with their printed forms read back.
#include <cstdint>
#include <sstream>
#include <string>
#include <string_view>

#include "apps/kelform/script_player.h"
#include "apps/kelform/script_syntax.h"
#include "fuzz/fuzz_check.h"
#include "keltext/library/catalogue.h"

namespace {

using namespace kel::kelform;

// A value literal that parses prints as a value that parses back to the same kind; a quoted
// string read back gives the same bytes.
void line_pieces(std::string_view line) {
    std::vector<std::string_view> words;
    try {
        words = split_words(line);
    } catch (const ScriptError&) {
        return;
    }
    for (std::string_view w : words) {
        (void)is_name(w);
        (void)shown(w);
        try {
            (void)parse_target(w);
        } catch (const ScriptError&) {
        }
        try {
            (void)parse_expected(w);
        } catch (const ScriptError&) {
        }
        try {
            const kel::Variant v = parse_value(w);
            (void)format_value(v);
            (void)format_plain(v);
            if (v.is_string()) {
                const std::string q = quote(v.str());
                KEL_FUZZ_CHECK(decode_string(q) == v.str());
            }
        } catch (const ScriptError&) {
        } catch (const kel::RuntimeError& e) {
            KEL_FUZZ_CHECK(kel::fuzz::known_error(e));
        }
    }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    static const kel::Catalogue catalogue;
    const std::string_view text(reinterpret_cast<const char*>(data), size);

    // The first line alone, piece by piece.
    line_pieces(text.substr(0, text.find('\n')));

    std::ostringstream out, err;
    Player player(catalogue.classes(), out);
    const int status = player.run_script(text, "fuzz.kfs", err);
    KEL_FUZZ_CHECK(status == 0 || status == 1 || status == 2);
    // A script error is reported as FILE:LINE: message.
    if (status == 2) KEL_FUZZ_CHECK(err.str().rfind("fuzz.kfs:", 0) == 0);
    return 0;
}
