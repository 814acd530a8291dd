#include "apps/kelform/safe_file.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <cerrno>
#include <charconv>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <system_error>

#include "keltext/host/float_chars.h"

namespace kel::kelform {

SaveError::SaveError(const std::string& path, const std::string& reason)
    : std::runtime_error(path + ": " + reason), path_(path), reason_(reason) {}

namespace {

[[noreturn]] void fail(const std::string& path, const std::string& reason) { throw SaveError(path, reason); }

// The system's words for an error ("Permission denied"), without strerror's shared buffer.
[[noreturn]] void fail_errno(const std::string& path, int err) {
    fail(path, std::system_category().message(err));
}

// The file a save replaces: `path` itself, or the file its symbolic link leads to.
struct Target {
    std::string file;
    bool exists = false;
    struct stat st {};
};

Target resolve(const std::string& path) {
    Target t;
    t.file = path;
    // "dir/" can only name a directory, and would leave the temporary file no name to copy.
    if (path.empty()) fail_errno(path, ENOENT);
    if (path.back() == '/') fail_errno(path, EISDIR);
    if (lstat(path.c_str(), &t.st) != 0) {
        if (errno != ENOENT) fail_errno(path, errno);
        return t;
    }
    if (S_ISLNK(t.st.st_mode)) {
        // The link stays; the file it leads to is replaced, and the rename must happen in that
        // file's directory, so the whole chain is resolved here.
        char* resolved = realpath(path.c_str(), nullptr);
        if (!resolved) {
            if (errno == ENOENT) fail(path, "is a symbolic link to a missing file");
            fail_errno(path, errno);
        }
        t.file = resolved;
        std::free(resolved);
        if (lstat(t.file.c_str(), &t.st) != 0) fail_errno(path, errno);
    }
    const mode_t type = t.st.st_mode & S_IFMT;
    if (type != S_IFREG) {
        const char* kind = type == S_IFDIR                      ? "a directory"
                           : type == S_IFIFO                    ? "a fifo"
                           : type == S_IFSOCK                   ? "a socket"
                           : type == S_IFCHR || type == S_IFBLK ? "a device"
                                                                : "something else";
        fail(path, std::string("is ") + kind + ", not a regular file");
    }
    // The rename would go through whenever the directory is writable, but a file its owner made
    // read-only is meant to stay as it is.
    if (faccessat(AT_FDCWD, t.file.c_str(), W_OK, AT_EACCESS) != 0) fail_errno(path, errno);
    t.exists = true;
    return t;
}

// Six letters and digits that differ between processes, threads and calls. They need not be
// unpredictable: O_EXCL turns a name someone planted into one more try, never into following it.
std::string random_tag() {
    static std::atomic<std::uint64_t> counter{0};
    timespec now{};
    clock_gettime(CLOCK_REALTIME, &now);
    std::uint64_t x = (static_cast<std::uint64_t>(getpid()) << 40) ^
                      static_cast<std::uint64_t>(now.tv_sec) * 1000000007u ^
                      static_cast<std::uint64_t>(now.tv_nsec) ^ counter.fetch_add(1) * 0xD1B54A32D192ED03u;
    // splitmix64, so that neighbouring inputs give unrelated names
    x += 0x9E3779B97F4A7C15u;
    x = (x ^ (x >> 30)) * 0xBF58476D1CE4E5B9u;
    x = (x ^ (x >> 27)) * 0x94D049BB133111EBu;
    x ^= x >> 31;
    static constexpr char kChars[] = "abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ0123456789";
    std::string tag;
    for (int i = 0; i < 6; ++i, x /= 62) tag += kChars[x % 62];
    return tag;
}

// The temporary file: closed and removed unless the rename took it.
class TempFile {
public:
    TempFile(const std::string& path, const std::string& dir, const std::string& name) {
        // The name is kept short enough for any file system however long the target's is.
        const std::string stem = dir + "." + name.substr(0, 100) + ".";
        for (int attempt = 0; attempt < 100; ++attempt) {
            std::string candidate = stem + random_tag() + ".saving";
            // 0666 here gives a new file the umask's usual mode; an existing file's is set later.
            fd_ = open(candidate.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_NOFOLLOW | O_CLOEXEC, 0666);
            if (fd_ >= 0) {
                name_ = std::move(candidate);
                return;
            }
            if (errno != EEXIST && errno != EINTR) fail_errno(path, errno);
        }
        fail_errno(path, EEXIST);
    }
    TempFile(const TempFile&) = delete;
    TempFile& operator=(const TempFile&) = delete;
    ~TempFile() {
        if (fd_ >= 0) ::close(fd_);
        if (!name_.empty()) ::unlink(name_.c_str());
    }
    int fd() const { return fd_; }
    const std::string& name() const { return name_; }
    // close(2) is where some file systems (NFS) first report a full disk.
    int close() {
        const int r = ::close(fd_);
        fd_ = -1;
        return r;
    }
    void renamed() { name_.clear(); }

private:
    int fd_ = -1;
    std::string name_;
};

void write_all(const std::string& path, int fd, std::string_view contents) {
    while (!contents.empty()) {
        const ssize_t n = ::write(fd, contents.data(), std::min<std::size_t>(contents.size(), 1u << 30));
        if (n < 0) {
            if (errno == EINTR) continue;
            fail_errno(path, errno);
        }
        if (n == 0) fail_errno(path, EIO);
        contents.remove_prefix(static_cast<std::size_t>(n));
    }
}

void keep_owner_and_mode(const std::string& path, int fd, const struct stat& old) {
    // Only a privileged process may give a file away; anyone may keep a group they belong to.
    // Owner first: a change of owner clears the set-id bits that fchmod then restores.
    if (fchown(fd, old.st_uid, old.st_gid) != 0) {
        if (errno != EPERM && errno != EINVAL) fail_errno(path, errno);
        if (fchown(fd, static_cast<uid_t>(-1), old.st_gid) != 0 && errno != EPERM && errno != EINVAL)
            fail_errno(path, errno);
    }
    if (fchmod(fd, old.st_mode & 07777) != 0) fail_errno(path, errno);
}

void test_pause() {
    const char* text = std::getenv("KELFORM_TEST_SAVE_PAUSE");
    if (!text || !*text) return;
    double seconds = 0;
    const char* end = text + std::strlen(text);
    const auto r = parse_float(text, end, seconds);
    if (r.ec != std::errc() || r.ptr != end || !(seconds > 0)) return;
    seconds = std::min(seconds, 600.0);
    timespec left{};
    left.tv_sec = static_cast<time_t>(seconds);
    left.tv_nsec = static_cast<long>((seconds - static_cast<double>(left.tv_sec)) * 1e9);
    while (nanosleep(&left, &left) != 0 && errno == EINTR) {
    }
}

}  // namespace

void write_file_safely(const std::string& path, std::string_view contents) {
    const Target target = resolve(path);
    const std::size_t slash = target.file.rfind('/');
    const std::string dir = slash == std::string::npos ? "" : target.file.substr(0, slash + 1);
    const std::string name = slash == std::string::npos ? target.file : target.file.substr(slash + 1);

    TempFile temp(path, dir, name);
    write_all(path, temp.fd(), contents);
    if (target.exists) keep_owner_and_mode(path, temp.fd(), target.st);
    if (fsync(temp.fd()) != 0) fail_errno(path, errno);
    if (temp.close() != 0) fail_errno(path, errno);

    test_pause();
    if (std::rename(temp.name().c_str(), target.file.c_str()) != 0) fail_errno(path, errno);
    temp.renamed();

    // The rename itself is only durable once the directory is. A directory the process may not
    // open, or a file system that cannot sync one, leaves nothing to do; a failing sync is
    // reported although the new contents are already in place.
    const int dir_fd = open(dir.empty() ? "." : dir.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
    if (dir_fd < 0) return;
    const int synced = fsync(dir_fd);
    const int err = errno;
    ::close(dir_fd);
    if (synced != 0 && err != EINVAL && err != EROFS) fail_errno(path, err);
}

}  // namespace kel::kelform
