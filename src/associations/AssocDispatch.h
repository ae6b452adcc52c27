// The association dispatch: the four association operations of the
// provider, each under provider_lock from its first step to its last, and
// m_assocLookupTable, one row per end of every association class (the class
// that may stand at that end and the association class), FC rows first.
#ifndef VEXLAN_ASSOCIATIONS_ASSOCDISPATCH_H
#define VEXLAN_ASSOCIATIONS_ASSOCDISPATCH_H

#include <cstddef>

#include "CmpiImpl.h"

struct AssocLookupRow {
    const char* sourceClass;
    const char* assocClass;
};

// The rows of m_assocLookupTable; `count` is m_assocLookupTableSize.
const AssocLookupRow* assocLookupTable(std::size_t& count);

namespace assocdispatch {
CmpiStatus associators(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& op, const char* assocClass,
                       const char* resultClass, const char* role, const char* resultRole, const char** properties);
CmpiStatus associatorNames(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& op,
                           const char* assocClass, const char* resultClass, const char* role, const char* resultRole);
CmpiStatus references(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& op, const char* resultClass,
                      const char* role, const char** properties);
CmpiStatus referenceNames(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& op,
                          const char* resultClass, const char* role);
}  // namespace assocdispatch

#endif
