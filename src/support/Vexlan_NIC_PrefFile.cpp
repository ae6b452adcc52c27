// The preference file store: key=value lines in /var/tmp, opened without
// following links, refused when it isn't this user's own private file, and
// always replaced whole through a private temporary file and a rename.
#include "support/Vexlan_NIC_PrefFile.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <string>
#include <vector>

#include "support/ProviderFiles.h"
#include "support/Vexlan_FC_Utils_CMPI.h"

const unsigned char kPrefFileName[] = "vxln_cna_provider.config";

namespace {

const char kPrefDirectory[] = "/var/tmp";

#define PREF_DEBUG(...)                                    \
    do {                                                   \
        if (g_EnableDebugPrint)                            \
            Vexlan_FC_Utils_CMPI::DebugPrint(__VA_ARGS__); \
    } while (0)
#define PREF_ERROR(...)                                  \
    do {                                                 \
        if (g_EnableLogError)                            \
            Vexlan_FC_Utils_CMPI::LogError(__VA_ARGS__); \
    } while (0)

const char* nameText(const unsigned char* name)
{
    return name != nullptr ? reinterpret_cast<const char*>(name) : "";
}

// A file the provider may trust: a regular file of this user that nobody
// else may write.
bool isOwnPrivateFile(const struct stat& st)
{
    return S_ISREG(st.st_mode) && st.st_uid == geteuid() && (st.st_mode & (S_IWGRP | S_IWOTH)) == 0;
}

void refusedLine(const char* path)
{
    PREF_ERROR("Refusing preference file (%s): a link, not a regular file, another user's, or writable by others.",
               path);
}

// The file at `path`, opened for reading and writing without following a link
// and without blocking; null when it is missing, not a regular file, larger
// than kJobFileMax or not the provider's own private file.
FILE* openOwnFile(const char* path)
{
    bounded_file::Result result;
    struct stat st {};
    const int fd = bounded_file::openRegular(path, O_RDWR | O_NOFOLLOW, kJobFileMax, result, &st);
    if (fd < 0) {
        if (result.outcome == bounded_file::Outcome::Refused)
            ReportRefusedFile("preference file", path, result.reason);
        return nullptr;
    }
    if (!isOwnPrivateFile(st)) {
        refusedLine(path);
        close(fd);
        return nullptr;
    }
    FILE* file = fdopen(fd, "r+");
    if (file == nullptr)
        close(fd);
    return file;
}

// The lines of `file` from its start, in the pieces fgets gives with the
// store's line buffer. False after a read error.
bool readLines(FILE* file, std::vector<std::string>& lines)
{
    std::rewind(file);
    char line[kPrefLineSize];
    while (!std::feof(file)) {
        if (std::fgets(line, sizeof(line), file) == nullptr) {
            if (std::ferror(file))
                return false;
            continue;
        }
        lines.emplace_back(line);
    }
    return true;
}

std::string joined(const std::vector<std::string>& lines)
{
    std::string text;
    for (const std::string& l : lines)
        text += l;
    return text;
}

// Replaces the file at `path` with `content`: written to a private temporary
// file of the same directory (mode 0600), then renamed over the path, which
// replaces a link rather than following it. An entry at the path that isn't
// the provider's own private file is left alone and the write refused.
bool replaceFile(const char* path, const std::string& content)
{
    struct stat st {};
    if (lstat(path, &st) == 0 && !isOwnPrivateFile(st)) {
        refusedLine(path);
        return false;
    }
    std::string temp = std::string(path) + ".XXXXXX";
    if (!WritePrivateTempFile(temp, content.data(), content.size())) {
        PREF_ERROR("Failed to write to temp file!");
        return false;
    }
    if (rename(temp.c_str(), path) != 0) {
        PREF_ERROR("Failed to write to preference file!");
        unlink(temp.c_str());
        return false;
    }
    return true;
}

// Rewrites a file handed in by the caller in place, from its start, and cuts
// what stood behind the new content.
bool rewriteInPlace(FILE* file, const std::string& content)
{
    std::rewind(file);
    if (!content.empty() && std::fwrite(content.data(), 1, content.size(), file) != content.size()) {
        PREF_ERROR("Failed to write to preference file!");
        return false;
    }
    if (std::fflush(file) != 0 || ftruncate(fileno(file), static_cast<off_t>(content.size())) != 0) {
        PREF_ERROR("Failed to write to preference file!");
        return false;
    }
    return true;
}

// True when a "="-separated token of `line` equals `key` (the last token
// keeps its newline, so a key there does not match).
bool lineHasKey(const std::string& line, const char* key)
{
    std::string copy = line;
    char* save = nullptr;
    for (char* token = strtok_r(&copy[0], "=", &save); token != nullptr; token = strtok_r(nullptr, "=", &save))
        if (std::strcmp(token, key) == 0)
            return true;
    return false;
}

// The lines of the rewrite in progress on this thread, if any.
thread_local std::vector<std::string>* t_rewrite = nullptr;

// Sets `key=value` in `lines` as PrefSetProperty does.
void setInLines(std::vector<std::string>& lines, const unsigned char* key, const unsigned char* value)
{
    const std::string replacement = std::string(nameText(key)) + "=" + nameText(value) + "\n";
    bool found = false;
    for (std::string& line : lines) {
        if (lineHasKey(line, nameText(key))) {
            line = replacement;
            found = true;
        }
    }
    if (!found)
        lines.push_back(replacement);
}

}  // namespace

