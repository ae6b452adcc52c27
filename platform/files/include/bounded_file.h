// Opening and reading the files the provider and the adapter library are
// handed by an administrator (settings, adapter descriptions, the job file,
// flash images, sysfs attributes) so that nothing at a path can stall or
// swamp the reader: the open never blocks (O_NONBLOCK, no controlling
// terminal), only a regular file is taken, and never more than a stated
// number of bytes. A FIFO, device, directory, socket or a file over the bound
// is refused with a reason a log line can carry.
//
// Both libraries link this code as a private static library (hidden symbols),
// so each keeps its own copy and neither depends on the other's internals.
#pragma once

#include <sys/stat.h>

#include <cstddef>
#include <string>

namespace bounded_file {

enum class Outcome {
    Taken,       // a regular file within the bound (opened or read)
    Missing,     // nothing at the path, or a path through something not a directory
    Unreadable,  // a regular file that can't be opened or read (rights, I/O error)
    Refused,     // not a regular file, or over the bound
};

struct Result {
    Outcome outcome = Outcome::Missing;
    std::string reason;  // for all but Taken: "a FIFO, not a regular file", "larger than 65536 bytes",
                         // "cannot be read (No such file or directory)"
    std::string text;    // readRegular: the whole file when Taken
    off_t size = 0;      // the size fstat gave when opened
};

// What kind of entry a mode stands for: "a FIFO", "a character device",
// "a block device", "a directory", "a socket", "a symbolic link", "a regular
// file" or "an unknown kind of entry".
const char* kindOf(mode_t mode);

// Opens `path` with `flags` (O_RDONLY, or O_RDWR | O_NOFOLLOW ...) plus
// O_NONBLOCK, O_NOCTTY and O_CLOEXEC; the descriptor when it is a regular file
// whose size is at most `max`, else -1 with `result` telling why. With `st`,
// the file's status is stored there.
int openRegular(const char* path, int flags, std::size_t max, Result& result, struct stat* st = nullptr);

// Reads a regular file whole, at most `max` bytes: a file that delivers more
// than `max` (one that grows, or claims a smaller size as procfs files do) is
// refused, never read further.
Result readRegular(const char* path, std::size_t max);

// Whether `path` is a regular file of at most `max` bytes, without reading it
// (the descriptor is opened and closed).
Result checkRegular(const char* path, std::size_t max);

// Reads from a descriptor, repeating on EINTR; the count, or -1.
long readSome(int fd, void* buffer, std::size_t want);

}  // namespace bounded_file
