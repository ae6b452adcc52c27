// CIM data model of the embedded host: typed values, object paths and
// instances as plain C++ values. The CMPI encapsulated types of the broker are
// thin handles over these, and the command line prints them.
#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace cimhost {

// CIM type codes. The numbers are the CMPI type codes, so a CMPIType converts
// without a table.
enum class Type : std::uint16_t {
    Null = 0,
    Boolean = 0x0002,
    Char16 = 0x0003,
    Real32 = 0x0008,
    Real64 = 0x000C,
    UInt8 = 0x0080,
    UInt16 = 0x0090,
    UInt32 = 0x00A0,
    UInt64 = 0x00B0,
    SInt8 = 0x00C0,
    SInt16 = 0x00D0,
    SInt32 = 0x00E0,
    SInt64 = 0x00F0,
    Instance = 0x1000,
    Reference = 0x1100,
    String = 0x1600,
    DateTime = 0x1800,
};
constexpr std::uint16_t kArrayFlag = 0x2000;

// CIM name of a scalar type ("uint16", "string", "reference", ...).
const char* typeName(Type t);
// Inverse of typeName for MOF data type keywords; false if unknown.
bool typeFromName(const std::string& name, Type& out);
bool isUnsigned(Type t);
bool isSigned(Type t);
inline bool isInteger(Type t) { return isUnsigned(t) || isSigned(t); }

// A CIM datetime: an absolute point (microseconds since 1970-01-01 UTC, with
// the UTC offset in minutes that its text form carries) or an interval
// (microseconds).
struct DateTime {
    std::uint64_t usec = 0;
    bool interval = false;
    int utcOffsetMinutes = 0;

    // 25-character CIM text form: "yyyymmddhhmmss.mmmmmmsutc" or
    // "ddddddddhhmmss.mmmmmm:000".
    std::string toText() const;
    static std::optional<DateTime> fromText(const std::string& text);
    static DateTime now();
    bool operator==(const DateTime& o) const {
        return usec == o.usec && interval == o.interval && utcOffsetMinutes == o.utcOffsetMinutes;
    }
};

struct ObjectPath;
struct Instance;

// One typed CIM value, possibly null, possibly an array.
struct Value {
    Type type = Type::Null;
    bool array = false;
    bool null = true;

    bool b = false;
    std::uint64_t u = 0;     // unsigned integers and char16
    std::int64_t i = 0;      // signed integers
    double d = 0;            // real32, real64
    std::string s;           // string
    DateTime dt;             // datetime
    std::shared_ptr<ObjectPath> ref;   // reference
    std::shared_ptr<Instance> inst;    // embedded instance
    std::vector<Value> elems;          // array elements (scalars of `type`)
    // A uint8 array may keep its elements here instead, one byte each (an
    // image of megabytes would not fit as Values); elems is then empty.
    std::shared_ptr<const std::vector<std::uint8_t>> bytes;

    static Value nullOf(Type t, bool isArray = false);
    static Value fromString(std::string v);
    static Value fromBool(bool v);
    static Value fromUnsigned(Type t, std::uint64_t v);
    static Value fromSigned(Type t, std::int64_t v);
    static Value fromReal(Type t, double v);
    static Value fromDateTime(const DateTime& v);
    static Value fromRef(const ObjectPath& p);
    static Value fromInstance(const Instance& i);
    static Value arrayOf(Type t, std::vector<Value> elems);
    static Value byteArray(std::vector<std::uint8_t> bytes);

    // Elements of an array value, whichever way they are kept.
    std::size_t arraySize() const { return bytes ? bytes->size() : elems.size(); }
    Value element(std::size_t k) const;

    // Type code as CMPI sees it (array flag included).
    std::uint16_t typeCode() const {
        return static_cast<std::uint16_t>(static_cast<std::uint16_t>(type) | (array ? kArrayFlag : 0));
    }
    bool operator==(const Value& o) const;
    bool operator!=(const Value& o) const { return !(*this == o); }
};

using NamedValue = std::pair<std::string, Value>;

// Case-insensitive comparison of CIM names.
bool namesEqual(const std::string& a, const std::string& b);

// A list of named values (keys, properties, arguments, context entries):
// the value of a name, compared case-insensitively, or null; and setting a
// name, in place when it is there, appended when not.
const Value* findNamed(const std::vector<NamedValue>& list, const std::string& name);
void setNamed(std::vector<NamedValue>& list, const std::string& name, Value v);

// A CIM object path: host, namespace, class and keys in the order given.
struct ObjectPath {
    std::string host;
    std::string nameSpace;
    std::string className;
    std::vector<NamedValue> keys;

    const Value* key(const std::string& name) const;
    void setKey(const std::string& name, Value v);
    bool operator==(const ObjectPath& o) const;
};

// A CIM instance: class, namespace, path keys as set by the provider and
// properties in the order the provider set them.
struct Instance {
    ObjectPath path;   // className and nameSpace of the instance, keys if any
    std::vector<NamedValue> properties;

    const Value* property(const std::string& name) const;
    // Replaces a property of the same name (in place) or appends it.
    void setProperty(const std::string& name, Value v);
    const std::string& className() const { return path.className; }
};

}  // namespace cimhost
