// The class tests of dispatch (instance and method routes, the association
// gate, chain and rounds, the modules' role and result class tests), asked of
// the broker once per provider life and kept. The provider's classes and
// their parents cannot change without a new registration, which loads the
// provider again; the kept answers are forgotten at its cleanup.
//
// Answers are kept by namespace, class of the path and tested class, all
// without regard to case. A broker call that fails throws as
// CmpiObjectPath::classPathIsA does, and nothing is kept for it.
#ifndef VEXLAN_SUPPORT_CLASSTESTS_H
#define VEXLAN_SUPPORT_CLASSTESTS_H

#include <memory>

#include "CmpiImpl.h"

namespace classtests {
struct KeptAnswers;
}

// The tests of one path: its namespace and class are read and looked up once.
class PathClassTests {
public:
    explicit PathClassTests(const CmpiObjectPath& path);
    // classPathIsA(cls) of the path.
    bool isA(const char* cls) const;
    // The same for a class named by a table of the provider or a literal: a
    // text that never changes, whose address is kept as its name.
    bool isAFixed(const char* cls) const;

private:
    const CmpiObjectPath& path_;
    std::shared_ptr<classtests::KeptAnswers> kept_;   // null when the path's names are unreadable
};

namespace classtests {
// classPathIsA(cls) of `path`, `cls` a fixed text as for isAFixed.
bool isAFixed(const CmpiObjectPath& path, const char* cls);
// Whether the class `cls` of namespace `ns` is `ancestor` or derives from it
// (classPathIsA of a path of that class).
bool classIsA(const char* ns, const char* cls, const char* ancestor);
// Forgets every kept answer (the provider's cleanup).
void forget();
}  // namespace classtests

#endif
