#include "oxbase/diag/OxMsgTable.h"

#include "oxbase/core/OxSlabPool.h"
#include "oxbase/diag/OxMsg.h"
#include "oxbase/diag/OxMsgFormat.h"
#include "oxbase/diag/OxMsgNumbers.h"

#include <algorithm>
#include <cstring>
#include <iostream>
#include <new>

namespace {

/// Records cost their 16 bytes and no heap header.
OxSlabPool recordPool(sizeof(OxMsgRecord_s));

/// Texts share blocks of this size; a longer text gets a block of its own.
constexpr std::size_t kBlockSize = 64 * 1024;

} // namespace

bool OxMsgTable::byNumber(const Entry& a, const Entry& b) {
    return a.number < b.number;
}

struct OxMsgTable::Block {
    Block* next;
};

OxMsgTable::OxMsgTable(OxGList<OxMsgRecord_s*>& list) : records(list) {}

OxMsgTable::~OxMsgTable() {
    for (unsigned int i = 0; i < records.length; i++) {
        records.data[i]->~OxMsgRecord_s();
        recordPool.release(records.data[i]);
    }
    records.makeEmpty();
    while (blocks != nullptr) {
        Block* next = blocks->next;
        ::operator delete(blocks, std::nothrow);
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
        auto at = std::lower_bound(first, last, key, byNumber);
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
    return locate(number) >= 0;
}

void OxMsgTable::insert(Entry entry) {
    entries.push_back(entry);
    std::size_t size = 1;
    while (!runs.empty() && runs.back() == size) {
        // Two runs of one size become one of twice the size. inplace_merge
        // takes a buffer when it can have one and works in place otherwise.
        auto end = entries.end();
        std::inplace_merge(end - static_cast<std::ptrdiff_t>(2 * size),
                           end - static_cast<std::ptrdiff_t>(size), end, byNumber);
        runs.pop_back();
        size *= 2;
    }
    runs.push_back(size);
}

void OxMsgTable::mergeRuns() {
    while (runs.size() > 1) {
        std::size_t last = runs.back();
        runs.pop_back();
        std::size_t merged = runs.back() + last;
        runs.back() = merged;
        auto end = entries.end();
        std::inplace_merge(end - static_cast<std::ptrdiff_t>(merged),
                           end - static_cast<std::ptrdiff_t>(last), end, byNumber);
    }
}

char* OxMsgTable::store(const char* text, std::size_t length) {
    std::size_t need = length + 1;
    if (need > unusedSize) {
        std::size_t size = need > kBlockSize / 4 ? need : kBlockSize;
        void* memory = ::operator new(sizeof(Block) + size, std::nothrow);
        if (memory == nullptr) {
            return nullptr;
        }
        Block* block = static_cast<Block*>(memory);
        char* data = static_cast<char*>(memory) + sizeof(Block);
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

bool OxMsgTable::add(unsigned int number, std::uint32_t type, std::int32_t level,
                     const char* text) {
    void* memory = recordPool.allocate();
    if (memory == nullptr) {
        return false;
    }
    auto* record = new (memory) OxMsgRecord_s;
    record->type = type;
    record->level = level;
    record->text = store(text, std::strlen(text));
    unsigned int position = records.length;
    if (record->text == nullptr) {
        recordPool.release(record);
        return false;
    }
    try {
        records.append(record);
        insert(Entry{number, position});
    } catch (const std::bad_alloc&) {
        records.length = position;
        recordPool.release(record);
        return false;
    }
    return true;
}

bool OxMsgTable::continueText(unsigned int number, const char* text) {
    long long position = locate(number);
    if (position < 0) {
        return false;
    }
    try {
        auto found = joined.find(static_cast<std::uint32_t>(position));
        if (found == joined.end()) {
            const char* first = records.data[position]->text;
            found = joined
                        .emplace(static_cast<std::uint32_t>(position),
                                 std::string(first != nullptr ? first : ""))
                        .first;
        }
        found->second.append("\n\t").append(text);
    } catch (const std::bad_alloc&) {
        return false;
    }
    return true;
}

bool OxMsgTable::finish() {
    bool complete = true;
    mergeRuns();
    for (const Entry& entry : entries) {
        OxMsgRecord_s* record = records.data[entry.position];
        auto found = joined.find(entry.position);
        if (found != joined.end()) {
            char* text = store(found->second.data(), found->second.size());
            if (text != nullptr) {
                record->text = text;
            } else {
                complete = false;
            }
        } else if (entry.position < firstUnchecked) {
            continue; // checked by an earlier load and not changed since
        }
        try {
            complete = check(entry.number, record) && complete;
        } catch (const std::bad_alloc&) {
            // No memory for the report or the safe text: a text with no
            // conversion reads nothing and is always safe.
            record->text[0] = '\0';
            complete = false;
        }
    }
    joined.clear();
    firstUnchecked = records.length;
    return complete;
}

bool OxMsgTable::check(unsigned int number, OxMsgRecord_s* record) {
    if (OxMsgFormatDisarm(record->text) > 0) {
        std::cerr << " Message " << number
                  << ": a %n conversion in its text is refused and prints as %p.\n"
                  << std::flush;
    }
    const char* arguments = OxMsgLibraryArguments(number);
    if (arguments == nullptr || OxMsgFormatFits(record->text, arguments)) {
        return true;
    }
    std::cerr << " Message " << number
              << ": its text does not fit the arguments the library passes; a safe text is "
                 "used.\n"
              << std::flush;
    std::string safe = "Message " + std::to_string(number) + ":";
    for (const char* kind = arguments; *kind != '\0'; kind++) {
        safe += *kind == 's' ? " %s" : " %u";
    }
    char* text = store(safe.data(), safe.size());
    if (text == nullptr) {
        record->text[0] = '\0'; // no conversion at all reads nothing
        return false;
    }
    record->text = text;
    return true;
}
