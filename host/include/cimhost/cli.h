// The cimhost command line: wbemcli-like verbs over an embedded host.
#pragma once

#include <iosfwd>
#include <string>
#include <vector>

namespace cimhost {

// Runs one command line (argv[0] is the program name). Output goes to
// `out`, error lines to `err`. Returns the exit code: 0 success, 1 a failed
// operation or load, 2 a usage error.
int runCli(const std::vector<std::string>& args, std::ostream& out, std::ostream& err);

// Where an installed provider lies: its library, the name of its factories,
// its class MOF, its sfcb registration and the namespace of its classes.
// With a layout given, a command line without -p uses it (and its MOF,
// namespace and, for the sfcb flavour, registration unless given), so that
// `cimhost ei Vexlan_FCHBA_FCPort` checks an installed provider; --installed
// asks for it and fails when it is not there.
struct InstalledProvider {
    std::string library, name, mofDir, registration, nameSpace;
};
int runCli(const std::vector<std::string>& args, std::ostream& out, std::ostream& err,
           const InstalledProvider* installed);

// Splits a batch line into words: blanks separate, '...' and "..." group
// (the quotes are removed), a backslash takes the next character as it is.
// Returns false on an unterminated quote.
bool splitWords(const std::string& line, std::vector<std::string>& words, std::string& error);

// Usage text of --help.
const char* cliUsage();

}  // namespace cimhost
