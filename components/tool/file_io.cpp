// Reading and writing whole files (file_io.h says how a write goes).
#include "file_io.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <utility>

namespace kelmartool {

namespace {

// One open file descriptor, closed when it goes.
class UniqueFd {
public:
    explicit UniqueFd(int fd) noexcept : m_fd(fd) {}
    UniqueFd(const UniqueFd&) = delete;
    UniqueFd& operator=(const UniqueFd&) = delete;
    ~UniqueFd() {
        if (m_fd >= 0) ::close(m_fd);
    }
    int get() const noexcept { return m_fd; }
    explicit operator bool() const noexcept { return m_fd >= 0; }
    // Closes now; false when close reports an error, which for a written file can be the write's.
    bool Close() noexcept { return ::close(std::exchange(m_fd, -1)) == 0; }

private:
    int m_fd;
};

// A temporary file that goes unless it was kept (renamed into place).
class TemporaryName {
public:
    explicit TemporaryName(std::string name) : m_name(std::move(name)) {}
    TemporaryName(const TemporaryName&) = delete;
    TemporaryName& operator=(const TemporaryName&) = delete;
    ~TemporaryName() {
        if (!m_kept) ::unlink(m_name.c_str());
    }
    const std::string& Name() const noexcept { return m_name; }
    void Keep() noexcept { m_kept = true; }

private:
    std::string m_name;
    bool m_kept = false;
};

// Symbolic links followed before a target is refused as a loop.
constexpr int kMaxLinks = 40;

std::string Why(int error) { return std::strerror(error); }

std::string FolderOf(const std::string& path) {
    const auto slash = path.find_last_of('/');
    if (slash == std::string::npos) return ".";
    return slash == 0 ? std::string("/") : path.substr(0, slash);
}

// The file a name leads to once every symbolic link on its last part is followed; the name
// itself when it is no link or names nothing yet.
bool FollowLinks(const std::string& file, std::string& target, std::string& error) {
    target = file;
    for (int hops = 0;; ++hops) {
        struct stat st {};
        if (::lstat(target.c_str(), &st) != 0) {
            if (errno == ENOENT) return true;
            error = Why(errno);
            return false;
        }
        if (!S_ISLNK(st.st_mode)) return true;
        if (hops == kMaxLinks) {
            error = "too many symbolic links";
            return false;
        }
        std::string link(static_cast<std::size_t>(st.st_size > 0 ? st.st_size : 255) + 1, '\0');
        const ssize_t length = ::readlink(target.c_str(), link.data(), link.size());
        if (length < 0) {
            error = Why(errno);
            return false;
        }
        if (length == 0) {
            error = "it is an empty symbolic link";
            return false;
        }
        link.resize(static_cast<std::size_t>(length));
        target = link.front() == '/' ? link : FolderOf(target) + "/" + link;
    }
}

// The umask of the process, read without changing it (umask(2) can only be read by setting it,
// which would open a window for other threads). Without /proc the most careful one is assumed.
mode_t CurrentUmask() {
    std::ifstream status("/proc/self/status");
    for (std::string line; std::getline(status, line);)
        if (line.rfind("Umask:", 0) == 0) return static_cast<mode_t>(std::strtoul(line.c_str() + 6, nullptr, 8) & 0777);
    return 077;
}

bool WriteAll(int fd, std::string_view text) {
    while (!text.empty()) {
        const ssize_t n = ::write(fd, text.data(), text.size());
        if (n < 0 && errno == EINTR) continue;
        if (n == 0) errno = EIO;
        if (n <= 0) return false;
        text.remove_prefix(static_cast<std::size_t>(n));
    }
    return true;
}

}  // namespace

bool ReadTextFile(const std::string& file, std::string& text, std::string& error) {
    // O_NONBLOCK: opening a FIFO must not wait for a writer; it is refused below anyway.
    UniqueFd fd(::open(file.c_str(), O_RDONLY | O_CLOEXEC | O_NOCTTY | O_NONBLOCK));
    if (!fd) {
        error = "no such readable file";
        return false;
    }
    struct stat st {};
    if (::fstat(fd.get(), &st) != 0) {
        error = Why(errno);
        return false;
    }
    if (!S_ISREG(st.st_mode)) {
        error = S_ISDIR(st.st_mode) ? "it is a folder, not a file" : "it is not a regular file";
        return false;
    }
    std::string content;
    content.reserve(static_cast<std::size_t>(st.st_size));
    char buffer[65536];
    for (;;) {
        const ssize_t n = ::read(fd.get(), buffer, sizeof buffer);
        if (n < 0 && errno == EINTR) continue;
        if (n < 0) {
            error = Why(errno);
            return false;
        }
        if (n == 0) break;
        content.append(buffer, static_cast<std::size_t>(n));
    }
    text = std::move(content);
    return true;
}

bool WriteTextFile(const std::string& file, std::string_view text, std::string& error) {
    std::string target;
    if (!FollowLinks(file, target, error)) return false;
    struct stat st {};
    const bool exists = ::stat(target.c_str(), &st) == 0;
    if (!exists && errno != ENOENT) {
        error = Why(errno);
        return false;
    }
    if (exists && !S_ISREG(st.st_mode)) {
        error = S_ISDIR(st.st_mode) ? "it is a folder, not a file" : "it is not a regular file";
        return false;
    }
    const std::string folder = FolderOf(target);
    const std::string base = target.substr(target.find_last_of('/') + 1);  // npos + 1 is 0
    std::string pattern = folder + "/." + base + ".XXXXXX";
    UniqueFd fd(::mkostemp(pattern.data(), O_CLOEXEC));
    if (!fd) {
        error = errno == ENOENT ? "the folder '" + folder + "' does not exist"
                                : "cannot make a file in the folder '" + folder + "': " + Why(errno);
        return false;
    }
    TemporaryName temporary(pattern);
    // The owner first: changing it clears set-id bits, which the mode then puts back.
    if (exists && (st.st_uid != ::geteuid() || st.st_gid != ::getegid()))
        (void)!::fchown(fd.get(), st.st_uid, st.st_gid);  // as far as allowed; the writer owns it otherwise
    const mode_t mode = exists ? st.st_mode & 07777 : 0666 & ~CurrentUmask();
    if (!WriteAll(fd.get(), text) || ::fchmod(fd.get(), mode) != 0 || ::fsync(fd.get()) != 0 || !fd.Close() ||
        ::rename(temporary.Name().c_str(), target.c_str()) != 0) {
        error = Why(errno);
        return false;
    }
    temporary.Keep();
    // The rename is in place now; a folder that cannot be synced (some file systems refuse it)
    // does not make the write a failure.
    if (UniqueFd dir(::open(folder.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC)); dir) (void)::fsync(dir.get());
    return true;
}

}  // namespace kelmartool
