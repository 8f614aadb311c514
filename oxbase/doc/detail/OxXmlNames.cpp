#include "oxbase/doc/detail/OxXmlNames.h"

#include <cctype>
#include <cstdint>
#include <cstring>
#include <memory>
#include <new>

namespace oxbase {
namespace detail {

namespace {

/// A shared text: its header, then the characters and a terminating zero.
struct NameEntry {
    std::size_t users;
    std::size_t hash;
    std::size_t length;
    char* text() { return reinterpret_cast<char*>(this + 1); }
};

/// Open addressing with linear probing; capacity 0 or a power of two, at
/// most half full. Removal shifts the following entries back, so a probe
/// stops at the first free slot.
struct NameTable {
    NameEntry** slots;
    std::size_t capacity;
    std::size_t used;
};

NameTable table = {nullptr, 0, 0};

constexpr std::size_t kFirstCapacity = 64;

std::size_t hashOf(char const* text, std::size_t length) {
    std::uint64_t hash = 14695981039346656037ULL; // FNV-1a
    for (std::size_t i = 0; i < length; i++) {
        hash ^= static_cast<unsigned char>(text[i]);
        hash *= 1099511628211ULL;
    }
    return static_cast<std::size_t>(hash);
}

void placeEntry(NameEntry** slots, std::size_t capacity, NameEntry* entry) {
    std::size_t mask = capacity - 1;
    std::size_t slot = entry->hash & mask;
    while (slots[slot] != nullptr) {
        slot = (slot + 1) & mask;
    }
    slots[slot] = entry;
}

void resize(std::size_t capacity) {
    NameEntry** slots = nullptr;
    if (capacity > 0) {
        slots = new NameEntry*[capacity]();
        for (std::size_t i = 0; i < table.capacity; i++) {
            if (table.slots[i] != nullptr) {
                placeEntry(slots, capacity, table.slots[i]);
            }
        }
    }
    delete[] table.slots;
    table.slots = slots;
    table.capacity = capacity;
}

} // namespace

char const* OxXmlNames::acquire(char const* text) {
    if (text == nullptr) {
        return nullptr;
    }
    return acquire(text, std::strlen(text));
}

char const* OxXmlNames::acquire(char const* text, std::size_t length) {
    if (text == nullptr || length == 0) {
        return nullptr;
    }
    while (length > 0 && isWhite(*text)) {
        text++;
        length--;
    }
    while (length > 0 && isWhite(text[length - 1])) {
        length--;
    }
    std::size_t hash = hashOf(text, length);
    std::size_t mask = table.capacity - 1;
    for (std::size_t slot = hash & mask; table.capacity > 0 && table.slots[slot] != nullptr;
         slot = (slot + 1) & mask) {
        NameEntry* entry = table.slots[slot];
        if (entry->hash == hash && entry->length == length &&
            std::memcmp(entry->text(), text, length) == 0) {
            entry->users++;
            return entry->text();
        }
    }
    // The entry first, the table's growth second: without memory for either,
    // the table stays as it was.
    std::unique_ptr<char[]> memory(new char[sizeof(NameEntry) + length + 1]);
    if (2 * (table.used + 1) > table.capacity) {
        resize(table.capacity == 0 ? kFirstCapacity : 2 * table.capacity);
    }
    auto* entry = new (memory.release()) NameEntry{1, hash, length};
    std::memcpy(entry->text(), text, length);
    entry->text()[length] = '\0';
    placeEntry(table.slots, table.capacity, entry);
    table.used++;
    return entry->text();
}

char const* OxXmlNames::share(char const* name) {
    if (name != nullptr) {
        auto* entry = reinterpret_cast<NameEntry*>(const_cast<char*>(name) - sizeof(NameEntry));
        entry->users++;
    }
    return name;
}

void OxXmlNames::release(char const* name) {
    if (name == nullptr) {
        return;
    }
    // The header sits right before the text (see acquire).
    auto* entry = reinterpret_cast<NameEntry*>(const_cast<char*>(name) - sizeof(NameEntry));
    if (--entry->users > 0) {
        return;
    }
    std::size_t mask = table.capacity - 1;
    std::size_t slot = entry->hash & mask;
    while (table.slots[slot] != entry) {
        slot = (slot + 1) & mask;
    }
    // Backward shift: move each following entry of the cluster into the hole
    // when its home slot does not lie between the hole and its place.
    std::size_t hole = slot;
    for (std::size_t next = (hole + 1) & mask; table.slots[next] != nullptr;
         next = (next + 1) & mask) {
        std::size_t home = table.slots[next]->hash & mask;
        bool homeInRange =
            hole <= next ? (hole < home && home <= next) : (hole < home || home <= next);
        if (!homeInRange) {
            table.slots[hole] = table.slots[next];
            hole = next;
        }
    }
    table.slots[hole] = nullptr;
    table.used--;
    delete[] reinterpret_cast<char*>(entry);
    if (table.used == 0) {
        resize(0);
    }
}

std::size_t OxXmlNames::count() {
    return table.used;
}

} // namespace detail
} // namespace oxbase
