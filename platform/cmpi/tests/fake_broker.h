// A small in-process CMPI broker for the wrapper's unit tests: strings,
// arrays, object paths, instances (with property filters), args,
// date-times, results, contexts and select expressions, with just the
// behaviour the tests look at.  Objects live until reset().
#ifndef CMPI_TESTS_FAKE_BROKER_H
#define CMPI_TESTS_FAKE_BROKER_H

#include "cmpift.h"

#include <string>
#include <vector>

namespace fake {

// The broker; the same one for the whole test process.
const CMPIBroker* broker();
// Frees every object made so far and forgets delivered indications.
void reset();

// Class hierarchy for classPathIsA: cls is a direct subclass of super.
void addSubclass(const char* cls, const char* super);

// Objects a server would hand to a provider.
CMPIContext* newContext();
CMPIResult* newResult();
CMPISelectExp* newSelectExp(const char* query);

// What a provider sent to a result.
struct ResultItem {
    CMPIData data;  // CMPI_instance, CMPI_ref or a value
};
const std::vector<ResultItem>& resultItems(const CMPIResult* r);
bool resultDone(const CMPIResult* r);

struct Delivered {
    std::string ns;
    const CMPIInstance* instance;
};
std::vector<Delivered> delivered();
int attachedThreads();  // attach calls minus detach calls

// Text of a CMPIString, "" for null.
std::string text(const CMPIString* s);

} // namespace fake

#endif
