// cimhost: runs CIM operations against a CMPI provider library in-process.
#include <iostream>

#include "cimhost/cli.h"

int main(int argc, char** argv) {
    std::vector<std::string> args(argv, argv + argc);
    try {
        return cimhost::runCli(args, std::cout, std::cerr);
    } catch (const std::exception& e) {
        std::cerr << "CMPI_RC_ERR_FAILED: " << e.what() << "\n";
        return 1;
    } catch (...) {
        std::cerr << "CMPI_RC_ERR_FAILED: unknown error\n";
        return 1;
    }
}
