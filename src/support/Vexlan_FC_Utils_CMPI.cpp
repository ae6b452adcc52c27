#include "support/Vexlan_FC_Utils_CMPI.h"

#include <pthread.h>
#include <sys/stat.h>

#include <cerrno>
#include <cstdarg>
#include <cstdio>
#include <cstring>
#include <ctime>

bool g_EnableDebugPrint = true;
bool g_EnableLogError = true;

char LogFile[256];
char OldLogFile[256];

namespace {

// Lines come from request threads, the polling thread, flash workers and the
// adapter library's alarm thread. One lock of the log's own covers the size
// test, the rotation and the write of a line, so two threads never both
// rotate and lines never interleave within a line. Statically initialised so
// that it works before and after every constructor of the library.
pthread_mutex_t logMutex = PTHREAD_MUTEX_INITIALIZER;

class LogLock {
public:
    LogLock() { locked_ = pthread_mutex_lock(&logMutex) == 0; }
    ~LogLock() {
        if (locked_) pthread_mutex_unlock(&logMutex);
    }
    LogLock(LogLock const&) = delete;
    LogLock& operator=(LogLock const&) = delete;

private:
    bool locked_;
};

// Appends one time-stamped line. Caller holds logMutex.
void appendLine(char const* message) {
    FILE* file = std::fopen(LogFile, "a");
    if (file == nullptr) return;  // no directory or no rights: the line is dropped

    std::time_t now = std::time(nullptr);
    char timeText[64] = "";
    if (ctime_r(&now, timeText) != nullptr) {
        std::size_t length = std::strlen(timeText);
        if (length > 0) timeText[length - 1] = '\0';  // ctime's newline
    }
    std::fprintf(file, "%s %s\n", timeText, message);
    std::fflush(file);
    std::fclose(file);
}

// Moves the current log aside. Caller holds logMutex. A failure is reported in
// the current log without a second attempt at rotating it.
void renameOversized() {
    std::remove(OldLogFile);
    int result = std::rename(LogFile, OldLogFile);
    if (result != 0) {
        int error = errno;
        if (error != ENOENT && g_EnableLogError) {
            char message[kVexlanLogMessageSize];
            std::snprintf(message, sizeof message,
                          "Vexlan_FC_Utils Error renaming log file, result=%d, errno=%d", result, error);
            appendLine(message);
        }
    }
}

__attribute__((format(printf, 1, 0))) void writeLine(char const* format, va_list args) {
    char message[kVexlanLogMessageSize] = "";
    if (format != nullptr) std::vsnprintf(message, sizeof message, format, args);

    LogLock lock;
    if (!Vexlan_FC_Utils_CMPI::IsFileSizeWithinLimit(LogFile, kVexlanLogSizeLimit)) renameOversized();
    appendLine(message);
}

}  // namespace

Vexlan_FC_Utils_CMPI::~Vexlan_FC_Utils_CMPI() = default;

void Vexlan_FC_Utils_CMPI::InitializeLogFile() {
    LogLock lock;
    std::snprintf(LogFile, sizeof LogFile, VEXLAN_LOG_DIRECTORY_FORMAT, VEXLAN_LOG_FILE_NAME);
    std::snprintf(OldLogFile, sizeof OldLogFile, VEXLAN_LOG_DIRECTORY_FORMAT, VEXLAN_PREV_LOG_FILE_NAME);
}

bool Vexlan_FC_Utils_CMPI::IsFileSizeWithinLimit(char* file, long limit) {
    if (file == nullptr) return true;
    struct stat info;
    std::memset(&info, 0, sizeof info);  // a failed stat leaves size 0
    stat(file, &info);
    return info.st_size < limit;
}

void Vexlan_FC_Utils_CMPI::RenameOversizedLogFile() {
    LogLock lock;
    renameOversized();
}

void Vexlan_FC_Utils_CMPI::LogError(char const* format, ...) {
    va_list args;
    va_start(args, format);
    writeLine(format, args);
    va_end(args);
}

void Vexlan_FC_Utils_CMPI::DebugPrint(char const* format, ...) {
    va_list args;
    va_start(args, format);
    writeLine(format, args);
    va_end(args);
}
