// The provider's side of reading files an administrator hands it: the two
// settings files, the job file and flash images. Each is opened without
// blocking and taken only as a regular file within its bound (bounded_file.h);
// anything else is refused with one line naming the path and the reason, and
// the provider goes on as if the file were absent.
#ifndef VEXLAN_SUPPORT_PROVIDER_FILES_H
#define VEXLAN_SUPPORT_PROVIDER_FILES_H

#include <cstddef>
#include <string>

#include "bounded_file.h"

// Bounds: a settings file holds a few lines; the job file every job of the
// 65,535 ids with room to spare; a flash image a few MB.
constexpr std::size_t kSettingsFileMax = 1024 * 1024;
constexpr std::size_t kJobFileMax = 32 * 1024 * 1024;
constexpr std::size_t kFlashImageMax = 64 * 1024 * 1024;

// Writes one line to the error log when it is on, else to standard error (the
// server's own output, prefixed "Vexlan_CNA_Provider: "): a refused settings
// file may be the one that would have switched the log on.
void ReportProviderNotice(const char* format, ...) __attribute__((format(printf, 1, 2)));

// Reports "Refusing <what> (<path>): <reason>." through ReportProviderNotice.
void ReportRefusedFile(const char* what, const char* path, const std::string& reason);

// Reads a whole regular file of at most `max` bytes; a refusal is reported.
// The text is read when the outcome is Taken; a missing or unreadable file
// stays silent.
bounded_file::Result ReadProviderFile(const char* what, const char* path, std::size_t max);

// True when `path` names a regular flash image within kFlashImageMax; a
// refusal is reported as a "flash image". Anything at the path that isn't a
// regular file counts as absent.
bool FlashImageUsable(const char* path);

#endif
