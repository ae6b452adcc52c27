// Message log of the host service layer, "Vexlan_CNA_CoreMessages.log" in the
// working directory, and the small file helpers that go with it.
//
// Nothing in the provider writes the message log today: until
// InitializeCoreMessagesFile is called, `messagesfile` is empty and
// OSSLogMessage returns without writing.
#ifndef VEXLAN_SUPPORT_LOGMESSAGE_H
#define VEXLAN_SUPPORT_LOGMESSAGE_H

#define VEXLAN_CORE_MESSAGES_FILE_NAME "Vexlan_CNA_CoreMessages.log"

// Message types of OSSLogMessage and LogMessage.
enum {
    OSS_MESSAGE_TYPE_INFO = 1,
    OSS_MESSAGE_TYPE_WARNING = 2,
    OSS_MESSAGE_TYPE_ERROR = 3,
    OSS_MESSAGE_TYPE_DEBUG = 100
};

extern char messagesfile[256];

extern char const* gstrMessageTypeInfo;
extern char const* gstrMessageTypeWarning;
extern char const* gstrMessageTypeError;
extern char const* gstrMessageTypeDebug;
extern char const* gstrMessageTypeUnknown;

// Removes `to`, then renames `from` to `to`. Returns 0 on success or when
// `from` did not exist (ENOENT); otherwise the result of rename.
int RenameLogFile(char const* from, char const* to);

// True if `file` is null or its size is strictly below `limit`; a file that
// can't be examined counts as size 0.
bool IsFileSizeWithinLimit(char const* file, long limit);

// 1 "Info", 2 "Warning", 3 "Error", 100 "Debug", anything else "Unknown".
char const* TranslateMessageTypeToString(int type);

// Stores the message log's name in `messagesfile` and empties the file.
void InitializeCoreMessagesFile();

// Appends "<type word>: <text>\n" to the message log. Always returns 1.
int OSSLogMessage(int type, char const* text);

// Formats into 512 bytes (longer texts are cut) and returns OSSLogMessage's
// result.
int LogMessage(int type, char const* format, ...) __attribute__((format(printf, 2, 3)));

#endif
