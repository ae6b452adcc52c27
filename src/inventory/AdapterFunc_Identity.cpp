// Product identity: branded models, 11S product IDs, the UUID-shaped tag.
#include "inventory/AdapterFunc_Identity.h"

#include <strings.h>

#include <cstdio>
#include <cstring>

#include "support/Vexlan_NIC_Utils.h"

namespace {

// Room of each function's result buffer.
constexpr std::size_t kIdentityTextSize = 256;

// Models sold under the partner's brand.
char const* const kBrandedModels[] = {"KMX3101", "KMX3102", "KMX3103", "KMX3104"};

// An 11S product ID: "11S", the seven-character part number, the serial.
constexpr std::size_t kProductIdLength = 22;
constexpr char kProductIdPrefix[] = "11S";
constexpr std::size_t kPartNumberStart = 3;
constexpr std::size_t kPartNumberLength = 7;
constexpr std::size_t kSerialStart = 10;

// Digit places of the UUID text, as many as 16 serial characters fill.
constexpr char kEmptyUuid[] = "00000000-0000-0000-0000-000000000000";
constexpr std::size_t kUuidSerialCharacters = 16;

}  // namespace

int IsIBMBrandedAdapter(char* model) {
    if (model == nullptr) return 0;
    for (char const* branded : kBrandedModels)
        if (strcasecmp(model, branded) == 0) return 1;
    return 0;
}

int IsIBM11SProductId(char* id) {
    if (id == nullptr) return 0;
    Trim(id);
    return std::strlen(id) == kProductIdLength &&
           std::strncmp(id, kProductIdPrefix, sizeof kProductIdPrefix - 1) == 0;
}

char* GetSerialNumberFromIBM11SProductId(char const* id) {
    static thread_local char szProductId[kIdentityTextSize];
    safeStrCpy(szProductId, id != nullptr ? id : "", sizeof szProductId);
    if (IsIBM11SProductId(szProductId))
        std::memmove(szProductId, szProductId + kSerialStart, kProductIdLength - kSerialStart + 1);
    return szProductId;
}

char* GetPartNumberFromIBM11SProductId(char* id) {
    static thread_local char szProductId[kIdentityTextSize];
    if (!IsIBM11SProductId(id)) return nullptr;
    std::memcpy(szProductId, id + kPartNumberStart, kPartNumberLength);
    szProductId[kPartNumberLength] = '\0';
    return szProductId;
}

char* ConvertSerialNumberToUUID(char* serial) {
    static thread_local char sOutput[sizeof kEmptyUuid] = "00000000-0000-0000-0000-000000000000";
    if (serial == nullptr) return sOutput;

    std::size_t place = 0;
    for (std::size_t i = 0; i < kUuidSerialCharacters && serial[i] != '\0'; ++i) {
        // A character is printed as a signed byte, so one above 0x7F gives
        // "FFFFFFxx", of which the first two digits are used.
        char digits[16];
        std::snprintf(digits, sizeof digits, "%02X",
                      static_cast<unsigned int>(static_cast<int>(static_cast<signed char>(serial[i]))));
        for (int d = 0; d < 2; ++d) {
            if (sOutput[place] == '-') ++place;
            sOutput[place++] = digits[d];
        }
    }
    return sOutput;
}

char* GetPhysicalPackageTag(char* id) {
    static thread_local char szTag[kIdentityTextSize];
    char* uuid = IsIBM11SProductId(id) ? ConvertSerialNumberToUUID(GetSerialNumberFromIBM11SProductId(id))
                                       : ConvertSerialNumberToUUID(id);
    safeStrCpy(szTag, uuid, sizeof szTag);
    return szTag;
}
