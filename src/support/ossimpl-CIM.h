// Host services that requests of the CIM model need: the host's name as the
// resolver tells it, and the login check of system users.
#ifndef VEXLAN_SUPPORT_OSSIMPL_CIM_H
#define VEXLAN_SUPPORT_OSSIMPL_CIM_H

#include <cstddef>

struct spwd;

// What GetHostName found, in its `kind` output.
enum {
    HOST_NAME_KIND_NAME = 2,   // the name did not resolve: the plain host name
    HOST_NAME_KIND_IPV4 = 4,   // the first address, "%u.%u.%u.%u"
    HOST_NAME_KIND_IPV6 = 6    // a six-byte address, "%u.%u.%u.%u.%u.%u"
};

constexpr std::size_t kHostNameBufferSize = 256;

// The host's name by gethostname, at most 255 characters, always terminated;
// empty when it fails. `buffer` must hold kHostNameBufferSize bytes.
void GetHostName2(char* buffer);

// The host as the rest of the model names it: the first address of the host's
// name in dotted form when the resolver knows it, else the plain name. An
// entry with an address of another length gives "Unknown IP" and leaves
// `kind` unchanged. The text is cut to size-1 characters.
void GetHostName(char* buffer, int* kind, std::size_t size = kHostNameBufferSize);

// Login check of a system user: shadow entry, password, and membership in the
// member list of group "adm" or "root". 0 when all hold, else -1.
int OSSValidateSystemUser(char const* name, char const* password);
int ValidateSystemUserPassword(struct spwd const* entry, char const* password);
int ValidateSystemUserGroup(struct spwd const* entry);
int ValidateSystemUserGroupType(struct spwd const* entry, char const* group);

#endif
