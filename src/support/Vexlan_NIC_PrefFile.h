// The preference file: a small store of `key=value` lines in
// "/var/tmp/vxln_cna_provider.config", which holds the saved update jobs.
//
// /var/tmp is writable by everybody and the provider runs as root, so the
// file is never reached through a symbolic link, a file that another user owns
// or that others may write is neither read nor written, and every change
// writes a new version to a private temporary file beside it and renames it
// into place: a reader sees the old file or the new one, never a mixture, and
// no tail of older content stays behind.
//
// The functions take no lock; the job store (state/JobStore.h) serialises
// every use.
#ifndef VEXLAN_SUPPORT_VEXLAN_NIC_PREFFILE_H
#define VEXLAN_SUPPORT_VEXLAN_NIC_PREFFILE_H

#include <cstddef>
#include <cstdio>
#include <string>

// The file of the saved jobs.
extern const unsigned char kPrefFileName[];
// Lines go through buffers of this size; a longer line is read in pieces.
constexpr std::size_t kPrefLineSize = 768;
constexpr std::size_t kPrefPathSize = 512;

// "/var/tmp/<name>" into `path` (kPrefPathSize bytes, cut if longer).
void GetPrefFileFullPath(const unsigned char* name, char* path);
// The file opened for reading and writing; it must exist and be a regular
// file of this user that others can't write. Null otherwise.
FILE* PrefOpenPreferenceFile(const unsigned char* name);
// The file replaced by an empty one (created when missing) and opened; null
// when that can't be done.
FILE* PrefOpenPreferenceFileWriteMode(const unsigned char* name);
// Null is 0; otherwise 0 when fclose succeeds, else -1.
int PrefClosePreferenceFile(FILE* file);
// Sets `key=value`: every line with a "="-separated token equal to the key is
// replaced, or the line is added at the end. With a null `file` the
// preference file is rewritten (it must exist); a file handed in is rewritten
// in place and stays open. 0 or -1.
int PrefSetProperty(FILE* file, const unsigned char* key, const unsigned char* value);
// The value behind `key` on the first line that holds it, or null. The text
// lives in a buffer of this thread until its next call.
char* PrefGetProperty(FILE* file, const unsigned char* key);

// A new private file (mode 0600) made by mkstemp from `nameTemplate`, which
// then holds its name, with `size` bytes of `data` written and the file
// closed. False, with nothing left behind, when it can't be made or written.
bool WritePrivateTempFile(std::string& nameTemplate, const void* data, std::size_t size);

// A new version of the preference file made of many PrefSetProperty calls:
// while it lives, PrefSetProperty with a null file on this thread changes a
// copy in memory that starts empty, and commit() puts it in place as one new
// file, so a reader sees the old set of lines or the new one, never a part.
class PrefRewrite {
public:
    PrefRewrite();
    ~PrefRewrite();
    PrefRewrite(const PrefRewrite&) = delete;
    PrefRewrite& operator=(const PrefRewrite&) = delete;
    // False when the file could not be written (or may not be: see above).
    bool commit();
};

#endif
