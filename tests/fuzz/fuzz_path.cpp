// Any bytes as the object path and value texts that cimhost's commands and
// batch lines take. The first byte chooses the class repository (none, or the
// provider's classes, which type the keys), the value's type and whether it
// is an array; the rest is the text. A path or value read is written out
// again, and that text must read back to the same text.
#include <cstdint>
#include <cstdlib>
#include <string>

#include "cimhost/repository.h"
#include "cimhost/text.h"

namespace {

const cimhost::ClassRepository* classes() {
    static const cimhost::ClassRepository* repo = [] {
        auto* r = new cimhost::ClassRepository;
        std::string error;
        if (!r->loadPath(VEXLAN_MOF_DIR, error)) {
            std::fprintf(stderr, "fuzz_path: class definitions: %s\n", error.c_str());
            std::abort();
        }
        return r;
    }();
    return repo;
}

const cimhost::Type kTypes[] = {
    cimhost::Type::Boolean, cimhost::Type::Char16, cimhost::Type::Real32,   cimhost::Type::Real64,
    cimhost::Type::UInt8,   cimhost::Type::UInt16, cimhost::Type::UInt32,   cimhost::Type::UInt64,
    cimhost::Type::SInt8,   cimhost::Type::SInt16, cimhost::Type::SInt32,   cimhost::Type::SInt64,
    cimhost::Type::String,  cimhost::Type::DateTime, cimhost::Type::Reference, cimhost::Type::Instance,
};

bool hasReal(const cimhost::ObjectPath& p);

// A real key anywhere in a value: its own, or one inside a reference.
bool hasReal(const cimhost::Value& v) {
    if (v.type == cimhost::Type::Real32 || v.type == cimhost::Type::Real64) return true;
    if (v.ref && hasReal(*v.ref)) return true;
    for (const cimhost::Value& e : v.elems)
        if (hasReal(e)) return true;
    return false;
}

bool hasReal(const cimhost::ObjectPath& p) {
    for (const auto& k : p.keys)
        if (hasReal(k.second)) return true;
    return false;
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
    classes();
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    if (size == 0) return 0;
    const std::uint8_t mode = data[0];
    const std::string text(reinterpret_cast<const char*>(data + 1), size - 1);
    const cimhost::ClassRepository* repo = (mode & 1) ? classes() : nullptr;
    const std::string ns = "root/vexlan_cmpi";

    cimhost::ObjectPath path;
    std::string error;
    if (cimhost::parsePath(text, path, error, repo, ns)) {
        const std::string once = cimhost::formatPath(path);
        cimhost::ObjectPath again;
        if (!cimhost::parsePath(once, again, error, repo, ns) || again.keys.size() != path.keys.size())
            __builtin_trap();
        // A real key without a declaration is written as "%.17g", which
        // reads back as an integer when it has no fraction ("1", "-0"): such
        // a path (or a reference to one) need only read back.
        if (!hasReal(path) && cimhost::formatPath(again) != once) __builtin_trap();
    }

    const cimhost::Type type = kTypes[(mode >> 1) % (sizeof kTypes / sizeof kTypes[0])];
    const bool array = (mode & 0x80) != 0;
    cimhost::Value value;
    if (cimhost::parseValueText(text, type, array, value, error, repo, ns)) {
        const std::string once = cimhost::formatValue(value);
        cimhost::Value again;
        if (!cimhost::parseValueText(once, type, array, again, error, repo, ns) ||
            (!hasReal(value) && cimhost::formatValue(again) != once))
            __builtin_trap();
    }
    return 0;
}