bool WritePrivateTempFile(std::string& nameTemplate, const void* data, std::size_t size)
{
    const int fd = mkstemp(&nameTemplate[0]);
    if (fd < 0)
        return false;
    const char* bytes = static_cast<const char*>(data);
    bool ok = fchmod(fd, S_IRUSR | S_IWUSR) == 0;
    std::size_t done = 0;
    while (ok && done < size) {
        const ssize_t n = write(fd, bytes + done, size - done);
        if (n < 0 && errno == EINTR)
            continue;
        ok = n > 0;
        if (ok)
            done += static_cast<std::size_t>(n);
    }
    ok = close(fd) == 0 && ok;
    if (!ok)
        unlink(nameTemplate.c_str());
    return ok;
}

PrefRewrite::PrefRewrite()
{
    if (t_rewrite == nullptr)
        t_rewrite = new std::vector<std::string>();
}

PrefRewrite::~PrefRewrite()
{
    delete t_rewrite;
    t_rewrite = nullptr;
}

bool PrefRewrite::commit()
{
    if (t_rewrite == nullptr)
        return false;
    char path[kPrefPathSize];
    GetPrefFileFullPath(kPrefFileName, path);
    return replaceFile(path, joined(*t_rewrite));
}

void GetPrefFileFullPath(const unsigned char* name, char* path)
{
    PREF_DEBUG("Entering GetPrefFileFullPath");
    std::snprintf(path, kPrefPathSize, "%s/%s", kPrefDirectory, nameText(name));
    PREF_DEBUG("Exiting  GetPrefFileFullPath: szFilePath=%s", path);
}

FILE* PrefOpenPreferenceFile(const unsigned char* name)
{
    char path[kPrefPathSize];
    GetPrefFileFullPath(name, path);
    FILE* file = openOwnFile(path);
    if (file == nullptr)
        PREF_DEBUG("PrefOpenPreferenceFile: Failed to open preference file (%s).", nameText(name));
    return file;
}

FILE* PrefOpenPreferenceFileWriteMode(const unsigned char* name)
{
    char path[kPrefPathSize];
    GetPrefFileFullPath(name, path);
    FILE* file = replaceFile(path, std::string()) ? openOwnFile(path) : nullptr;
    if (file == nullptr)
        PREF_DEBUG("PrefOpenPreferenceFile: Failed to open preference file for writing (%s).", nameText(name));
    return file;
}

int PrefClosePreferenceFile(FILE* file)
{
    if (file == nullptr)
        return 0;
    return std::fclose(file) == 0 ? 0 : -1;
}

int PrefSetProperty(FILE* file, const unsigned char* key, const unsigned char* value)
{
    const bool own = file == nullptr;
    if (own && t_rewrite != nullptr) {
        setInLines(*t_rewrite, key, value);
        return 0;
    }
    if (own) {
        file = PrefOpenPreferenceFile(kPrefFileName);
        if (file == nullptr) {
            PREF_ERROR("Failed to open preference file (%s)", nameText(kPrefFileName));
            return -1;
        }
    }
    std::vector<std::string> lines;
    int result = 0;
    if (!readLines(file, lines)) {
        PREF_ERROR("Failed to read preference file!");
        result = -1;
    }
    setInLines(lines, key, value);
    bool written;
    if (own) {
        char path[kPrefPathSize];
        GetPrefFileFullPath(kPrefFileName, path);
        written = replaceFile(path, joined(lines));
        PrefClosePreferenceFile(file);
    } else {
        written = rewriteInPlace(file, joined(lines));
    }
    return written ? result : -1;
}

char* PrefGetProperty(FILE* file, const unsigned char* key)
{
    const bool own = file == nullptr;
    if (own) {
        file = PrefOpenPreferenceFile(kPrefFileName);
        if (file == nullptr) {
            PREF_ERROR("PrefGetProperty: Failed to open preference file (%s).", nameText(kPrefFileName));
            return nullptr;
        }
    }
    // The value stays readable until this thread's next call.
    thread_local char rBuffer[kPrefLineSize];
    char* found = nullptr;
    bool done = false;
    std::rewind(file);
    while (!done && !std::feof(file)) {
        if (std::fgets(rBuffer, sizeof(rBuffer), file) == nullptr) {
            if (std::ferror(file)) {
                PREF_ERROR("PrefGetProperty: Failed to read preference file.");
                done = true;
            }
            continue;
        }
        char* save = nullptr;
        for (char* token = strtok_r(rBuffer, "=\n", &save); token != nullptr;
             token = strtok_r(nullptr, "=\n", &save)) {
            if (std::strcmp(token, nameText(key)) == 0) {
                found = strtok_r(nullptr, "=\n", &save);
                done = true;
                break;
            }
        }
    }
    if (own)
        PrefClosePreferenceFile(file);
    return found;
}
