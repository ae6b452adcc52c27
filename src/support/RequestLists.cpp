#include "support/RequestLists.h"

#include <cstdint>
#include <vector>

namespace {

std::uint64_t g_lastRequest = 0;
std::uint64_t g_currentRequest = 0;   // 0: no request open

struct BuiltList {
    void (*build)();
    std::uint64_t request;   // the request that built it last
};
std::vector<BuiltList> g_built;

BuiltList* entryOf(void (*build)())
{
    for (BuiltList& b : g_built)
        if (b.build == build)
            return &b;
    return nullptr;
}

bool builtInThisRequest(const ListOps& list)
{
    const BuiltList* b = g_currentRequest != 0 ? entryOf(list.build) : nullptr;
    return b != nullptr && b->request == g_currentRequest;
}

}  // namespace

RequestScope::RequestScope()
{
    g_currentRequest = ++g_lastRequest;
}

RequestScope::~RequestScope()
{
    g_currentRequest = 0;
}

namespace requestlists {

void remove(const ListOps& list)
{
    if (!builtInThisRequest(list))
        list.remove();
}

void build(const ListOps& list)
{
    if (builtInThisRequest(list))
        return;
    list.build();
    if (g_currentRequest == 0)
        return;
    if (BuiltList* b = entryOf(list.build))
        b->request = g_currentRequest;
    else
        g_built.push_back({list.build, g_currentRequest});
}

}  // namespace requestlists
