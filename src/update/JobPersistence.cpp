// The job map to and from the job file "vxln_cna_provider.config".
#include "update/JobPersistence.h"

#include <fcntl.h>
#include <unistd.h>

#include <cstdio>
#include <cstring>

#include "state/ProviderState.h"
#include "support/ProviderFiles.h"
#include "support/Vexlan_FC_Utils_CMPI.h"
#include "support/Vexlan_NIC_PrefFile.h"
#include "support/Vexlan_NIC_Utils.h"

namespace {

#define JOB_DEBUG(...)                                     \
    do {                                                   \
        if (g_EnableDebugPrint)                            \
            Vexlan_FC_Utils_CMPI::DebugPrint(__VA_ARGS__); \
    } while (0)
#define JOB_ERROR(...)                                   \
    do {                                                 \
        if (g_EnableLogError)                            \
            Vexlan_FC_Utils_CMPI::LogError(__VA_ARGS__); \
    } while (0)

const unsigned char* text(const char* s)
{
    return reinterpret_cast<const unsigned char*>(s);
}

void setLine(const char* id, const char* word, const char* value)
{
    char key[64];
    std::snprintf(key, sizeof(key), "%s#%s", id, word);
    PrefSetProperty(nullptr, text(key), text(value));
}

// Blanks, tabs and newlines cut from the end, then from the beginning.
void trimLine(char* line)
{
    std::size_t n = std::strlen(line);
    while (n > 0 && (line[n - 1] == ' ' || line[n - 1] == '\t' || line[n - 1] == '\n' || line[n - 1] == '\r'))
        line[--n] = '\0';
    std::size_t start = 0;
    while (line[start] == ' ' || line[start] == '\t' || line[start] == '\n')
        ++start;
    if (start > 0)
        std::memmove(line, line + start, n - start + 1);
}

}  // namespace

void SaveConcreteJobInfo(Concrete_Job job)
{
    char id[kUTextSize];
    char number[kLluTextSize];
    utoa(job.id, id);
    setLine(id, "ID", id);
    setLine(id, "DESC", job.description.c_str());
    llutoa(job.timeOfLastStateChange, number);
    setLine(id, "TOLSC", number);
    utoa(job.status, number);
    setLine(id, "STATUS", number);
    utoa(job.result, number);
    setLine(id, "RESULT", number);
    setLine(id, "END", "1");
}

void SerializeJobsToPrefFile(const ConcreteJobMap& jobs)
{
    std::lock_guard<std::recursive_mutex> guard(jobStoreLock());
    JOB_DEBUG("Entering SerializeConcreteJobToPrefFile");
    // The file starts empty and takes every job's lines, and is put in place
    // whole at the end: a reader never finds a part of the jobs.
    PrefRewrite rewrite;
    for (const auto& entry : jobs)
        SaveConcreteJobInfo(entry.second);
    rewrite.commit();
    JOB_DEBUG("Exiting  SerializeConcreteJobToPrefFile");
}

void DeserializeJobsFromPrefFile(ConcreteJobMap& jobs, unsigned long long now)
{
    std::lock_guard<std::recursive_mutex> guard(jobStoreLock());
    jobs.clear();
    FILE* file = PrefOpenPreferenceFile(kPrefFileName);
    if (file == nullptr) {
        JOB_ERROR("PrefGetProperty: Failed to open preference file (%s).",
                  reinterpret_cast<const char*>(kPrefFileName));
        return;
    }
    // The fields of the record being read; a record that lacks a line takes
    // that field from the record before it.
    Concrete_Job job;
    char line[kPrefLineSize];
    std::rewind(file);
    while (!std::feof(file)) {
        if (std::fgets(line, sizeof(line), file) == nullptr) {
            if (!std::ferror(file))
                continue;
            JOB_ERROR("PrefGetProperty: Failed to read preference file.");
            break;
        }
        JOB_DEBUG("DeserializeConcreteJobToPrefFile: rBuffer before trimming %s", line);
        trimLine(line);
        JOB_DEBUG("DeserializeConcreteJobToPrefFile: rBuffer after trimming %s", line);
        if (line[0] == '\0')
            continue;
        char id[64] = {};
        char word[256] = {};
        char value[256] = {};
        if (std::sscanf(line, "%63[^'#''=']#%255[^'#''=']=%255[^'#''=']", id, word, value) != 3) {
            JOB_ERROR("PrefGetProperty: Failed to read preference file line.");
            break;
        }
        if (std::strcmp(word, "ID") == 0) {
            atou(id, &job.id);
        } else if (std::strcmp(word, "DESC") == 0) {
            job.description = value;
        } else if (std::strcmp(word, "TOLSC") == 0) {
            atollu(value, &job.timeOfLastStateChange);
        } else if (std::strcmp(word, "STATUS") == 0) {
            atou(value, &job.status);
        } else if (std::strcmp(word, "RESULT") == 0) {
            atou(value, &job.result);
        } else if (std::strcmp(word, "END") == 0) {
            // Unsigned: a clock set back gives a huge age, and the job goes too.
            const unsigned long long age = now - job.timeOfLastStateChange;
            if (age < kJobMaxAgeMicroseconds)
                jobs.insert({job.id, job});
        }
    }
    std::fclose(file);
}

void SerializeConcreteJobToPrefFile()
{
    ProviderState* provider = g_RunningProviderState.load();
    if (provider == nullptr)
        return;
    std::lock_guard<std::recursive_mutex> guard(jobStoreLock());
    SerializeJobsToPrefFile(provider->jobMap);
}

void DeserializeConcreteJobToPrefFile()
{
    ProviderState* provider = g_RunningProviderState.load();
    if (provider == nullptr)
        return;
    DeserializeJobsFromPrefFile(provider->jobMap, JobTimeNow());
}

unsigned long long GetDataFromFile(const char* path, unsigned long long size, unsigned char* buffer)
{
    if (path == nullptr || buffer == nullptr)
        return 0;
    // Opened without blocking, only as a regular flash image within its bound.
    bounded_file::Result result;
    const int fd = bounded_file::openRegular(path, O_RDONLY, kFlashImageMax, result);
    if (fd < 0) {
        if (result.outcome == bounded_file::Outcome::Refused)
            ReportRefusedFile("flash image", path, result.reason);
        return 0;
    }
    unsigned long long got = 0;
    while (got < size) {
        const long n = bounded_file::readSome(fd, buffer + got, static_cast<std::size_t>(size - got));
        if (n <= 0)
            break;
        got += static_cast<unsigned long long>(n);
    }
    close(fd);
    return got == size ? got : 0;
}
