#pragma once
// Writing a whole file so that a crash, a full disk or a second save at the same moment never
// leaves it half written: form files (`saveform`, the terminal form) and records are saved
// through here.
#include <stdexcept>
#include <string>
#include <string_view>

namespace kel::kelform {

// A save that did not happen. what() is "PATH: REASON", REASON being the system's own words
// where the system refused ("voucher.json: Permission denied", "voucher.json: No space left on
// device") and otherwise one of:
//   "is a directory, not a regular file" (also "a fifo", "a device", "a socket")
//   "is a symbolic link to a missing file"
class SaveError : public std::runtime_error {
public:
    SaveError(const std::string& path, const std::string& reason);
    const std::string& path() const { return path_; }
    const std::string& reason() const { return reason_; }

private:
    std::string path_;
    std::string reason_;
};

// Replaces the file at `path` with `contents`, whole or not at all; SaveError when it could not.
//
// The contents go to a new file created exclusively, under a fresh random name
// (".NAME.XXXXXX.saving"), in the target's own directory; it is written, fsync'ed, renamed over
// the target, and the directory is fsync'ed. So two saves at once each write their own file
// (the last rename wins, neither is mixed with the other), and a link planted at a temporary
// name is never followed.
//
// - A target that is a symbolic link is written through: the file it points to gets the new
//   contents (and the temporary file goes beside that file), the link stays a link. A link to
//   nothing is refused, and so is a target that exists and is not a regular file.
// - An existing file keeps its permission bits and, where the process may set them, its owner
//   and group. An existing file the process may not write is refused ("Permission denied"), as
//   writing it in place would be, although its directory would let the rename through. A new
//   file gets 0666 less the umask. A file with several hard links gets a new file under this
//   name only; its other names keep the old contents.
// - On failure the old file is untouched and the temporary file removed. Only a process killed
//   mid-save (SIGKILL, power loss) can leave a ".NAME.XXXXXX.saving" file behind, and the
//   target is then still the old file, whole. The one error reported after the rename is a
//   failed sync of the directory (an I/O error): the new contents are in place, but may not
//   survive a power loss.
//
// For tests only: when the environment variable KELFORM_TEST_SAVE_PAUSE holds a number of
// seconds (at most 600), the save waits that long just before the rename, so that a test can
// kill the process inside a save.
void write_file_safely(const std::string& path, std::string_view contents);

}  // namespace kel::kelform
