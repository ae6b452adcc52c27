// Diagnostic log of the provider: one text file under
// /opt/Vexlan_Corporation/CNAProviders/log with time-stamped lines, rotated
// once into Vexlan_CNA_Provider_prev.log when it reaches 1 MiB.
//
// The writing operations do not look at the switches. Every call site tests
// them itself, so that formatting costs nothing when a log is off:
//
//   if (g_EnableDebugPrint) Vexlan_FC_Utils_CMPI::DebugPrint("...", ...);
//   if (g_EnableLogError)   Vexlan_FC_Utils_CMPI::LogError("...", ...);
#ifndef VEXLAN_SUPPORT_VEXLAN_FC_UTILS_CMPI_H
#define VEXLAN_SUPPORT_VEXLAN_FC_UTILS_CMPI_H

// Switches of the two kinds of lines. Both start true so that the first lines
// of the provider's constructor always reach the log; the constructor then
// sets them from "DebugLog" and "ErrorLog" of the settings file.
extern bool g_EnableDebugPrint;
extern bool g_EnableLogError;

// Paths of the current and the previous log, composed by InitializeLogFile.
extern char LogFile[256];
extern char OldLogFile[256];

// Directory and file names of the log. The directory is never created here.
#define VEXLAN_LOG_DIRECTORY_FORMAT "/opt/Vexlan_Corporation/CNAProviders/log/%s"
#define VEXLAN_LOG_FILE_NAME "Vexlan_CNA_Provider.log"
#define VEXLAN_PREV_LOG_FILE_NAME "Vexlan_CNA_Provider_prev.log"

// A log of this many bytes or more is moved aside before the next line.
constexpr long kVexlanLogSizeLimit = 0x100000;

// Room for one formatted message; longer messages are cut to 511 characters.
constexpr unsigned kVexlanLogMessageSize = 512;

class Vexlan_FC_Utils_CMPI {
public:
    virtual ~Vexlan_FC_Utils_CMPI();

    // Composes LogFile and OldLogFile. Neither file is opened or touched.
    static void InitializeLogFile();

    // True if `file` is null or its size is strictly below `limit`. A file
    // that can't be examined counts as size 0, so it is within the limit.
    static bool IsFileSizeWithinLimit(char* file, long limit);

    // Removes the previous log and renames the current one to it.
    static void RenameOversizedLogFile();

    // Each writes one line "<ctime text> <message>\n" to LogFile, rotating
    // first when the file is over the limit. Safe from any thread. A log that
    // can't be opened drops the line silently.
    static void LogError(char const* format, ...) __attribute__((format(printf, 1, 2)));
    static void DebugPrint(char const* format, ...) __attribute__((format(printf, 1, 2)));
};

#endif
