// Pieces both flash update services use.
#include "update/InstallHelpers.h"

#include <strings.h>
#include <sys/stat.h>

#include <cstdio>
#include <cstring>

const char* GetCMPIErrorString(int rc)
{
    static const char* const kTexts[] = {
        "CMPI_RC_OK",
        "CMPI_RC_ERR_FAILED",
        "CMPI_RC_ERR_ACCESS_DENIED",
        "CMPI_RC_ERR_INVALID_NAMESPACE",
        "CMPI_RC_ERR_INVALID_PARAMETER",
        "CMPI_RC_ERR_INVALID_CLASS",
        "CMPI_RC_ERR_NOT_FOUND",
        "CMPI_RC_ERR_NOT_SUPPORTED",
        "CMPI_RC_ERR_CLASS_HAS_CHILDREN",
        "CMPI_RC_ERR_CLASS_HAS_INSTANCES",
        "CMPI_RC_ERR_INVALID_SUPERCLASS",
        "CMPI_RC_ERR_ALREADY_EXISTS",
        "CMPI_RC_ERR_NO_SUCH_PROPERTY",
        "CMPI_RC_ERR_TYPE_MISMATCH",
        "CMPI_RC_ERR_QUERY_LANGUAGE_NOT_SUPPORTED",
        "CMPI_RC_ERR_INVALID_QUERY",
        "CMPI_RC_ERR_METHOD_NOT_AVAILABLE",
        "CMPI_RC_ERR_METHOD_NOT_FOUND",
        "CMPI_RC_NO_MORE_ELEMENTS",
    };
    if (rc >= 0 && rc < static_cast<int>(sizeof(kTexts) / sizeof(kTexts[0])))
        return kTexts[rc];
    thread_local char other[32];
    std::snprintf(other, sizeof(other), "Errorcode: %d", rc);
    return other;
}

bool fileExists(const char* path)
{
    struct stat st {};
    return path != nullptr && stat(path, &st) == 0;
}

bool FlashFileNameOfURI(const char* uri, char* fileName)
{
    const char* name = strncasecmp(uri, "file://", 7) == 0 ? uri + 7 : uri;
    if (std::strlen(name) >= kFlashFileNameSize)
        return false;
    std::snprintf(fileName, kFlashFileNameSize, "%s", name);
    return true;
}

InstallOptions ReadInstallOptions(const CmpiData& argument)
{
    InstallOptions options;
    if (argument.isNullValue() || argument.isNotFound())
        return options;
    options.present = true;
    const CmpiArray array = argument;
    options.count = array.size();
    for (CMPICount i = 0; i < array.size(); ++i) {
        const unsigned short value = array[static_cast<int>(i)];
        // Every element is read, as the whole array is copied first.
        if (value == kInstallOptionAsynchronous)
            options.asynchronous = true;
    }
    return options;
}

void ReturnMethodValue(CmpiResult& result, unsigned int value)
{
    result.returnData(CmpiData(static_cast<CMPIUint32>(value)));
    result.returnDone();
}
