#include "provider/ClassTests.h"

#include <cctype>
#include <mutex>
#include <unordered_map>

namespace {

std::mutex g_lock;

// The library's unload code may run the provider's cleanup after the
// library's other objects are gone; the kept answers say when they are.
bool g_answersGone = false;
struct Answers {
    std::unordered_map<std::string, bool> map;
    ~Answers() { g_answersGone = true; }
} g_answers;

std::unordered_map<std::string, bool>& answers()
{
    return g_answers.map;
}

void appendLower(std::string& key, const char* text)
{
    for (; *text != '\0'; ++text)
        key += static_cast<char>(std::tolower(static_cast<unsigned char>(*text)));
    key += '\x1f';
}

// The key's namespace and class part, or "" when either is missing.
std::string prefixOf(const char* ns, const char* cls)
{
    std::string key;
    if (ns == nullptr || cls == nullptr)
        return key;
    appendLower(key, ns);
    appendLower(key, cls);
    return key;
}

const char* pathText(const CmpiObjectPath& path, CMPIString* (*get)(const CMPIObjectPath*, CMPIStatus*))
{
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIString* s = get(path.getEnc(), &rc);
    if (rc.rc != CMPI_RC_OK || s == nullptr)
        return nullptr;
    return s->ft->getCharPtr(s, nullptr);
}

// The kept answer of `key` + `tested`, or the one `ask` gives, then kept.
template <class Ask>
bool answer(const std::string& prefix, const char* tested, Ask&& ask)
{
    if (prefix.empty() || tested == nullptr || g_answersGone)
        return ask();
    std::string key = prefix;
    appendLower(key, tested);
    {
        std::lock_guard<std::mutex> guard(g_lock);
        const auto it = answers().find(key);
        if (it != answers().end())
            return it->second;
    }
    const bool is = ask();
    std::lock_guard<std::mutex> guard(g_lock);
    answers().emplace(std::move(key), is);
    return is;
}

}  // namespace

PathClassTests::PathClassTests(const CmpiObjectPath& path) : path_(path)
{
    if (path.getEnc() != nullptr)
        prefix_ = prefixOf(pathText(path, path.getEnc()->ft->getNameSpace),
                           pathText(path, path.getEnc()->ft->getClassName));
}

bool PathClassTests::isA(const char* cls) const
{
    return answer(prefix_, cls, [&] { return path_.classPathIsA(cls); });
}

namespace classtests {

bool isA(const CmpiObjectPath& path, const char* cls)
{
    return PathClassTests(path).isA(cls);
}

bool classIsA(const char* ns, const char* cls, const char* ancestor)
{
    return answer(prefixOf(ns, cls), ancestor, [&] { return CmpiObjectPath(ns, cls).classPathIsA(ancestor); });
}

void forget()
{
    std::lock_guard<std::mutex> guard(g_lock);
    if (!g_answersGone)
        answers().clear();
}

}  // namespace classtests
