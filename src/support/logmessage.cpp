#include "support/logmessage.h"

#include <pthread.h>
#include <sys/stat.h>

#include <cerrno>
#include <cstdarg>
#include <cstdio>
#include <cstring>

char messagesfile[256];

char const* gstrMessageTypeInfo = "Info";
char const* gstrMessageTypeWarning = "Warning";
char const* gstrMessageTypeError = "Error";
char const* gstrMessageTypeDebug = "Debug";
char const* gstrMessageTypeUnknown = "Unknown";

namespace {
// Guards `messagesfile` and the appends to the message log.
pthread_mutex_t messagesMutex = PTHREAD_MUTEX_INITIALIZER;

class MessagesLock {
public:
    MessagesLock() { locked_ = pthread_mutex_lock(&messagesMutex) == 0; }
    ~MessagesLock() {
        if (locked_) pthread_mutex_unlock(&messagesMutex);
    }
    MessagesLock(MessagesLock const&) = delete;
    MessagesLock& operator=(MessagesLock const&) = delete;

private:
    bool locked_;
};
}  // namespace

int RenameLogFile(char const* from, char const* to) {
    if (from == nullptr || to == nullptr) return -1;
    std::remove(to);
    int result = std::rename(from, to);
    if (result != 0 && errno == ENOENT) return 0;
    return result;
}

bool IsFileSizeWithinLimit(char const* file, long limit) {
    if (file == nullptr) return true;
    struct stat info;
    std::memset(&info, 0, sizeof info);  // a failed stat leaves size 0
    stat(file, &info);
    return info.st_size < limit;
}

char const* TranslateMessageTypeToString(int type) {
    switch (type) {
    case OSS_MESSAGE_TYPE_INFO: return gstrMessageTypeInfo;
    case OSS_MESSAGE_TYPE_WARNING: return gstrMessageTypeWarning;
    case OSS_MESSAGE_TYPE_ERROR: return gstrMessageTypeError;
    case OSS_MESSAGE_TYPE_DEBUG: return gstrMessageTypeDebug;
    default: return gstrMessageTypeUnknown;
    }
}

void InitializeCoreMessagesFile() {
    MessagesLock lock;
    std::snprintf(messagesfile, sizeof messagesfile, "%s", VEXLAN_CORE_MESSAGES_FILE_NAME);
    FILE* file = std::fopen(messagesfile, "w");
    if (file != nullptr) std::fclose(file);
}

int OSSLogMessage(int type, char const* text) {
    MessagesLock lock;
    FILE* file = std::fopen(messagesfile, "a");
    if (file == nullptr) return 1;
    std::fprintf(file, "%s: %s\n", TranslateMessageTypeToString(type), text != nullptr ? text : "");
    std::fclose(file);
    return 1;
}

int LogMessage(int type, char const* format, ...) {
    char text[512];
    std::memset(text, 0, sizeof text);
    if (format != nullptr) {
        va_list args;
        va_start(args, format);
        std::vsnprintf(text, sizeof text, format, args);
        va_end(args);
    }
    return OSSLogMessage(type, text);
}
