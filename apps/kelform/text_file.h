#pragma once
// Reading the text files kelform takes (scripts, form files): whole files up to a limit, so that
// a file that never ends (/dev/zero, a pipe) or a huge one is refused instead of filling memory,
// and text that an editor saved as UTF-8 with a byte-order mark decoded to the host's set.
#include <cstddef>
#include <istream>
#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>

namespace kel::kelform {

// The most bytes kelform reads from one file, unless KELFORM_MAX_FILE_BYTES says otherwise.
inline constexpr std::size_t kDefaultMaxFileBytes = std::size_t{256} << 20;
inline constexpr const char* kMaxFileBytesVariable = "KELFORM_MAX_FILE_BYTES";

// The limit given by `setting` (the environment variable's value, when set): a whole number of
// bytes above 0. Nothing when the setting is malformed.
std::optional<std::size_t> parse_max_file_bytes(const char* setting);

// A file that cannot be taken: it cannot be opened or read, it is too large, or a line of its
// text is at fault (`line` from 1; 0 for the other two).
class TextFileError : public std::runtime_error {
public:
    enum class Fault { unreadable, too_large, bad_text };
    TextFileError(Fault fault, int line, const std::string& message)
        : std::runtime_error(message), fault_(fault), line_(line) {}
    Fault fault() const { return fault_; }
    int line() const { return line_; }

private:
    Fault fault_;
    int line_;
};

// The whole file or stream, read in chunks, at most `limit` bytes (TextFileError beyond).
std::string read_limited(const std::string& path, std::size_t limit);
std::string read_limited(std::istream& in, std::size_t limit);

// The text as the host holds it: a text that starts with the UTF-8 byte-order mark is UTF-8 and
// is decoded to Windows-1252 (TextFileError naming the line of a character the set cannot hold,
// or of malformed UTF-8); any other text is taken as it is, byte for byte.
std::string decode_text(std::string text);

}  // namespace kel::kelform
