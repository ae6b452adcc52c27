#include "support/ProviderFiles.h"

#include <cstdarg>
#include <cstdio>

#include "support/Vexlan_FC_Utils_CMPI.h"

void ReportProviderNotice(const char* format, ...)
{
    char line[512];
    va_list args;
    va_start(args, format);
    std::vsnprintf(line, sizeof(line), format, args);
    va_end(args);
    if (g_EnableLogError)
        Vexlan_FC_Utils_CMPI::LogError("%s", line);
    else
        std::fprintf(stderr, "Vexlan_CNA_Provider: %s\n", line);
}

void ReportRefusedFile(const char* what, const char* path, const std::string& reason)
{
    ReportProviderNotice("Refusing %s (%s): %s.", what, path, reason.c_str());
}

bounded_file::Result ReadProviderFile(const char* what, const char* path, std::size_t max)
{
    bounded_file::Result result = bounded_file::readRegular(path, max);
    if (result.outcome == bounded_file::Outcome::Refused)
        ReportRefusedFile(what, path, result.reason);
    return result;
}

bool FlashImageUsable(const char* path)
{
    const bounded_file::Result result = bounded_file::checkRegular(path, kFlashImageMax);
    if (result.outcome == bounded_file::Outcome::Refused)
        ReportRefusedFile("flash image", path, result.reason);
    return result.outcome == bounded_file::Outcome::Taken;
}
