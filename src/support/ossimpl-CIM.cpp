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
#include <memory>
#include <vector>

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
    std::vector<char> work(1024);
    while (gethostbyname_r(name, &entry, work.data(), work.size(), &found, &resolverError) == ERANGE &&
           work.size() < 65536) {
        work.resize(work.size() * 2);
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
bool lookUp(Record& record, std::vector<char>& work, Lookup lookup) {
    work.resize(1024);
    for (;;) {
        Record* found = nullptr;
        int result = lookup(&record, work.data(), work.size(), &found);
        if (result == ERANGE && work.size() < (1u << 20)) {
            work.resize(work.size() * 2);
            continue;
        }
        return result == 0 && found != nullptr;
    }
}

}  // namespace

int ValidateSystemUserPassword(struct spwd const* entry, char const* password) {
    if (entry == nullptr || password == nullptr) return -1;
    char const* stored = entry->sp_pwdp != nullptr ? entry->sp_pwdp : "";

    // crypt_r with a private work area: crypt's static result is shared by
    // all threads of the process.
    auto data = std::make_unique<struct crypt_data>();
    std::memset(data.get(), 0, sizeof(struct crypt_data));
    char const* hashed = crypt_r(password, stored[0] != '\0' ? stored : "kq", data.get());
    if (hashed == nullptr) return -1;
    return std::strcmp(hashed, stored) == 0 ? 0 : -1;
}

int ValidateSystemUserGroupType(struct spwd const* entry, char const* group) {
    if (entry == nullptr || group == nullptr || entry->sp_namp == nullptr) return -1;

    struct group record;
    std::vector<char> work;
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
    std::vector<char> work;
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
