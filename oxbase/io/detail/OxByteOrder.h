// OxByteOrder.h: the byte reversal behind the library's big-endian layout.
//
// Internal to the stream classes (OxInput, OxOutput, OxMemory). Values are
// moved through fixed-width unsigned integers with memcpy, so no object is
// ever read through a pointer of another type, and the shifts below compile
// to a single byte-swap instruction on the usual compilers.
//
//   std::uint32_t bits; std::memcpy(&bits, bytes, 4);
//   float value = OxByteOrder::toFloat(OxByteOrder::swap32(bits));
#ifndef OXBASE_IO_DETAIL_OXBYTEORDER_H
#define OXBASE_IO_DETAIL_OXBYTEORDER_H

#include <cstddef>
#include <cstdint>
#include <cstring>

namespace oxbase {
namespace detail {

namespace OxByteOrder {

inline std::uint16_t swap16(std::uint16_t v) {
    return static_cast<std::uint16_t>((v >> 8) | (v << 8));
}

inline std::uint32_t swap32(std::uint32_t v) {
    return ((v & 0x000000ffu) << 24) | ((v & 0x0000ff00u) << 8) | ((v & 0x00ff0000u) >> 8) |
           ((v & 0xff000000u) >> 24);
}

inline std::uint64_t swap64(std::uint64_t v) {
    return (static_cast<std::uint64_t>(swap32(static_cast<std::uint32_t>(v))) << 32) |
           swap32(static_cast<std::uint32_t>(v >> 32));
}

/// The bytes at `bytes` as an unsigned integer of type T, in host order.
template <typename T> inline T load(const unsigned char* bytes) {
    T value;
    std::memcpy(&value, bytes, sizeof value);
    return value;
}

/// `value` stored at `bytes` as it is in memory.
template <typename T> inline void store(unsigned char* bytes, T value) {
    std::memcpy(bytes, &value, sizeof value);
}

/// The value of type To with the bit pattern of `from` (same size).
template <typename To, typename From> inline To bitCast(From from) {
    static_assert(sizeof(To) == sizeof(From), "bitCast needs equal sizes");
    To to;
    std::memcpy(&to, &from, sizeof to);
    return to;
}

/// The unsigned integer of a size, for swapping a value of that size.
template <std::size_t Size> struct UnsignedOfSize;
template <> struct UnsignedOfSize<1> { using type = std::uint8_t; };
template <> struct UnsignedOfSize<2> { using type = std::uint16_t; };
template <> struct UnsignedOfSize<4> { using type = std::uint32_t; };
template <> struct UnsignedOfSize<8> { using type = std::uint64_t; };

inline std::uint8_t swap(std::uint8_t v) {
    return v;
}
inline std::uint16_t swap(std::uint16_t v) {
    return swap16(v);
}
inline std::uint32_t swap(std::uint32_t v) {
    return swap32(v);
}
inline std::uint64_t swap(std::uint64_t v) {
    return swap64(v);
}

/// The value of type T stored big-endian at `bytes` (sizeof(T) bytes).
template <typename T> inline T fromBigEndian(const unsigned char* bytes) {
    using Bits = typename UnsignedOfSize<sizeof(T)>::type;
    return bitCast<T>(swap(load<Bits>(bytes)));
}

/// Stores `value` big-endian at `bytes` (sizeof(T) bytes).
template <typename T> inline void toBigEndian(unsigned char* bytes, T value) {
    using Bits = typename UnsignedOfSize<sizeof(T)>::type;
    store(bytes, swap(bitCast<Bits>(value)));
}

} // namespace OxByteOrder

} // namespace detail
} // namespace oxbase

#endif
