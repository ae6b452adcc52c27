// Text, number and network address conversions.
#ifndef VEXLAN_SUPPORT_VEXLAN_NIC_UTILS_H
#define VEXLAN_SUPPORT_VEXLAN_NIC_UTILS_H

#include <cstddef>
#include <cstdint>

// Output sizes, terminating zero included.
constexpr std::size_t kLluTextSize = 21;   // llutoa: 20 digits
constexpr std::size_t kUTextSize = 11;     // utoa: 10 digits
constexpr std::size_t kMacTextSize = 13;   // macaddrToStr: 12 hex digits
constexpr std::size_t kIPv4TextSize = 16;  // "255.255.255.255"
constexpr std::size_t kIPv6TextSize = 40;  // eight groups of four and seven ":"
constexpr std::size_t kIPTextSize = 128;   // nicadapter_IPToStr's buffer

// Cut blanks and tabs in place: from the end, from the start, or both.
// A null pointer is left alone.
void RTrim(char* text);
void LTrim(char* text);
void Trim(char* text);

// Read an unsigned number with sscanf; `value` keeps its old value when
// nothing can be read.
void atollu(char const* text, unsigned long long* value);
void atou(char const* text, unsigned int* value);

// Write an unsigned number in decimal; `text` must hold kLluTextSize and
// kUTextSize bytes respectively.
void llutoa(unsigned long long value, char* text);
void utoa(unsigned int value, char* text);

// The six bytes of a MAC address (an adapter library `_zorap_macaddr`) as
// twelve upper-case hex digits. With a null `text` the result goes to a buffer
// of the function that lives until the next call on the same thread.
// `text` must hold kMacTextSize bytes. Returns the text.
char* macaddrToStr(void const* mac, char* text);

// "%02X" of each of `count` bytes, with `separator` between them unless it
// is '\0'; `text` must hold 2 * count + 1 bytes, and count - 1 more with a
// separator. Returns the text.
char* hexBytesText(unsigned char const* bytes, int count, char separator, char* text);

// Four address bytes as "a.b.c.d"; `text` must hold kIPv4TextSize bytes.
void IPv4addToStr(void const* address, char* text);

// Copies at most size-1 bytes and always terminates. Returns the number of
// bytes copied; 0 for a null pointer or a size of 0.
std::size_t safeStrCpy(char* target, char const* source, std::size_t size);

// Size of a file; 0 for a null path or a file that can't be examined.
std::uint64_t GetFileSize(char const* path);

// Sum of the numbers of a version text split at " .\t\n". A sum of 0 (or no
// number at all) means "no version": the text is then overwritten with "N/A",
// so it must be a buffer of at least 4 bytes, and the result is 0.
long getVersion(char* text);

// Copies the letters, digits, white space and punctuation of `source` into
// `target` (at most targetSize-1 of them, terminated), skipping one leading
// white-space character. Returns 0, or -1 for a null or empty source, a null
// target or a targetSize of 0.
int CleanStr(char const* source, char* target, std::size_t targetSize);

// IPv6 address text of 16 bytes, in eight groups of two bytes. The longest
// run of all-zero groups (the first of equal runs, a single group included)
// is written as "::". With `full`, every written group has four digits.
// `text` must hold kIPv6TextSize bytes.
void ipv6addr_build_ipv6_str_compact(unsigned char const* address, bool full, char* text);

// Address text by family: 4 for IPv4, 6 for IPv6; any other family is taken
// as IPv4 when bytes 4 to 15 are zero, else as IPv6. `text` must hold
// kIPv6TextSize bytes.
void nicadapter_IPaddToStr(unsigned char const* address, char* text, int family);

// Text of an adapter library address record (`_zorap_ipaddr`, 24 bytes:
// address in bytes 0 to 15, family in byte 16, 1 for IPv4 and 2 for IPv6).
// Other families and a null pointer give "". The text lives in a buffer of the
// function until the next call on the same thread.
char* nicadapter_IPToStr(void const* address);

#endif
