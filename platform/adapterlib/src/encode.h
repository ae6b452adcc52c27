// Encoding of the host model into the contract's records and byte streams.
#pragma once

#include <deque>
#include <memory>
#include <string>
#include <vector>

#include "model.h"
#include "zorap_cna.h"

namespace zorap_sim {

// One adapter tree (main or backup).  All records live in deques, whose
// elements never move, so the pointers between them stay valid for the life
// of the tree.
struct Tree {
    _zorap_adapter_list_t header{};
    std::deque<_zorap_adapter_t> adapters;
    std::deque<_zorap_phy_port_list_t> portLists;
    std::deque<_zorap_phy_port_t> ports;
    std::deque<_zorap_protocol_list_t> protocolLists;
    std::deque<_zorap_protocol_t> protocols;
    std::deque<_zorap_target_t> targets;
    std::deque<_zorap_lun_t> luns;
};

std::unique_ptr<Tree> buildTree(const Host& host);

// Tagged VPD stream: 0x82 product identifier, 0x90 read-only keywords with
// RV checksum, 0x91 writable (Y*) keywords with RW, 0x78 end.
std::vector<uint8_t> encodeVpd(const Adapter& adapter);

// Transceiver pages A0 (bytes 0..255) and A2 (256..511).
constexpr size_t kTransceiverPagesSize = 512;
void encodeTransceiverPages(const Transceiver& t, uint8_t* out512);

// "V:%d.%02d.%02d,D:%02d%02d%4d,A:Y,T:M"
std::string mbiVersionString(const Mbi& mbi);

// Size of the IP properties block with its three arrays, and its encoding
// into a zeroed block of that size (the arrays follow the record).
size_t ipPropertiesBlockSize(const NicFunction& nic);
void encodeIpProperties(const NicFunction& nic, void* block);

void encodeFcoeLinkage(const FcoeLink& link, _zorap_fcoe_linkage_t* out);
void encodeLinkProperties(const NicFunction& nic, _zorap_link_properties_t* out);
void encodePortProperty(const FcFunction& fc, _zorap_port_property_t* out);
void encodeFcStats(const FcFunction& fc, _tagZORAPSDMDevice* device);

// Bounded text copy into a fixed char array, always NUL terminated.
template <size_t N>
void copyText(char (&dst)[N], const std::string& src) {
    size_t n = src.size() < N - 1 ? src.size() : N - 1;
    src.copy(dst, n);
    dst[n] = '\0';
}

}  // namespace zorap_sim
