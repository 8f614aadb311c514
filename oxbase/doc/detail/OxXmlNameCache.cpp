// OxXmlNameCache.cpp: the name cache of the XML reader (OxXmlReader.h).
#include "oxbase/core/detail/OxNoMemory.h"
#include "oxbase/doc/detail/OxXmlNames.h"
#include "oxbase/doc/detail/OxXmlReader.h"

#include <cstdint>
#include <cstring>
#include <memory>
#include <new>

namespace oxbase {
namespace detail {

namespace {
/// The bits of the first n characters of a text loaded as a 64-bit number,
/// n below 8, whatever the byte order.
struct HeadMasks {
    std::uint64_t of[8] = {};
    HeadMasks() {
        for (unsigned int n = 0; n < 8; n++) {
            unsigned char bytes[8] = {};
            for (unsigned int i = 0; i < n; i++) {
                bytes[i] = 0xFF;
            }
            std::memcpy(&of[n], bytes, sizeof bytes);
        }
    }
    std::uint64_t operator[](size_t n) const { return of[n]; }
};
const HeadMasks kHeadMask;
} // namespace

OxXmlReader::NameCache::~NameCache() {
    for (Entry& entry : slots) {
        delete[] entry.raw;
        OxXmlNames::release(entry.shared);
    }
}

char const* OxXmlReader::NameCache::lookup(char const* text, size_t length) {
    if (length == 0) {
        return nullptr;
    }
    // The first eight characters as a number: with the length it picks the
    // slot and tells most names apart without a comparison of texts.
    // (The line source keeps eight readable bytes behind every line.)
    std::uint64_t key = 0;
    std::memcpy(&key, text, sizeof key);
    if (length < 8) {
        key &= kHeadMask[length];
    }
    Entry& entry = slots[(((key ^ length) * 0x9E3779B97F4A7C15ULL) >> 56) % kSlots];
    // (An empty entry has the length 0, which no name has.)
    if (entry.key == key && entry.length == length &&
        (length <= 8 || std::memcmp(entry.raw + 8, text + 8, length - 8) == 0)) {
        return entry.shared;
    }
    return fill(entry, text, length, key);
}

char const* OxXmlReader::NameCache::fill(Entry& entry, char const* text, size_t length,
                                         std::uint64_t key) {
    // A new name: its shared text and a copy of the raw text first, so that
    // the entry is replaced only when both are there.
    std::unique_ptr<char[]> raw(new char[length]);
    std::memcpy(raw.get(), text, length);
    char const* shared = OxXmlNames::acquire(text, length);
    if (!withMemory([&] { store.holdName(shared); })) {
        OxXmlNames::release(shared);
        throw std::bad_alloc();
    }
    delete[] entry.raw;
    OxXmlNames::release(entry.shared);
    entry.raw = raw.release();
    entry.key = key;
    entry.length = length;
    entry.shared = shared;
    return shared;
}

} // namespace detail
} // namespace oxbase
