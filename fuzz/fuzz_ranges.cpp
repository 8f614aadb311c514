// Range texts: parses the input as range text and checks that every view of
// the parsed list tells the same set of numbers. The set is computed here
// independently from the records (sorted, overlapping and touching ranges
// joined), in 64-bit arithmetic. Checked:
//   - an invalid text leaves an empty list; every record has first <= last;
//   - convertToString gives text that parses to exactly the same records;
//   - isInRange (on an uncompacted list) and the walk getFirstEntry /
//     getNextEntry agree with the set for the first 1,000 members, and the
//     walk ends exactly at the highest member;
//   - negate over the list's own span twice gives the set back (an empty
//     intermediate list gives the whole span: see OxRangeList::negate), and
//     negate over a span taken from the input gives the gaps plus the outer
//     pieces, with sorted, non-overlapping records;
//   - merge with a second list parsed from the input gives the union.
// The input is split at its first NUL byte into the two texts.
#include "OxFuzzSupport.h"

#include "oxbase/ranges/OxRangeList.h"

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <string>
#include <utility>
#include <vector>

namespace {

using Range = std::pair<std::uint64_t, std::uint64_t>; // first, last (closed)
using Set = std::vector<Range>;                        // sorted, disjoint, not touching

/// Joins overlapping and touching ranges of `ranges` into the canonical set.
Set canonical(Set ranges) {
    std::sort(ranges.begin(), ranges.end());
    Set set;
    for (const Range& range : ranges) {
        if (!set.empty() && range.first <= set.back().second + 1) {
            set.back().second = std::max(set.back().second, range.second);
        } else {
            set.push_back(range);
        }
    }
    return set;
}

Set recordsOf(OxRangeList& list) {
    Set records;
    for (unsigned int i = 0; i < list.getLength(); i++) {
        const OxRangeListRecord* record = list[i];
        OXFUZZ_CHECK(record->first <= record->last, "record %u runs backwards: %u-%u", i,
                     record->first, record->last);
        records.emplace_back(record->first, record->last);
    }
    return records;
}

/// The records of a list that negate or merge left compact: sorted, with
/// each `first` above the `last` before it.
Set compactRecordsOf(OxRangeList& list) {
    Set records = recordsOf(list);
    for (size_t i = 1; i < records.size(); i++) {
        OXFUZZ_CHECK(records[i].first > records[i - 1].second,
                     "records %zu and %zu overlap or are out of order", i - 1, i);
    }
    return records;
}

bool contains(const Set& set, std::uint64_t number) {
    auto after = std::upper_bound(set.begin(), set.end(), Range(number, UINT64_MAX));
    return after != set.begin() && std::prev(after)->second >= number;
}

/// The numbers of [from, to] that `set` does not hold.
Set complement(const Set& set, std::uint64_t from, std::uint64_t to) {
    Set pieces;
    std::uint64_t next = from;
    for (const Range& range : set) {
        if (range.first > next && next <= to) {
            pieces.emplace_back(next, std::min(range.first - 1, to));
        }
        next = std::max(next, range.second + 1);
    }
    if (next <= to) {
        pieces.emplace_back(next, to);
    }
    return pieces;
}

std::string spelled(const Set& set) {
    std::string text;
    for (const Range& range : set) {
        text += (text.empty() ? "" : ",") + std::to_string(range.first) + "-" +
                std::to_string(range.second);
    }
    return text;
}

void checkSameSet(const Set& got, const Set& expected, const char* what) {
    OXFUZZ_CHECK(got == expected, "%s: got {%s}, expected {%s}", what, spelled(got).c_str(),
                 spelled(expected).c_str());
}

void checkSpelling(OxRangeList& list, const Set& records) {
    char* text = list.convertToString();
    OXFUZZ_CHECK((text == nullptr) == records.empty(), "convertToString of %zu records gave %s",
                 records.size(), text == nullptr ? "null" : text);
    if (text == nullptr) {
        return;
    }
    OxRangeList again(text, "fuzz");
    OXFUZZ_CHECK(again.isValid(), "the spelling %s does not parse", text);
    Set parsed = recordsOf(again);
    OXFUZZ_CHECK(parsed == records, "the spelling %s parses to {%s}, not {%s}", text,
                 spelled(parsed).c_str(), spelled(records).c_str());
    delete[] text;
}

void checkMembership(OxRangeList& list, const Set& set) {
    // isInRange needs no compaction: ask before anything compacts the list.
    for (const Range& range : set) {
        for (std::uint64_t probe : {range.first, range.second, range.first - 1, range.second + 1}) {
            if (probe <= UINT32_MAX) {
                auto number = static_cast<unsigned int>(probe);
                OXFUZZ_CHECK((list.isInRange(number) == OxTrue) == contains(set, probe),
                             "isInRange(%u) disagrees with {%s}", number, spelled(set).c_str());
            }
        }
    }
}

void checkWalk(OxRangeList& list, const Set& set) {
    unsigned int member = 12345;
    OxBool any = list.getFirstEntry(member);
    OXFUZZ_CHECK((any == OxTrue) == !set.empty(), "getFirstEntry on {%s}", spelled(set).c_str());
    if (any != OxTrue) {
        OXFUZZ_CHECK(member == 0, "getFirstEntry on an empty list set %u", member);
        return;
    }
    OXFUZZ_CHECK(member == set.front().first, "first member %u, expected %llu", member,
                 static_cast<unsigned long long>(set.front().first));
    for (int step = 0; step < 1000; step++) {
        OXFUZZ_CHECK(list.isInRange(member) == OxTrue, "walk member %u is not isInRange", member);
        OXFUZZ_CHECK(contains(set, member), "walk member %u is not in {%s}", member,
                     spelled(set).c_str());
        unsigned int next = list.getNextEntry(member);
        std::uint64_t expected = 0;
        for (const Range& range : set) {
            if (range.second > member) {
                expected = std::max<std::uint64_t>(range.first, member + 1ULL);
                break;
            }
        }
        OXFUZZ_CHECK(next == expected, "getNextEntry(%u) gave %u, expected %llu", member, next,
                     static_cast<unsigned long long>(expected));
        if (next == 0) {
            break;
        }
        if (next != member + 1) {
            OXFUZZ_CHECK(list.isInRange(member + 1) == OxFalse &&
                             list.isInRange(next - 1) == OxFalse,
                         "a number between the members %u and %u is isInRange", member, next);
        }
        member = next;
    }
}

void checkNegate(const char* text, const Set& set, unsigned int from, unsigned int to) {
    if (set.empty()) {
        return;
    }
    // Twice over the list's own span: the complement of the complement.
    OxRangeList twice(text, "fuzz");
    auto low = static_cast<unsigned int>(set.front().first);
    auto high = static_cast<unsigned int>(set.back().second);
    OXFUZZ_CHECK(twice.negate(low, high) == OxTrue, "negate(%u, %u)", low, high);
    checkSameSet(canonical(compactRecordsOf(twice)), complement(set, low, high),
                 "negate over the own span");
    OXFUZZ_CHECK(twice.negate(low, high) == OxTrue, "second negate(%u, %u)", low, high);
    checkSameSet(canonical(compactRecordsOf(twice)), set, "negate twice over the own span");

    // Over any span: the gaps stay whole, the span only adds the outer pieces.
    OxRangeList once(text, "fuzz");
    OxBool done = once.negate(from, to);
    OXFUZZ_CHECK((done == OxTrue) == (from <= to), "negate(%u, %u) answered %d", from, to, done);
    if (done != OxTrue) {
        checkSameSet(canonical(recordsOf(once)), set, "a refused negate changed the list");
        return;
    }
    Set expected = complement(set, set.front().first, set.back().second);
    if (from < set.front().first) {
        expected.emplace_back(from, set.front().first - 1);
    }
    if (to > set.back().second) {
        expected.emplace_back(set.back().second + 1, to);
    }
    checkSameSet(canonical(compactRecordsOf(once)), canonical(expected), "negate(from, to)");
}

void checkMerge(const char* text, const char* otherText, const Set& set) {
    OxRangeList list(text, "fuzz");
    OxRangeList other(otherText, nullptr);
    Set otherRecords = recordsOf(other);
    list.merge(other);
    OXFUZZ_CHECK(recordsOf(other) == otherRecords, "merge changed the merged list");
    Set both = set;
    both.insert(both.end(), otherRecords.begin(), otherRecords.end());
    checkSameSet(canonical(compactRecordsOf(list)), canonical(both), "merge");
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, size_t size) {
    oxfuzz::startMessages();
    std::string input(reinterpret_cast<const char*>(data), size);
    size_t nul = input.find('\0');
    std::string text = input.substr(0, nul);
    std::string otherText = nul == std::string::npos ? std::string() : input.substr(nul + 1);
    otherText = otherText.substr(0, otherText.find('\0'));

    OxRangeList list(text.c_str(), "fuzz");
    Set records = recordsOf(list);
    if (list.isValid() != OxTrue) {
        OXFUZZ_CHECK(records.empty(), "an invalid text left %zu records", records.size());
        return 0;
    }
    Set set = canonical(records);
    checkMembership(list, set);
    checkSpelling(list, records);
    checkWalk(list, set);

    // The span of the second negate: two numbers from the input's last bytes.
    unsigned int from = 0;
    unsigned int to = 0;
    if (size >= 8) {
        std::memcpy(&from, data + size - 8, 4);
        std::memcpy(&to, data + size - 4, 4);
    }
    checkNegate(text.c_str(), set, from, to);
    checkMerge(text.c_str(), otherText.c_str(), set);
    return 0;
}
