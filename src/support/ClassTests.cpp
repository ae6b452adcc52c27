#include "support/ClassTests.h"

#include <cctype>
#include <mutex>
#include <string>
#include <unordered_map>

namespace classtests {
// The answers for one class of one namespace, by tested class: by its text
// (lower case) and, for fixed texts, by its address.
struct KeptAnswers {
    std::unordered_map<std::string, bool> byText;
    std::unordered_map<const char*, bool> byAddress;
};
}  // namespace classtests

namespace {

using classtests::KeptAnswers;

std::mutex g_lock;

// At most this many classes, and answers per class, are kept (the provider's
// classes and the parents it tests are some two hundred).
constexpr std::size_t kKeptPerClass = 1024;

// The library's unload code may run the provider's cleanup after the
// library's other objects are gone; the kept answers say when they are.
bool g_answersGone = false;
struct Answers {
    std::unordered_map<std::string, std::shared_ptr<KeptAnswers>> byClass;
    ~Answers() { g_answersGone = true; }
} g_answers;

std::string lower(const char* text)
{
    std::string out(text);
    for (char& c : out)
        c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    return out;
}

// The answers of class `cls` in namespace `ns`; null when either is missing.
std::shared_ptr<KeptAnswers> answersOf(const char* ns, const char* cls)
{
    if (ns == nullptr || cls == nullptr || g_answersGone)
        return nullptr;
    const std::string key = lower(ns) + '\x1f' + lower(cls);
    std::lock_guard<std::mutex> guard(g_lock);
    const auto it = g_answers.byClass.find(key);
    if (it != g_answers.byClass.end())
        return it->second;
    // Past the bound a request's class is tested without keeping answers.
    if (g_answers.byClass.size() >= kKeptPerClass)
        return nullptr;
    auto kept = std::make_shared<KeptAnswers>();
    g_answers.byClass.emplace(key, kept);
    return kept;
}

const char* pathText(const CmpiObjectPath& path, CMPIString* (*get)(const CMPIObjectPath*, CMPIStatus*))
{
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIString* s = get(path.getEnc(), &rc);
    if (rc.rc != CMPI_RC_OK || s == nullptr)
        return nullptr;
    return s->ft->getCharPtr(s, nullptr);
}

// The kept answer for `key` in `table`, or the one `ask` gives, then kept.
template <class Map, class Ask>
bool answer(Map& table, const typename Map::key_type& key, Ask&& ask)
{
    {
        std::lock_guard<std::mutex> guard(g_lock);
        const auto it = table.find(key);
        if (it != table.end())
            return it->second;
    }
    const bool is = ask();
    std::lock_guard<std::mutex> guard(g_lock);
    // Texts from clients (an association's class names) are kept too; a
    // client that sends ever new ones is answered without keeping them.
    if (table.size() < kKeptPerClass)
        table.emplace(key, is);
    return is;
}

}  // namespace

PathClassTests::PathClassTests(const CmpiObjectPath& path) : path_(path)
{
    if (path.getEnc() != nullptr)
        kept_ = answersOf(pathText(path, path.getEnc()->ft->getNameSpace),
                          pathText(path, path.getEnc()->ft->getClassName));
}

bool PathClassTests::isA(const char* cls) const
{
    if (!kept_ || cls == nullptr)
        return path_.classPathIsA(cls);
    return answer(kept_->byText, lower(cls), [&] { return path_.classPathIsA(cls); });
}

bool PathClassTests::isAFixed(const char* cls) const
{
    if (!kept_ || cls == nullptr)
        return path_.classPathIsA(cls);
    return answer(kept_->byAddress, cls, [&] { return isA(cls); });
}

namespace classtests {

bool isAFixed(const CmpiObjectPath& path, const char* cls)
{
    return PathClassTests(path).isAFixed(cls);
}

bool classIsA(const char* ns, const char* cls, const char* ancestor)
{
    const std::shared_ptr<KeptAnswers> kept = answersOf(ns, cls);
    auto ask = [&] { return CmpiObjectPath(ns, cls).classPathIsA(ancestor); };
    if (!kept || ancestor == nullptr)
        return ask();
    return answer(kept->byText, lower(ancestor), ask);
}

void forget()
{
    std::lock_guard<std::mutex> guard(g_lock);
    if (!g_answersGone)
        g_answers.byClass.clear();
}

}  // namespace classtests
