#include "apps/kelform/text_file.h"

#include <algorithm>
#include <charconv>
#include <cstdio>
#include <memory>

#include "keltext/host/charset.h"

namespace kel::kelform {
namespace {

constexpr std::string_view kUtf8Mark = "\xEF\xBB\xBF";
constexpr std::size_t kChunk = 1 << 16;

struct FileCloser {
    void operator()(std::FILE* f) const { std::fclose(f); }
};

[[noreturn]] void too_large(std::size_t limit) {
    throw TextFileError(TextFileError::Fault::too_large, 0, "larger than " + std::to_string(limit) + " bytes, the most kelform reads (" +
                               kMaxFileBytesVariable + " sets it)");
}

// Appends what `read` gives, chunk by chunk: files such as /dev/zero and standard input report
// no size, so the limit is checked as the text grows, one byte past it being enough to know.
template <class Read>
std::string read_chunks(std::size_t limit, Read&& read) {
    std::string text;
    char buf[kChunk];
    for (;;) {
        const std::size_t want = std::min(sizeof buf, limit - text.size() + 1);
        const std::size_t n = read(buf, want);
        if (n == 0) return text;
        text.append(buf, n);
        if (text.size() > limit) too_large(limit);
    }
}

std::string hex_code_point(char32_t cp) {
    char buf[16];
    std::snprintf(buf, sizeof buf, "U+%04X", static_cast<unsigned>(cp));
    return buf;
}

}  // namespace

std::optional<std::size_t> parse_max_file_bytes(const char* setting) {
    if (!setting) return std::nullopt;
    const std::string_view s(setting);
    std::size_t v = 0;
    const auto [end, ec] = std::from_chars(s.data(), s.data() + s.size(), v);
    if (ec != std::errc() || end != s.data() + s.size() || v == 0) return std::nullopt;
    return v;
}

std::string read_limited(const std::string& path, std::size_t limit) {
    std::unique_ptr<std::FILE, FileCloser> f(std::fopen(path.c_str(), "rb"));
    if (!f) throw TextFileError(TextFileError::Fault::unreadable, 0, "cannot open the file");
    std::string text = read_chunks(limit, [&](char* buf, std::size_t want) { return std::fread(buf, 1, want, f.get()); });
    // A directory opens but does not read.
    if (std::ferror(f.get())) throw TextFileError(TextFileError::Fault::unreadable, 0, "cannot read the file");
    return text;
}

std::string read_limited(std::istream& in, std::size_t limit) {
    std::string text = read_chunks(limit, [&](char* buf, std::size_t want) {
        in.read(buf, static_cast<std::streamsize>(want));
        return static_cast<std::size_t>(in.gcount());
    });
    if (in.bad()) throw TextFileError(TextFileError::Fault::unreadable, 0, "cannot read the file");
    return text;
}

std::string decode_text(std::string text) {
    if (!std::string_view(text).starts_with(kUtf8Mark)) return text;
    const std::string_view utf8 = std::string_view(text).substr(kUtf8Mark.size());
    std::string out;
    out.reserve(utf8.size());
    int line = 1;
    for (std::size_t i = 0; i < utf8.size();) {
        const Utf8Unit u = next_utf8(utf8, i);
        if (!u.code_point)
            throw TextFileError(TextFileError::Fault::bad_text, line,
                                "the file starts as UTF-8, but this line holds bytes that are not UTF-8");
        const std::optional<uint8_t> b = from_unicode(*u.code_point);
        if (!b)
            throw TextFileError(TextFileError::Fault::bad_text, line,
                                "the character " + hex_code_point(*u.code_point) +
                                    " cannot be held: the form's text is Windows-1252");
        out += static_cast<char>(*b);
        if (*u.code_point == U'\n') ++line;
        i += u.used;
    }
    return out;
}

}  // namespace kel::kelform
