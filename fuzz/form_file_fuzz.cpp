// Form files on any bytes: parse_form gives a form or a clean FormFileError naming the line;
// a form that parses is written back to a text that parses to the same text again, and it
// opens on a form (or fails with a FormFileError), what it saves writes back cleanly, and
// opening that save and saving again gives the same text.
#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <string>
#include <string_view>

#include "apps/kelform/form_file.h"
#include "fuzz/fuzz_check.h"
#include "keltext/host/conversions.h"
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
    const std::string saved = write_form(capture_form(form, parsed));
    SavedForm reread;
    try {
        reread = parse_form(saved, kFile, classes);
    } catch (const FormFileError& e) {
        std::fprintf(stderr, "saved form does not parse: %s\n%s\n", e.what(), saved.c_str());
        KEL_FUZZ_CHECK(!"a saved form parses");
    }
    KEL_FUZZ_CHECK(write_form(reread) == saved);

    // Opening a saved form and saving it unedited gives the same file: the controls read back
    // exactly what they stored.
    kel::mini::Form second;
    try {
        open_form(second, reread, classes, kFile, kel::Date{37621});
    } catch (const FormFileError& e) {
        std::fprintf(stderr, "saved form does not open: %s\n%s\n", e.what(), saved.c_str());
        KEL_FUZZ_CHECK(!"a saved form opens");
    }
    const std::string saved_again = write_form(capture_form(second, reread));
    if (saved_again != saved) std::fprintf(stderr, "first save:\n%s\nsecond save:\n%s\n", saved.c_str(), saved_again.c_str());
    KEL_FUZZ_CHECK(saved_again == saved);
    return 0;
}
