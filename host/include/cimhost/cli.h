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

// Splits a batch line into words: blanks separate, '...' and "..." group
// (the quotes are removed), a backslash takes the next character as it is.
// Returns false on an unterminated quote.
bool splitWords(const std::string& line, std::vector<std::string>& words, std::string& error);

// Usage text of --help.
const char* cliUsage();

}  // namespace cimhost
