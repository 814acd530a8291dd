// Saving a file safely: modes, links, refusals, an unprivileged user, and a save killed midway.
#include <gtest/gtest.h>

#include <fcntl.h>
#include <grp.h>
#include <signal.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <set>
#include <sstream>
#include <thread>

#include "apps/kelform/safe_file.h"

namespace kel::kelform {
namespace {

namespace fs = std::filesystem;

std::string read_text(const fs::path& p) {
    std::ifstream in(p, std::ios::binary);
    std::ostringstream s;
    s << in.rdbuf();
    return s.str();
}

void write_text(const fs::path& p, const std::string& text) { std::ofstream(p, std::ios::binary) << text; }

// A fresh directory under /tmp that any user may enter, so that an unprivileged child can too.
class TempDir {
public:
    TempDir() {
        char name[] = "/tmp/kelform_safe_XXXXXX";
        path_ = mkdtemp(name) ? name : "/tmp/kelform_safe_failed";
        chmod(path_.c_str(), 0755);
    }
    ~TempDir() {
        std::error_code ec;
        for (const auto& e : fs::recursive_directory_iterator(path_, ec))
            if (e.is_directory(ec) && !e.is_symlink(ec)) chmod(e.path().c_str(), 0755);
        fs::remove_all(path_, ec);
    }
    fs::path operator/(const std::string& name) const { return path_ / name; }
    const fs::path& path() const { return path_; }

private:
    fs::path path_;
};

std::set<std::string> entries(const fs::path& dir) {
    std::set<std::string> names;
    for (const auto& e : fs::directory_iterator(dir)) names.insert(e.path().filename().string());
    return names;
}

std::string error_of(const std::string& path, std::string_view contents) {
    try {
        write_file_safely(path, contents);
    } catch (const SaveError& e) {
        return e.what();
    }
    return "saved";
}

TEST(SafeFile, ReplacesContentsKeepingModeAndOwner) {
    TempDir dir;
    const mode_t mask = umask(022);
    umask(mask);
    const bool root = geteuid() == 0;  // only root can give the new file the old one's owner
    const struct {
        const char* name;
        int old_mode;  // -1: no file yet
        mode_t mode;
    } cases[] = {{"private", 0600, 0600}, {"setgid", 02640, 02640}, {"new", -1, 0666 & ~mask}};
    for (const auto& c : cases) {
        const fs::path p = dir / c.name;
        if (c.old_mode >= 0) {
            write_text(p, "old contents, longer than the new\n");
            ASSERT_EQ(chmod(p.c_str(), static_cast<mode_t>(c.old_mode)), 0);
            ASSERT_TRUE(!root || chown(p.c_str(), 65534, 65534) == 0);
        }
        write_file_safely(p.string(), "new\n");
        struct stat st {};
        ASSERT_EQ(stat(p.c_str(), &st), 0);
        EXPECT_EQ(read_text(p), "new\n") << c.name;
        EXPECT_EQ(st.st_mode & 07777, c.mode) << c.name;
        EXPECT_TRUE(!root || c.old_mode < 0 || (st.st_uid == 65534 && st.st_gid == 65534)) << c.name;
    }
    EXPECT_EQ(entries(dir.path()), (std::set<std::string>{"private", "setgid", "new"}));
}

TEST(SafeFile, WritesThroughASymbolicLink) {
    TempDir dir;
    fs::create_directory(dir / "real");
    fs::create_directory(dir / "links");
    write_text(dir / "real" / "v.json", "old\n");
    fs::create_symlink("../real/v.json", dir / "links" / "v.json");
    write_file_safely((dir / "links" / "v.json").string(), "new\n");
    EXPECT_TRUE(fs::is_symlink(dir / "links" / "v.json"));
    EXPECT_EQ(read_text(dir / "real" / "v.json"), "new\n");
    EXPECT_EQ(entries(dir / "real"), std::set<std::string>{"v.json"});
    EXPECT_EQ(entries(dir / "links"), std::set<std::string>{"v.json"});
}

TEST(SafeFile, RefusesWhatIsNoRegularFile) {
    TempDir dir;
    fs::create_symlink("missing", dir / "dangling");
    fs::create_directory(dir / "folder");
    ASSERT_EQ(mkfifo((dir / "fifo").c_str(), 0644), 0);
    const struct {
        std::string path, reason;
    } cases[] = {
        {(dir / "dangling").string(), "is a symbolic link to a missing file"},
        {(dir / "folder").string(), "is a directory, not a regular file"},
        {(dir / "fifo").string(), "is a fifo, not a regular file"},
        {"/dev/null", "is a device, not a regular file"},
        {(dir / "no" / "dir").string(), "No such file or directory"},
        {(dir / "folder/").string(), "Is a directory"},
    };
    for (const auto& c : cases) EXPECT_EQ(error_of(c.path, "x"), c.path + ": " + c.reason);
    EXPECT_EQ(entries(dir.path()), (std::set<std::string>{"dangling", "folder", "fifo"}));
    EXPECT_TRUE(fs::is_empty(dir / "folder"));
}

TEST(SafeFile, FailsWithTheSystemsReasonAndLeavesTheOldFile) {
    TempDir dir;
    fs::create_directory(dir / "locked");
    fs::create_directory(dir / "open");
    write_text(dir / "locked" / "v.json", "old\n");
    write_text(dir / "open" / "ro.json", "old\n");
    write_text(dir / "result", "");
    // v.json could be written: only its directory stops the save.
    for (const auto& [p, mode] : {std::pair{dir / "locked" / "v.json", 0666}, {dir / "locked", 0555},
                                  {dir / "open", 0777}, {dir / "open" / "ro.json", 0444}, {dir / "result", 0666}})
        ASSERT_EQ(chmod(p.c_str(), static_cast<mode_t>(mode)), 0);
    const std::string locked = (dir / "locked" / "v.json").string(), read_only = (dir / "open" / "ro.json").string();
    // Root passes every permission check: the saves run in a child as the unprivileged user 65534.
    const pid_t pid = fork();
    if (pid == 0) {
        const bool dropped = geteuid() != 0 || (setgroups(0, nullptr) == 0 && setresgid(65534, 65534, 65534) == 0 &&
                                                setresuid(65534, 65534, 65534) == 0);
        if (!dropped || access((dir / "locked").c_str(), W_OK) == 0) _exit(77);
        std::ofstream(dir / "result") << error_of(locked, "new\n") << "\n" << error_of(read_only, "new\n");
        _exit(0);
    }
    int status = 0;
    ASSERT_EQ(waitpid(pid, &status, 0), pid);
    if (WIFEXITED(status) && WEXITSTATUS(status) == 77) GTEST_SKIP() << "cannot run as a user that permissions stop";
    EXPECT_EQ(read_text(dir / "result"), locked + ": Permission denied\n" + read_only + ": Permission denied");
    EXPECT_EQ(read_text(locked), "old\n");
    EXPECT_EQ(read_text(read_only), "old\n");
    EXPECT_EQ(entries(dir / "locked"), std::set<std::string>{"v.json"});
    EXPECT_EQ(entries(dir / "open"), std::set<std::string>{"ro.json"});
}

#ifdef KELFORM_BINARY
// The real program killed inside a save, after its temporary file is written and before the
// rename (the test pause), while this process saves the same file.
TEST(SafeFile, KilledMidSaveLeavesTheFileWholeAndAnotherSaveUntouched) {
    TempDir dir;
    write_text(dir / "v.kform", "old record\n");
    write_text(dir / "save.kfs", "new KelNumeric n\nsaveform \"" + (dir / "v.kform").string() + "\"\n");
    const pid_t pid = fork();
    if (pid == 0) {
        setenv("KELFORM_TEST_SAVE_PAUSE", "30", 1);
        const int null = open("/dev/null", O_WRONLY);
        dup2(null, 1);
        dup2(null, 2);
        execl(KELFORM_BINARY, "kelform", "play", (dir / "save.kfs").c_str(), static_cast<char*>(nullptr));
        _exit(127);
    }
    ASSERT_GT(pid, 0);
    std::string temp;  // kelform's, once it holds the form
    for (int i = 0; i < 2000 && temp.empty(); ++i) {
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
        for (const std::string& e : entries(dir.path()))
            if (e.starts_with(".v.kform.") && e.ends_with(".saving") && read_text(dir / e).ends_with("end\n")) temp = e;
    }
    EXPECT_EQ(read_text(dir / "v.kform"), "old record\n");
    write_file_safely((dir / "v.kform").string(), "mine\n");
    kill(pid, SIGKILL);
    int status = 0;
    ASSERT_EQ(waitpid(pid, &status, 0), pid);
    ASSERT_FALSE(temp.empty()) << "kelform never got inside the save";
    EXPECT_TRUE(WIFSIGNALED(status));
    EXPECT_EQ(read_text(dir / "v.kform"), "mine\n");
    EXPECT_TRUE(read_text(dir / temp).starts_with("form \"Form\"\n"));
    // A killed save leaves only its temporary file, under its recognisable name.
    EXPECT_EQ(entries(dir.path()), (std::set<std::string>{"save.kfs", "v.kform", temp}));
}
#endif

}  // namespace
}  // namespace kel::kelform
