// Form files on any bytes: parse_form gives a form or a clean FormFileError naming the line;
// a form that parses is written back to a text that parses to the same text again, and it
// opens on a form (or fails with a FormFileError), and what it saves writes back cleanly.
#include <cstdint>
#include <string>
#include <string_view>

#include "apps/kelform/form_file.h"
#include "fuzz/fuzz_check.h"
#include "keltext/host/date.h"
#include "keltext/library/catalogue.h"
#include "keltext/minihost/form.h"

namespace {

using namespace kel::kelform;

const std::string kFile = "fuzz.kform";

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    static const kel::Catalogue catalogue;
    const auto classes = std::span<const kel::ClassInfo>(catalogue.classes());
    const std::string_view text(reinterpret_cast<const char*>(data), size);

    SavedForm parsed;
    try {
        parsed = parse_form(text, kFile, classes);
    } catch (const FormFileError& e) {
        KEL_FUZZ_CHECK(e.file() == kFile && e.line() >= 0);
        return 0;
    }

    // Written and read again: the same form, so the same text.
    const std::string written = write_form(parsed);
    SavedForm again;
    try {
        again = parse_form(written, kFile, classes);
    } catch (const FormFileError& e) {
        std::fprintf(stderr, "written form does not parse: %s\n%s\n", e.what(), written.c_str());
        KEL_FUZZ_CHECK(!"a written form parses");
    }
    KEL_FUZZ_CHECK(write_form(again) == written);

    // Opened on a form on a fixed day, then captured and written again.
    kel::mini::Form form;
    try {
        open_form(form, parsed, classes, kFile, kel::Date{37621});  // 31/12/2002
    } catch (const FormFileError& e) {
        KEL_FUZZ_CHECK(e.file() == kFile);
        return 0;
    }
    const SavedForm captured = capture_form(form, parsed);
    const std::string saved = write_form(captured);
    try {
        KEL_FUZZ_CHECK(write_form(parse_form(saved, kFile, classes)) == saved);
    } catch (const FormFileError& e) {
        std::fprintf(stderr, "saved form does not parse: %s\n%s\n", e.what(), saved.c_str());
        KEL_FUZZ_CHECK(!"a saved form parses");
    }
    return 0;
}
