// CIM text forms: object paths ("//host/root/ns:Class.Key=\"v\",N=5"),
// key and argument literals, and MOF instance output.
#pragma once

#include <string>

#include "cimhost/repository.h"
#include "cimhost/value.h"

namespace cimhost {

// Parses an object path. Accepted forms:
//   [//host/][namespace:]Class[.Key=value[,Key=value...]]   and   [...]Class=@
// A value is a double-quoted string (\" and \\ escaped), TRUE/FALSE, or a
// number. When the class is in `repo`, each key is typed from its
// declaration (integers, booleans, datetimes, and references whose quoted text
// is itself a path). Without a declaration, quoted values are strings,
// unquoted ones booleans or integers (sint64 when negative, uint64 otherwise)
// or real64. `defaultNs` fills an absent namespace.
bool parsePath(const std::string& text, ObjectPath& out, std::string& error,
               const ClassRepository* repo = nullptr, const std::string& defaultNs = std::string());

// Canonical text of a path, the inverse of parsePath.
std::string formatPath(const ObjectPath& p);

// Quotes a string with \" and \\ escaped.
std::string quote(const std::string& s);

// Converts the text of a command line value to a typed value: NULL, a quoted
// or bare string, a number, TRUE/FALSE, a datetime text, a path (reference),
// or an array "{v1,v2,...}".
bool parseValueText(const std::string& text, Type type, bool array, Value& out, std::string& error,
                    const ClassRepository* repo = nullptr, const std::string& defaultNs = std::string());

// A value as a MOF literal: "text", 42, TRUE, NULL, {1, 2}, a quoted path.
std::string formatValue(const Value& v);

// MOF instance syntax:
//   instance of Class {
//       Prop = "v";
//   };
std::string formatInstanceMof(const Instance& inst, int indent = 0);

}  // namespace cimhost
