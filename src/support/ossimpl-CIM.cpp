#include "support/ossimpl-CIM.h"

#include "support/Vexlan_FC_Utils_CMPI.h"
#include "support/Vexlan_NIC_Utils.h"

#include <crypt.h>
#include <grp.h>
#include <netdb.h>
#include <shadow.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>

namespace {

// Work area of the reentrant resolver and account calls: 1 KiB at first,
// doubled on each grow() up to 1 MiB. grow() is false when out of room or
// memory, so a look-up fails instead of throwing.
class WorkBuffer {
public:
    WorkBuffer() = default;
    ~WorkBuffer() { std::free(data_); }
    WorkBuffer(WorkBuffer const&) = delete;
    WorkBuffer& operator=(WorkBuffer const&) = delete;

    bool grow() {
        std::size_t next = size_ == 0 ? 1024 : size_ * 2;
        if (next > (std::size_t{1} << 20)) return false;
        char* bigger = static_cast<char*>(std::realloc(data_, next));
        if (bigger == nullptr) return false;
        data_ = bigger;
        size_ = next;
        return true;
    }
    char* data() { return data_; }
    std::size_t size() const { return size_; }

private:
    char* data_ = nullptr;
    std::size_t size_ = 0;
};

}  // namespace

void GetHostName2(char* buffer) {
    if (buffer == nullptr) return;
    std::memset(buffer, 0, kHostNameBufferSize);
    if (gethostname(buffer, kHostNameBufferSize - 1) != 0) {
        buffer[0] = '\0';
        if (g_EnableDebugPrint) Vexlan_FC_Utils_CMPI::DebugPrint("gethostname() failed\n");
    }
    buffer[kHostNameBufferSize - 1] = '\0';
}

void GetHostName(char* buffer, int* kind, std::size_t size) {
    if (buffer == nullptr || size == 0) return;
    char name[kHostNameBufferSize];
    GetHostName2(name);

    // The reentrant form of the resolver's gethostbyname: requests, the
    // polling thread and flash workers may ask at the same time.
    struct hostent entry;
    struct hostent* found = nullptr;
    int resolverError = 0;
    WorkBuffer work;
    while (work.grow() &&
           gethostbyname_r(name, &entry, work.data(), work.size(), &found, &resolverError) == ERANGE) {
        found = nullptr;
    }

    if (found == nullptr) {
        safeStrCpy(buffer, name, size);
        if (kind != nullptr) *kind = HOST_NAME_KIND_NAME;
        return;
    }

    char text[kHostNameBufferSize] = "Unknown IP";
    char const* address = found->h_addr_list != nullptr ? found->h_addr_list[0] : nullptr;
    auto const* b = reinterpret_cast<unsigned char const*>(address);
    if (b != nullptr && found->h_length == 4) {
        std::snprintf(text, sizeof text, "%u.%u.%u.%u", b[0], b[1], b[2], b[3]);
        if (kind != nullptr) *kind = HOST_NAME_KIND_IPV4;
    } else if (b != nullptr && found->h_length == 6) {
        std::snprintf(text, sizeof text, "%u.%u.%u.%u.%u.%u", b[0], b[1], b[2], b[3], b[4], b[5]);
        if (kind != nullptr) *kind = HOST_NAME_KIND_IPV6;
    }
    safeStrCpy(buffer, text, size);
}

namespace {

// Reentrant look-ups with a work buffer that grows on ERANGE.
template <typename Record, typename Lookup>
bool lookUp(Record& record, WorkBuffer& work, Lookup lookup) {
    while (work.grow()) {
        Record* found = nullptr;
        int result = lookup(&record, work.data(), work.size(), &found);
        if (result != ERANGE) return result == 0 && found != nullptr;
    }
    return false;
}

}  // namespace

int ValidateSystemUserPassword(struct spwd const* entry, char const* password) {
    if (entry == nullptr || password == nullptr) return -1;
    char const* stored = entry->sp_pwdp != nullptr ? entry->sp_pwdp : "";

    // crypt_r with a private work area: crypt's static result is shared by
    // all threads of the process.
    auto* data = static_cast<struct crypt_data*>(std::calloc(1, sizeof(struct crypt_data)));
    if (data == nullptr) return -1;
    char const* hashed = crypt_r(password, stored[0] != '\0' ? stored : "kq", data);
    int result = (hashed != nullptr && std::strcmp(hashed, stored) == 0) ? 0 : -1;
    std::free(data);
    return result;
}

int ValidateSystemUserGroupType(struct spwd const* entry, char const* group) {
    if (entry == nullptr || group == nullptr || entry->sp_namp == nullptr) return -1;

    struct group record;
    WorkBuffer work;
    bool found = lookUp(record, work, [group](struct group* r, char* b, std::size_t n, struct group** out) {
        return getgrnam_r(group, r, b, n, out);
    });
    if (!found) {
        if (g_EnableDebugPrint) Vexlan_FC_Utils_CMPI::DebugPrint("ERROR - %s group  does not exist", group);
        return -1;
    }
    for (char** member = record.gr_mem; member != nullptr && *member != nullptr; ++member) {
        if (std::strcmp(*member, entry->sp_namp) == 0) return 0;
    }
    if (g_EnableDebugPrint) Vexlan_FC_Utils_CMPI::DebugPrint("ERROR - User is not of the %s group", group);
    return -1;
}

int ValidateSystemUserGroup(struct spwd const* entry) {
    if (ValidateSystemUserGroupType(entry, "adm") == 0) return 0;
    if (ValidateSystemUserGroupType(entry, "root") == 0) return 0;
    return -1;
}

int OSSValidateSystemUser(char const* name, char const* password) {
    if (name == nullptr) return -1;

    setspent();
    int result = 0;
    struct spwd entry;
    WorkBuffer work;
    bool found = lookUp(entry, work, [name](struct spwd* r, char* b, std::size_t n, struct spwd** out) {
        return getspnam_r(name, r, b, n, out);
    });
    if (!found) {
        if (g_EnableDebugPrint) Vexlan_FC_Utils_CMPI::DebugPrint("Invalid User Login");
        result = -1;
    } else if (ValidateSystemUserPassword(&entry, password) != 0) {
        if (g_EnableDebugPrint) Vexlan_FC_Utils_CMPI::DebugPrint("Invalid User Password");
        result = -1;
    } else if (ValidateSystemUserGroup(&entry) != 0) {
        if (g_EnableDebugPrint) Vexlan_FC_Utils_CMPI::DebugPrint("Invalid User not in adm or root groups");
        result = -1;
    }
    endspent();
    return result;
}
