// cimhost: runs CIM operations against a CMPI provider library in-process.
#include <unistd.h>

#include <iostream>
#include <limits.h>
#include <sys/stat.h>

#include "cimhost/cli.h"

namespace {

bool isFile(const std::string& path)
{
    struct stat st {};
    return stat(path.c_str(), &st) == 0 && S_ISREG(st.st_mode);
}

// The directory above the one this program lies in: the installation prefix
// (<prefix>/bin/cimhost), or the build tree (<build>/bin/cimhost).
std::string prefixOfThisProgram()
{
    char buf[PATH_MAX];
    const ssize_t n = readlink("/proc/self/exe", buf, sizeof(buf) - 1);
    if (n <= 0)
        return std::string();
    std::string exe(buf, static_cast<size_t>(n));
    for (int up = 0; up < 2; ++up) {
        const size_t slash = exe.find_last_of('/');
        if (slash == std::string::npos)
            return std::string();
        exe.erase(slash);
    }
    return exe;
}

// The Vexlan provider as `make install` (or the Debian package) lays it out
// beside this program: <prefix>/<libdir>/libVexlan_CNA_Provider.so.1 and
// <prefix>/<datadir>/vexlan-cna/. The build tree has the same shape with lib
// and share.
cimhost::InstalledProvider installedProvider()
{
    cimhost::InstalledProvider p;
    const std::string prefix = prefixOfThisProgram();
    if (prefix.empty())
        return p;
    for (const char* libdir : {CIMHOST_INSTALL_LIBDIR, "lib"}) {
        const std::string lib = prefix + "/" + libdir + "/libVexlan_CNA_Provider.so.1";
        if (isFile(lib)) {
            p.library = lib;
            break;
        }
    }
    if (p.library.empty())
        return p;
    for (const char* datadir : {CIMHOST_INSTALL_DATADIR, "share"}) {
        const std::string share = prefix + "/" + datadir + "/vexlan-cna";
        if (isFile(share + "/Vexlan_CNA_Provider.mof")) {
            p.mofDir = share + "/mof";
            p.registration = share + "/Vexlan_CNA_Provider.reg";
            break;
        }
    }
    if (p.mofDir.empty()) {
        p.library.clear();
        return p;
    }
    p.name = "Vexlan_CNA_Provider";
    p.nameSpace = "root/vexlan_cmpi";
    return p;
}

}  // namespace

int main(int argc, char** argv) {
    std::vector<std::string> args(argv, argv + argc);
    try {
        const cimhost::InstalledProvider installed = installedProvider();
        return cimhost::runCli(args, std::cout, std::cerr, &installed);
    } catch (const std::exception& e) {
        std::cerr << "CMPI_RC_ERR_FAILED: " << e.what() << "\n";
        return 1;
    } catch (...) {
        std::cerr << "CMPI_RC_ERR_FAILED: unknown error\n";
        return 1;
    }
}
