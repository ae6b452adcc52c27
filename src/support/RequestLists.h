// The rebuilds that requests ask for, once per list and request. A request
// (instance or association operation, under provider_lock) opens a
// RequestScope; within it the first remove and build of a list run, later
// ones of the same list are skipped, so every round and module of the request
// uses the list built for it. Outside a scope (the polling thread, methods)
// every remove and build runs. The lists are told apart by their build
// operation. Everything here is guarded by provider_lock.
#ifndef VEXLAN_SUPPORT_REQUESTLISTS_H
#define VEXLAN_SUPPORT_REQUESTLISTS_H

// The remove and build operations of one list.
struct ListOps {
    void (*remove)();
    void (*build)();
};

class RequestScope {
public:
    RequestScope();
    ~RequestScope();
    RequestScope(const RequestScope&) = delete;
    RequestScope& operator=(const RequestScope&) = delete;
};

namespace requestlists {
// The list's remove, unless the list was built in the current request.
void remove(const ListOps& list);
// The list's build, unless it was built in the current request.
void build(const ListOps& list);
}  // namespace requestlists

#endif
