// Pieces that both flash update services use: the symbolic text of a CMPI
// status code, the URI to file name rule, the test for a file, and the
// reading of the InstallOptions argument.
#ifndef VEXLAN_UPDATE_INSTALLHELPERS_H
#define VEXLAN_UPDATE_INSTALLHELPERS_H

#include <cstddef>
#include <string>

#include "CmpiImpl.h"

// The option that asks for an asynchronous update (a job).
constexpr unsigned short kInstallOptionAsynchronous = 32768;
// Room for a flash file name, terminating zero included; a longer URI is
// refused as an unsupported URI.
constexpr std::size_t kFlashFileNameSize = 4096;
// NIC images have 1 to this many bytes.
constexpr unsigned long long kMaxNicImageSize = 0x1000000ULL;

// "CMPI_RC_OK" ... "CMPI_RC_NO_MORE_ELEMENTS" for 0 to 18, else
// "Errorcode: %d" in a buffer of this thread.
const char* GetCMPIErrorString(int rc);

// True when stat of the path succeeds (a directory counts too).
bool fileExists(const char* path);

// The file name of a URI: a leading "file://" (any case) is skipped, any
// other text is taken as a path as it stands. False when the name doesn't
// fit kFlashFileNameSize bytes.
bool FlashFileNameOfURI(const char* uri, char* fileName);

// What the InstallOptions argument asks for. `present` is false for a null
// or missing argument; every element is read as a uint16 (a conversion that
// fails throws). `asynchronous` when an element is 32768.
struct InstallOptions {
    bool present = false;
    bool asynchronous = false;
    std::size_t count = 0;
};
InstallOptions ReadInstallOptions(const CmpiData& argument);

// The unsigned 32-bit return value of a method, then returnDone.
void ReturnMethodValue(CmpiResult& result, unsigned int value);

#endif
