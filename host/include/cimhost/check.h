// Strict checks of instances and paths against the classes read from MOF,
// as the host applies them in strict mode. Each returns an empty text when
// the value conforms, else one line that names class and property.
#pragma once

#include <string>

#include "cimhost/repository.h"
#include "cimhost/value.h"

namespace cimhost {

// Class declared; each property declared (when the whole superclass chain is
// in the MOF) with its type; every Key property set and not null.
std::string checkInstance(const ClassRepository& repo, const Instance& inst);
// Class declared; every key of the class present and typed, no other keys.
std::string checkPath(const ClassRepository& repo, const ObjectPath& p);
// `v` against a declaration; `what` starts the message.
std::string checkValueType(const std::string& what, Type declared, bool declArray, bool embedded, const Value& v);

}  // namespace cimhost
