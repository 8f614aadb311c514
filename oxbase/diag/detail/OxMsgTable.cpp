#include "oxbase/diag/detail/OxMsgTable.h"

#include "oxbase/core/detail/OxSlabPool.h"
#include "oxbase/diag/OxMsg.h"
#include "oxbase/diag/OxMsgNumbers.h"
#include "oxbase/diag/detail/OxMsgFormat.h"

#include <algorithm>
#include <cstdio>
#include <cstring>
#include <iostream>
#include <new>

namespace oxbase {
namespace detail {

namespace {

/// Records cost their 16 bytes and no heap header.
OxSlabPool recordPool(sizeof(OxMsgRecord_s));

/// Texts share blocks of this size; a longer text gets a block of its own.
constexpr std::size_t kBlockSize = 64 * 1024;

/// Filter bits for each number in the table.
constexpr std::size_t kFilterBitsPerNumber = 16;

/// The filter bit of `number` among `bits` (a power of two): Fibonacci
/// hashing spreads neighbouring numbers.
std::size_t filterBit(unsigned int number, std::size_t bits) {
    return static_cast<std::size_t>((static_cast<std::uint64_t>(number) * 0x9E3779B97F4A7C15ull) >>
                                    32) &
           (bits - 1);
}

} // namespace

struct OxMsgTable::Block {
    Block* next;
};

OxMsgTable::OxMsgTable(OxGList<OxMsgRecord_s*>& list) : records(list) {
    runs.reserve(64); // one run for each bit of a count: never more
}

OxMsgTable::~OxMsgTable() {
    for (unsigned int i = 0; i < records.length; i++) {
        records.data[i]->~OxMsgRecord_s();
        recordPool.release(records.data[i]);
    }
    records.makeEmpty();
    while (blocks != nullptr) {
        Block* next = blocks->next;
        delete[] reinterpret_cast<char*>(blocks);
        blocks = next;
    }
}

long long OxMsgTable::locate(unsigned int number) const {
    // Each run is sorted; the runs lie one after the other, largest first.
    const Entry key{number, 0};
    std::size_t start = 0;
    for (std::size_t size : runs) {
        auto first = entries.begin() + static_cast<std::ptrdiff_t>(start);
        auto last = first + static_cast<std::ptrdiff_t>(size);
        auto at = std::lower_bound(first, last, key, ByNumber());
        if (at != last && at->number == number) {
            return at->position;
        }
        start += size;
    }
    return -1;
}

OxMsgRecord_s* OxMsgTable::find(unsigned int number) const {
    long long position = locate(number);
    return position < 0 ? nullptr : records.data[position];
}

bool OxMsgTable::knows(unsigned int number) const {
    return mayKnow(number) && locate(number) >= 0;
}

bool OxMsgTable::mayKnow(unsigned int number) const {
    if (filter.empty()) {
        return !entries.empty();
    }
    std::size_t bit = filterBit(number, filter.size() * 64);
    return (filter[bit / 64] >> (bit % 64) & 1u) != 0;
}

void OxMsgTable::growFilter(std::size_t numbers) {
    std::size_t bits = filter.size() * 64;
    if (bits >= numbers * kFilterBitsPerNumber) {
        return;
    }
    std::size_t grown = bits == 0 ? 1024 : bits;
    while (grown < numbers * kFilterBitsPerNumber * 2) {
        grown *= 2;
    }
    std::vector<std::uint64_t> rebuilt(grown / 64, 0);
    for (const Entry& entry : entries) {
        std::size_t at = filterBit(entry.number, grown);
        rebuilt[at / 64] |= std::uint64_t(1) << (at % 64);
    }
    filter.swap(rebuilt);
}

void OxMsgTable::setFilterBit(unsigned int number) {
    std::size_t at = filterBit(number, filter.size() * 64);
    filter[at / 64] |= std::uint64_t(1) << (at % 64);
}

void OxMsgTable::insert(Entry entry) {
    entries.push_back(entry); // within the capacity add made sure of
    std::size_t size = 1;
    while (!runs.empty() && runs.back() == size) {
        // Two runs of one size become one of twice the size. inplace_merge
        // takes a buffer when it can have one and works in place otherwise.
        auto end = entries.end();
        std::inplace_merge(end - static_cast<std::ptrdiff_t>(2 * size),
                           end - static_cast<std::ptrdiff_t>(size), end, ByNumber());
        runs.pop_back();
        size *= 2;
    }
    runs.push_back(size); // within the capacity reserved at construction
}

void OxMsgTable::mergeRuns() {
    while (runs.size() > 1) {
        std::size_t last = runs.back();
        runs.pop_back();
        std::size_t merged = runs.back() + last;
        runs.back() = merged;
        auto end = entries.end();
        std::inplace_merge(end - static_cast<std::ptrdiff_t>(merged),
                           end - static_cast<std::ptrdiff_t>(last), end, ByNumber());
    }
}

char* OxMsgTable::store(const char* text, std::size_t length) {
    std::size_t need = length + 1;
    if (need > unusedSize) {
        std::size_t size = need > kBlockSize / 4 ? need : kBlockSize;
        char* memory = new char[sizeof(Block) + size];
        Block* block = reinterpret_cast<Block*>(memory);
        char* data = memory + sizeof(Block);
        if (size == need && blocks != nullptr) {
            // A text of its own block goes behind the newest, which keeps
            // its free part for the short texts that follow.
            block->next = blocks->next;
            blocks->next = block;
            std::memcpy(data, text, length);
            data[length] = '\0';
            return data;
        }
        block->next = blocks;
        blocks = block;
        unused = data;
        unusedSize = size;
    }
    char* copy = unused;
    std::memcpy(copy, text, length);
    copy[length] = '\0';
    unused += need;
    unusedSize -= need;
    return copy;
}

void OxMsgTable::add(unsigned int number, std::uint32_t type, std::int32_t level,
                     const char* text) {
    // Every allocation comes first; what follows cannot fail, so a record
    // is in the list and the index, or nowhere.
    records.reserve(records.length + 1);
    if (entries.size() == entries.capacity()) {
        entries.reserve(entries.empty() ? 64 : 2 * entries.size());
    }
    growFilter(entries.size() + 1);
    char* stored = store(text, std::strlen(text));
    void* memory = recordPool.allocate();
    if (memory == nullptr) {
        throw std::bad_alloc();
    }
    auto* record = new (memory) OxMsgRecord_s;
    record->type = type;
    record->level = level;
    record->text = stored;
    std::uint32_t position = records.length;
    records.append(record);
    insert(Entry{number, position});
    setFilterBit(number);
}

bool OxMsgTable::continueText(unsigned int number, const char* text) {
    long long position = locate(number);
    if (position < 0) {
        return false;
    }
    auto found = joined.find(static_cast<std::uint32_t>(position));
    if (found == joined.end()) {
        const char* first = records.data[position]->text;
        found = joined
                    .emplace(static_cast<std::uint32_t>(position),
                             std::string(first != nullptr ? first : ""))
                    .first;
    }
    found->second.append("\n\t").append(text);
    return true;
}

void OxMsgTable::finish() {
    mergeRuns();
    // Texts that continuation lines made longer, then every text of this
    // load, in file order: a %n is made harmless wherever it stands. The
    // joined texts are forgotten on every road out, so that a load cut short
    // leaves nothing half-joined for the next one.
    struct Forget {
        std::unordered_map<std::uint32_t, std::string>& texts;
        ~Forget() { texts.clear(); }
    } forget{joined};
    for (auto& [position, text] : joined) {
        records.data[position]->text = store(text.data(), text.size());
        if (position < firstUnchecked) {
            disarm(position);
        }
    }
    for (std::uint32_t position = firstUnchecked; position < records.length; position++) {
        disarm(position);
    }
    firstUnchecked = records.length;
    // The numbers the library logs: their texts must take its arguments.
    for (unsigned int i = 0, number; (number = OxMsgLibraryNumber(i)) != 0; i++) {
        OxMsgRecord_s* record = find(number);
        if (record != nullptr) {
            checkArguments(number, record);
        }
    }
}

std::uint32_t OxMsgTable::numberAt(std::uint32_t position) const {
    for (const Entry& entry : entries) {
        if (entry.position == position) {
            return entry.number;
        }
    }
    return 0;
}

void OxMsgTable::disarm(std::uint32_t position) {
    if (OxMsgFormatDisarm(records.data[position]->text) > 0) {
        std::cerr << " Message " << numberAt(position)
                  << ": a %n conversion in its text is refused and prints as %p.\n"
                  << std::flush;
    }
}

void OxMsgTable::checkArguments(unsigned int number, OxMsgRecord_s* record) {
    const char* arguments = OxMsgLibraryArguments(number);
    if (OxMsgFormatFits(record->text, arguments)) {
        return;
    }
    std::cerr << " Message " << number
              << ": its text does not fit the arguments the library passes; a safe text is "
                 "used.\n"
              << std::flush;
    // "Message 566: %s %u %u %s" shows what the library passed.
    char safe[64];
    int length = std::snprintf(safe, sizeof safe, "Message %u:", number);
    for (const char* kind = arguments; *kind != '\0' && length + 3 < int(sizeof safe); kind++) {
        length += std::snprintf(safe + length, sizeof safe - static_cast<std::size_t>(length),
                                *kind == 's' ? " %%s" : " %%u");
    }
    try {
        record->text = store(safe, static_cast<std::size_t>(length));
    } catch (const std::bad_alloc&) {
        record->text[0] = '\0'; // no conversion at all reads nothing
        throw;
    }
}

} // namespace detail
} // namespace oxbase
