#include "provider_env.h"

#include <dirent.h>
#include <fcntl.h>
#include <netdb.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cstdio>
#include <fstream>
#include <sstream>
#include <thread>

namespace provtest {

const char* const kLogPath = "/opt/Vexlan_Corporation/CNAProviders/log/Vexlan_CNA_Provider.log";

std::string fileText(const std::string& path)
{
    std::ifstream in(path, std::ios::binary);
    std::ostringstream text;
    text << in.rdbuf();
    return text.str();
}

void expectAsKept(const std::string& text, const std::string& path, const char* recordDir)
{
    if (recordDir != nullptr) {
        std::ofstream(std::string(recordDir) + path.substr(path.rfind('/'))) << text;
        return;
    }
    EXPECT_EQ(text, fileText(path)) << path;
}

void replaceAll(std::string& text, const std::string& from, const std::string& to)
{
    if (from.empty())
        return;
    for (size_t at = text.find(from); at != std::string::npos; at = text.find(from, at + to.size()))
        text.replace(at, from.size(), to);
}

void writeFile(const std::string& path, const std::string& text)
{
    std::ofstream out(path, std::ios::trunc);
    out << text;
}

void writeSettings(const std::string& optSettings, const std::string& cwdSettings)
{
    mkdir("/opt/Vexlan_Corporation", 0755);
    mkdir("/opt/Vexlan_Corporation/CNAProviders", 0755);
    mkdir("/opt/Vexlan_Corporation/CNAProviders/log", 0755);
    std::remove("/opt/Vexlan_Corporation/CNAProviders/vexlancna.properties");
    std::remove("vexlancna.properties");
    if (!optSettings.empty())
        writeFile("/opt/Vexlan_Corporation/CNAProviders/vexlancna.properties", optSettings);
    if (!cwdSettings.empty())
        writeFile("vexlancna.properties", cwdSettings);
}

const Planted kPlantedKinds[4] = {Planted::Fifo, Planted::DevZeroLink, Planted::Directory, Planted::Oversize};

void plant(Planted kind, const std::string& path, std::size_t oversizeBytes)
{
    if (std::remove(path.c_str()) != 0)
        rmdir(path.c_str());
    switch (kind) {
    case Planted::Fifo:
        ASSERT_EQ(mkfifo(path.c_str(), 0600), 0) << path;
        break;
    case Planted::DevZeroLink:
        ASSERT_EQ(symlink("/dev/zero", path.c_str()), 0) << path;
        break;
    case Planted::Directory:
        ASSERT_EQ(mkdir(path.c_str(), 0700), 0) << path;
        break;
    case Planted::Oversize: {
        const int fd = open(path.c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0600);
        ASSERT_GE(fd, 0) << path;
        EXPECT_EQ(ftruncate(fd, static_cast<off_t>(oversizeBytes)), 0);
        close(fd);
        break;
    }
    }
}

std::string plantedReason(Planted kind, std::size_t bound)
{
    switch (kind) {
    case Planted::Fifo:
        return "a FIFO, not a regular file";
    case Planted::DevZeroLink:
        return "a character device, not a regular file";
    case Planted::Directory:
        return "a directory, not a regular file";
    case Planted::Oversize:
        return "larger than " + std::to_string(bound) + " bytes";
    }
    return "";
}

const char* plantedName(Planted kind)
{
    static const char* const names[] = {"FIFO", "/dev/zero link", "directory", "over-size file"};
    return names[static_cast<int>(kind)];
}

StderrCapture::StderrCapture() : saved_(dup(2))
{
    char name[] = "/var/tmp/stderr.XXXXXX";
    const int fd = mkstemp(name);
    path_ = name;
    std::fflush(stderr);
    dup2(fd, 2);
    close(fd);
}

StderrCapture::~StderrCapture()
{
    std::fflush(stderr);
    dup2(saved_, 2);
    close(saved_);
    const std::string seen = text();
    std::remove(path_.c_str());
    std::fputs(seen.c_str(), stderr);  // still shown with the test's output
}

std::string StderrCapture::text() const
{
    std::fflush(stderr);
    std::ifstream in(path_);
    std::stringstream s;
    s << in.rdbuf();
    return s.str();
}

void removeLog()
{
    std::remove(kLogPath);
}

std::vector<std::string> logLines()
{
    std::vector<std::string> lines;
    std::ifstream in(kLogPath);
    for (std::string line; std::getline(in, line);)
        lines.push_back(line);
    return lines;
}

int countLog(const std::string& text)
{
    int n = 0;
    for (const auto& line : logLines())
        if (line.find(text) != std::string::npos)
            ++n;
    return n;
}

bool waitForLog(const std::string& text, std::chrono::seconds limit, int occurrences)
{
    auto until = std::chrono::steady_clock::now() + limit;
    while (countLog(text) < occurrences) {
        if (std::chrono::steady_clock::now() > until)
            return false;
        std::this_thread::sleep_for(std::chrono::milliseconds(100));
    }
    return true;
}

void prepareHost(cimhost::Host& host, cimhost::Flavour flavour)
{
    host.setStrict(true);
    host.setFlavour(flavour);
    host.setDefaultNamespace(kNamespace);
    cimhost::Status mof = host.loadMof(VEXLAN_MOF_DIR);
    if (!mof.ok())
        throw std::runtime_error("class definitions: " + mof.message);
    cimhost::Status st = host.load(PROVIDER_LIBRARY, kProviderName);
    if (!st.ok())
        throw std::runtime_error("provider: " + st.message);
}

cimhost::ObjectPath classPath(const std::string& className)
{
    cimhost::ObjectPath p;
    p.nameSpace = kNamespace;
    p.className = className;
    return p;
}

Classes providerClasses(cimhost::Host& host)
{
    Classes out;
    for (const std::string& cls : host.classes().classNames()) {
        const cimhost::ClassDecl* decl = host.classes().find(cls);
        if (cls.rfind("Vexlan", 0) != 0 || decl == nullptr || decl->indication)
            continue;
        (decl->association ? out.associations : out.instances).push_back(cls);
    }
    return out;
}

cimhost::ObjectPath hostPath(const cimhost::Value& name)
{
    cimhost::ObjectPath p = classPath("Vexlan_Adapter_ComputerSystem");
    p.setKey("CreationClassName", cimhost::Value::fromString("Vexlan_Adapter_ComputerSystem"));
    p.setKey("Name", name);
    return p;
}

cimhost::ObjectPath servicePath(bool nic)
{
    const char* cls = nic ? "Vexlan_NIC_SoftwareInstallationService" : "Vexlan_FCHBA_SoftwareInstallationService";
    cimhost::ObjectPath p = classPath(cls);
    p.setKey("SystemCreationClassName", cimhost::Value::fromString("Vexlan_Adapter_ComputerSystem"));
    p.setKey("SystemName", cimhost::Value::fromString(expectedHost().name));
    p.setKey("CreationClassName", cimhost::Value::fromString(cls));
    p.setKey("Name", cimhost::Value::fromString("CNA_SW_INSTALLER"));
    return p;
}

std::uint64_t jobState(cimhost::Host& host, const cimhost::ObjectPath& job)
{
    if (job.className.empty())
        return 0;
    const cimhost::OpResult r = host.getInstance(job);
    const cimhost::Value* state = r.ok() && r.instances.size() == 1 ? r.instances[0].property("JobState") : nullptr;
    return state != nullptr ? state->u : 0;
}

std::uint64_t waitJobState(cimhost::Host& host, const cimhost::ObjectPath& job, std::uint64_t wanted)
{
    std::uint64_t state = jobState(host, job);
    for (int i = 0; i < 200 && state != wanted; ++i) {
        std::this_thread::sleep_for(std::chrono::milliseconds(25));
        state = jobState(host, job);
    }
    return state;
}

ExpectedHost expectedHost()
{
    char name[256] = {};
    gethostname(name, sizeof(name) - 1);
    struct hostent entry;
    struct hostent* result = nullptr;
    std::vector<char> work(65536);
    int err = 0;
    gethostbyname_r(name, &entry, work.data(), work.size(), &result, &err);
    if (result == nullptr || result->h_addr_list[0] == nullptr)
        return {name, "DNSName"};
    const auto* a = reinterpret_cast<const unsigned char*>(result->h_addr_list[0]);
    std::ostringstream text;
    for (int i = 0; i < result->h_length; ++i)
        text << (i ? "." : "") << static_cast<unsigned>(a[i]);
    return {text.str(), "IP"};
}

int threadCount()
{
    // A sanitizer's own helper thread starts with the first thread of the
    // process; one short thread first makes it count from the start.
    static bool warmedUp = [] {
        std::thread([] {}).join();
        return true;
    }();
    (void)warmedUp;
    int n = 0;
    if (DIR* d = opendir("/proc/self/task")) {
        while (dirent* e = readdir(d))
            if (e->d_name[0] != '.')
                ++n;
        closedir(d);
    }
    return n;
}

std::string propertyText(const cimhost::Instance& inst, const std::string& name)
{
    const cimhost::Value* v = inst.property(name);
    return v != nullptr ? v->s : std::string("<absent>");
}

std::vector<std::string> propertyNames(const cimhost::Instance& inst)
{
    std::vector<std::string> names;
    for (const auto& p : inst.properties)
        names.push_back(p.first);
    return names;
}

std::vector<std::string> keyNames(const cimhost::ObjectPath& path)
{
    std::vector<std::string> names;
    for (const auto& k : path.keys)
        names.push_back(k.first);
    return names;
}

const cimhost::Value& scalar(const cimhost::Instance& inst, const std::string& name, cimhost::Type type)
{
    static const cimhost::Value missing;
    const cimhost::Value* v = inst.property(name);
    EXPECT_NE(v, nullptr) << name;
    if (v == nullptr)
        return missing;
    EXPECT_EQ(v->type, type) << name;
    EXPECT_FALSE(v->array) << name;
    return *v;
}

cimhost::OpResult enumerate(cimhost::Host& host, const std::string& className)
{
    cimhost::OpResult r = host.enumerateInstances(classPath(className));
    EXPECT_TRUE(r.ok()) << className << ": " << r.message;
    EXPECT_TRUE(r.strictErrors.empty()) << className << ": " << (r.strictErrors.empty() ? "" : r.strictErrors[0]);
    return r;
}

void startProvider(cimhost::Host& host, const std::string& optSettings, const char* description,
                   const char* firstClass)
{
    writeSettings(optSettings, "");
    removeLog();
    if (description != nullptr)
        ASSERT_EQ(0, zorap_sim_load_json(description));
    else
        ASSERT_EQ(0, zorap_sim_load_default());
    zorap_sim_reset();
    prepareHost(host);
    if (firstClass != nullptr) {
        ASSERT_TRUE(host.enumerateInstanceNames(classPath(firstClass)).ok());
    }
}

}  // namespace provtest
