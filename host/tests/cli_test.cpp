// The cimhost command line, run in-process against libTiny_Provider.so.
#include <gtest/gtest.h>

#include <cstdio>
#include <fstream>
#include <nlohmann/json.hpp>
#include <sstream>
#include <unistd.h>

#include "cimhost/cli.h"

using namespace cimhost;

namespace {

struct CliRun {
    int code = -1;
    std::string out, err;
};

CliRun cli(std::vector<std::string> args, bool withProvider = true) {
    std::vector<std::string> full = {"cimhost"};
    if (withProvider) {
        for (const char* a : {"-p", TINY_PROVIDER, "-n", "Tiny", "-m", TINY_MOF, "-N", "root/tiny", "--strict"})
            full.emplace_back(a);
    }
    full.insert(full.end(), args.begin(), args.end());
    std::ostringstream out, err;
    CliRun r;
    r.code = runCli(full, out, err);
    r.out = out.str();
    r.err = err.str();
    return r;
}

const char kAlpha[] = "Tiny_Thing.Name=\"alpha\",Id=1";

// What the command line adds to the host: the path comment before each
// instance and the blank line between them, options and typed arguments
// turned into the host's calls, exit codes and error texts. Every verb's
// output over this provider from a shell is cimhost_cli_test.sh's; what the
// host does with each call is host_test's.
TEST(CliVerbs, OptionsAndTypedArgumentsReachTheHost) {
    CliRun r = cli({"gi", kAlpha, "-P", "Count,Flag"});
    ASSERT_EQ(r.code, 0) << r.err;
    EXPECT_EQ(r.out,
              "// root/tiny:Tiny_Thing.Name=\"alpha\",Id=1\n"
              "instance of Tiny_Thing {\n"
              "    Name = \"alpha\";\n"
              "    Id = 1;\n"
              "    Count = 10;\n"
              "    Flag = TRUE;\n"
              "};\n");
    r = cli({"ei", "root/tiny:Tiny_Thing"});
    EXPECT_NE(r.out.find("};\n\n// root/tiny:Tiny_Thing.Name=\"beta\",Id=2\n"), std::string::npos) << r.out;
    r = cli({"ai", kAlpha, "--assoc-class", "Tiny_Link", "--result-class", "Tiny_Base", "-P", "Count"});
    ASSERT_EQ(r.code, 0) << r.err;
    EXPECT_NE(r.out.find("    Count = 20;\n};\n"), std::string::npos) << r.out;
    EXPECT_EQ(cli({"rin", kAlpha, "--role", "Right"}).out, "");
    r = cli({"ri", kAlpha, "--role", "Left"});
    EXPECT_NE(r.out.find("    Left = \"root/tiny:Tiny_Thing.Name=\\\"alpha\\\",Id=1\";\n"), std::string::npos)
        << r.out;
    // Without MOF, types are given in the argument names.
    r = cli({"-p", TINY_PROVIDER, "-n", "Tiny", "cm", kAlpha, "Echo", "Text:string=x", "Times:uint16=2"}, false);
    ASSERT_EQ(r.code, 0) << r.err;
    EXPECT_EQ(r.out, "ReturnValue = 2;\nReply = \"xx\";\nCodes = {1, 2, 3};\n");
    r = cli({"ci", "Tiny_Thing.Name=\"n\",Id=5", "Count=seven"});
    EXPECT_EQ(r.code, 2);
    EXPECT_EQ(r.err, "CMPI_RC_ERR_INVALID_PARAMETER: Count: 'seven' is not a valid uint32\n");
    EXPECT_EQ(cli({"mi", kAlpha, "Count=8", "Flag=false"}).code, 1);  // the provider wants exactly one
    r = cli({"cm", kAlpha, "BadOut"});
    EXPECT_EQ(r.code, 1);
    EXPECT_EQ(r.err.rfind("CMPI_RC_ERR_FAILED: strict check: output Tiny_Thing.BadOut.Reply", 0), 0u) << r.err;
}

TEST(CliJson, DocumentsHaveTheDocumentedShape) {
    CliRun r = cli({"--json", "gi", kAlpha});
    ASSERT_EQ(r.code, 0) << r.err;
    const auto j = nlohmann::json::parse(r.out);
    EXPECT_EQ(j["rc"], 0);
    const auto& inst = j["instances"][0];
    EXPECT_EQ(inst["path"], "root/tiny:Tiny_Thing.Name=\"alpha\",Id=1");
    EXPECT_EQ(inst["className"], "Tiny_Thing");
    EXPECT_EQ(inst["namespace"], "root/tiny");
    EXPECT_EQ(inst["properties"]["Count"], 10);
    EXPECT_EQ(inst["properties"]["Big"].get<std::uint64_t>(), 18446744073709551615ULL);
    EXPECT_EQ(inst["properties"]["Neg"], -5);
    EXPECT_EQ(inst["properties"]["Flag"], true);
    EXPECT_TRUE(inst["properties"]["Note"].is_null());
    EXPECT_EQ(inst["properties"]["Tags"], nlohmann::json::array({"x", "y\"q"}));
    EXPECT_EQ(inst["types"]["Tags"], "string[]");
    EXPECT_EQ(inst["types"]["When"], "datetime");
    const auto ordered = nlohmann::ordered_json::parse(r.out);   // set order kept
    EXPECT_EQ(ordered["instances"][0]["properties"].begin().key(), "Name");

    r = cli({"--json", "ein", "Tiny_Thing"});
    EXPECT_EQ(nlohmann::json::parse(r.out)["paths"].size(), 2u);
    r = cli({"--json", "cm", kAlpha, "Echo", "Text=q"});
    const auto m = nlohmann::json::parse(r.out);
    EXPECT_EQ(m["returnValue"], 1);
    EXPECT_EQ(m["returnType"], "uint32");
    EXPECT_EQ(m["outArgs"]["Codes"], nlohmann::json::array({1, 2, 3}));
    EXPECT_EQ(m["outArgTypes"]["Codes"], "uint8[]");
    r = cli({"--json", "gi", "Tiny_Thing.Name=\"none\",Id=1"});
    EXPECT_EQ(r.code, 1);
    const auto e = nlohmann::json::parse(r.out);
    EXPECT_EQ(e["rc"], 6);
    EXPECT_EQ(e["status"], "CMPI_RC_ERR_NOT_FOUND");
    EXPECT_EQ(e["message"], "no such Tiny_Thing");
}

TEST(CliErrors, OneLineAndAnExitCodeNeverACrash) {
    struct Case {
        std::vector<std::string> args;
        bool provider;
        int code;
        const char* err;
    };
    const Case cases[] = {
        {{"frobnicate", "X"}, true, 2, "CMPI_RC_ERR_INVALID_PARAMETER: unknown verb 'frobnicate' (see --help)\n"},
        {{}, true, 2, "CMPI_RC_ERR_INVALID_PARAMETER: no verb given (see --help)\n"},
        {{"gi", "Tiny_Thing.Name=\"open"}, true, 2,
         "CMPI_RC_ERR_INVALID_PARAMETER: bad object path: unterminated string value of key Name\n"},
        {{"gi"}, true, 2, "CMPI_RC_ERR_INVALID_PARAMETER: gi needs an object path\n"},
        {{"gi", kAlpha, "extra"}, true, 2, "CMPI_RC_ERR_INVALID_PARAMETER: gi takes one object path\n"},
        {{"--bogus", "gi", kAlpha}, true, 2, "CMPI_RC_ERR_INVALID_PARAMETER: unknown option --bogus\n"},
        {{"-f", "openwbem", "gi", kAlpha}, true, 2,
         "CMPI_RC_ERR_INVALID_PARAMETER: unknown server flavour 'openwbem' (pegasus, sfcb)\n"},
        {{"-p", TINY_GENERIC_PROVIDER, "-n", "Tiny", "gi", kAlpha}, false, 1, nullptr},
        {{"gi", kAlpha}, false, 1, "CMPI_RC_ERR_FAILED: no provider library given (-p FILE)\n"},
        {{"listen", "Tiny_Event", "soon"}, true, 2, "CMPI_RC_ERR_INVALID_PARAMETER: bad number of seconds: soon\n"},
    };
    for (const auto& c : cases) {
        const CliRun r = cli(c.args, c.provider);
        EXPECT_EQ(r.code, c.code) << r.err;
        if (c.err) {
            EXPECT_EQ(r.err, c.err);
        }
        EXPECT_EQ(std::count(r.err.begin(), r.err.end(), '\n'), 1) << r.err;
        EXPECT_EQ(r.err.rfind("CMPI_RC_", 0), 0u) << r.err;
    }
    const CliRun help = cli({"--help"}, false);
    EXPECT_EQ(help.code, 0);
    for (const char* option : {"--json", "--strict", "--flavour"})  // the verbs: cimhost_cli_test.sh
        EXPECT_NE(help.out.find(option), std::string::npos) << option;
}

TEST(CliListen, PrintsTheIndicationsThatArriveInTime) {
    CliRun r = cli({"listen", "root/tiny:Tiny_Event", "2"});
    ASSERT_EQ(r.code, 0) << r.err;
    EXPECT_NE(r.out.find("// indication for root/tiny\ninstance of Tiny_Event {\n    Message = \"tick\";\n    Seq = 1;\n"),
              std::string::npos)
        << r.out;
    EXPECT_NE(r.out.find("Seq = 3;"), std::string::npos);
    EXPECT_EQ(r.out.find("Seq = 99;"), std::string::npos);
    r = cli({"-f", "sfcb", "--json", "listen", "root/tiny:Tiny_Event", "1.5"});
    ASSERT_EQ(r.code, 0) << r.err;
    std::istringstream lines(r.out);
    std::string line;
    int count = 0;
    while (std::getline(lines, line)) {
        const auto j = nlohmann::json::parse(line);
        EXPECT_EQ(j["indication"]["className"], "Tiny_Event");
        EXPECT_EQ(j["deliveredTo"], "root/tiny");
        ++count;
    }
    EXPECT_EQ(count, 4);
}

TEST(CliBatch, ManyOperationsOneLoad) {
    char name[] = "/tmp/cimhost-batch-XXXXXX";
    const int fd = mkstemp(name);
    ASSERT_GE(fd, 0);
    close(fd);
    std::ofstream(name) << "# comment line\n"
                           "\n"
                           "cm 'Tiny_Thing.Name=\"alpha\",Id=1' Generation\n"
                           "ein Tiny_Thing -N root/tiny\n"
                           "gi 'Tiny_Thing.Name=\"gone\",Id=1'\n"
                           "gi \"Tiny_Thing.Name=\\\"beta\\\",Id=2\" -P Count\n"
                           "bogus\n"
                           "reload\n"
                           "cm Tiny_Thing.Name=\\\"alpha\\\",Id=1 Generation\n"
                           "gi 'unterminated\n";
    const CliRun r = cli({"batch", name});
    std::remove(name);
    EXPECT_EQ(r.code, 2);   // the worst line decides
    EXPECT_EQ(r.out,
              "ReturnValue = 1;\n"
              "root/tiny:Tiny_Thing.Name=\"alpha\",Id=1\n"
              "root/tiny:Tiny_Thing.Name=\"beta\",Id=2\n"
              "// root/tiny:Tiny_Thing.Name=\"beta\",Id=2\n"
              "instance of Tiny_Thing {\n    Name = \"beta\";\n    Id = 2;\n    Count = 20;\n};\n"
              "ReturnValue = 1;\n");
    EXPECT_EQ(r.err,
              "CMPI_RC_ERR_NOT_FOUND: no such Tiny_Thing\n"
              "CMPI_RC_ERR_INVALID_PARAMETER: unknown verb 'bogus' (see --help)\n"
              "CMPI_RC_ERR_INVALID_PARAMETER: line 10: unterminated single quote\n");
}

TEST(CliBatch, SplitsWordsLikeAShell) {
    std::vector<std::string> w;
    std::string err;
    ASSERT_TRUE(splitWords("gi 'a \"b\"' \"c \\\"d\\\" \\x\" e\\ f  ", w, err));
    EXPECT_EQ(w, (std::vector<std::string>{"gi", "a \"b\"", "c \"d\" \\x", "e f"}));
    EXPECT_FALSE(splitWords("gi \"open", w, err));
}

}  // namespace
