// Non-blocking, regular-file-only, bounded opens and reads (bounded_file.h).
#include "bounded_file.h"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>

namespace bounded_file {
namespace {

std::string largerThan(std::size_t max) { return "larger than " + std::to_string(max) + " bytes"; }

std::string notRegular(mode_t mode) { return std::string(kindOf(mode)) + ", not a regular file"; }

std::string cannotRead(int error) { return std::string("cannot be read (") + std::strerror(error) + ")"; }

// Why an open failed: a missing entry, a link refused by O_NOFOLLOW, an entry
// that is no regular file (a directory opened for writing, a socket), or a
// regular file that can't be opened.
void openFailed(const char* path, int flags, int error, Result& result) {
    struct stat st {};
    if (error == ENOENT || error == ENOTDIR) {
        result.outcome = Outcome::Missing;
        result.reason = cannotRead(error);
    } else if (error == ELOOP && (flags & O_NOFOLLOW) != 0) {
        result.outcome = Outcome::Refused;
        result.reason = "a symbolic link, not a regular file";
    } else if (::lstat(path, &st) == 0 && !S_ISREG(st.st_mode) && !S_ISLNK(st.st_mode)) {
        result.outcome = Outcome::Refused;
        result.reason = notRegular(st.st_mode);
    } else if (::stat(path, &st) == 0 && !S_ISREG(st.st_mode)) {
        result.outcome = Outcome::Refused;
        result.reason = notRegular(st.st_mode);
    } else {
        result.outcome = Outcome::Unreadable;
        result.reason = cannotRead(error);
    }
}

}  // namespace

const char* kindOf(mode_t mode) {
    if (S_ISREG(mode)) return "a regular file";
    if (S_ISFIFO(mode)) return "a FIFO";
    if (S_ISCHR(mode)) return "a character device";
    if (S_ISBLK(mode)) return "a block device";
    if (S_ISDIR(mode)) return "a directory";
    if (S_ISSOCK(mode)) return "a socket";
    if (S_ISLNK(mode)) return "a symbolic link";
    return "an unknown kind of entry";
}

long readSome(int fd, void* buffer, std::size_t want) {
    for (;;) {
        const ssize_t n = ::read(fd, buffer, want);
        if (n >= 0 || errno != EINTR) return static_cast<long>(n);
    }
}

int openRegular(const char* path, int flags, std::size_t max, Result& result, struct stat* st) {
    result = Result{};
    if (path == nullptr || *path == '\0') {
        result.reason = "no path";
        return -1;
    }
    const int fd = ::open(path, flags | O_NONBLOCK | O_NOCTTY | O_CLOEXEC);
    if (fd < 0) {
        openFailed(path, flags, errno, result);
        return -1;
    }
    struct stat own {};
    struct stat& s = st != nullptr ? *st : own;
    if (::fstat(fd, &s) != 0) {
        result.outcome = Outcome::Unreadable;
        result.reason = cannotRead(errno);
    } else if (!S_ISREG(s.st_mode)) {
        result.outcome = Outcome::Refused;
        result.reason = notRegular(s.st_mode);
    } else if (s.st_size < 0 || static_cast<unsigned long long>(s.st_size) > max) {
        result.outcome = Outcome::Refused;
        result.reason = largerThan(max);
    } else {
        result.outcome = Outcome::Taken;
        result.size = s.st_size;
        return fd;
    }
    ::close(fd);
    return -1;
}

Result readRegular(const char* path, std::size_t max) {
    Result result;
    const int fd = openRegular(path, O_RDONLY, max, result);
    if (fd < 0) return result;
    char buffer[16384];
    for (;;) {
        const long n = readSome(fd, buffer, sizeof buffer);
        if (n < 0) {
            result.outcome = Outcome::Unreadable;
            result.reason = cannotRead(errno);
            break;
        }
        if (n == 0) break;
        if (result.text.size() + static_cast<std::size_t>(n) > max) {
            result.outcome = Outcome::Refused;
            result.reason = largerThan(max);
            break;
        }
        result.text.append(buffer, static_cast<std::size_t>(n));
    }
    ::close(fd);
    if (result.outcome != Outcome::Taken) std::string().swap(result.text);
    return result;
}

Result checkRegular(const char* path, std::size_t max) {
    Result result;
    const int fd = openRegular(path, O_RDONLY, max, result);
    if (fd >= 0) ::close(fd);
    return result;
}

}  // namespace bounded_file
