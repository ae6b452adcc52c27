// The association dispatch of the provider: m_assocLookupTable, one row per
// end of every association class (the class that may stand at that end and
// the association class), FC rows first.
#ifndef VEXLAN_ASSOCIATIONS_ASSOCDISPATCH_H
#define VEXLAN_ASSOCIATIONS_ASSOCDISPATCH_H

#include <cstddef>

struct AssocLookupRow {
    const char* sourceClass;
    const char* assocClass;
};

// The rows of m_assocLookupTable; `count` is m_assocLookupTableSize.
const AssocLookupRow* assocLookupTable(std::size_t& count);

#endif
