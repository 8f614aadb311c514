// OxMsgTable.h: the loaded messages of the message subsystem, by number.
//
// The records stay in OxMsg's list in file order; this table stores their
// texts at their size and finds a record by its number. A large message file
// costs about 40 bytes a message besides its text: records come from a pool,
// texts from blocks shared by many, and the index holds the number and the
// list position of each record, sorted by number for a search by halving.
// While a file loads, numbers may come in any order: the index then grows as
// sorted runs of powers of two, merged like the carries of a binary counter,
// so a load of n messages takes O(n log n) whatever the order of the file.
//
//   OxMsgTable table(records);
//   table.add(12, OxMsgTypeError, 0, "Cannot read %s");
//   table.continueText(12, "second line");
//   table.finish();   // "Cannot read %s\n\tsecond line", checked
#ifndef OXBASE_DIAG_DETAIL_OXMSGTABLE_H
#define OXBASE_DIAG_DETAIL_OXMSGTABLE_H

#include "oxbase/core/OxGList.h"

#include <cstddef>
#include <cstdint>
#include <string>
#include <unordered_map>
#include <vector>

struct OxMsgRecord_s;

namespace oxbase {
namespace detail {

class OxMsgTable {
public:
    /// A table that appends its records to `records` and owns them, their
    /// texts and the list's array from then on.
    explicit OxMsgTable(OxGList<OxMsgRecord_s*>& records);
    /// Releases every record and text and empties the list.
    ~OxMsgTable();
    OxMsgTable(const OxMsgTable&) = delete;
    OxMsgTable& operator=(const OxMsgTable&) = delete;

    /// The record of `number`, or null.
    OxMsgRecord_s* find(unsigned int number) const;
    /// Whether a record of `number` exists (added, finished or not).
    bool knows(unsigned int number) const;

    /// A new record for `number`, which the table does not know, with a copy
    /// of `text`, appended to the list. Without memory std::bad_alloc
    /// reaches the caller and the table is as it was.
    void add(unsigned int number, std::uint32_t type, std::int32_t level, const char* text);
    /// Joins "\n\t" and `text` to the text of the known `number`. The joined
    /// text is kept aside and stored at its size by `finish`, so that a long
    /// run of continuation lines costs linear time. False when the number is
    /// unknown; std::bad_alloc without memory, the record unchanged.
    bool continueText(unsigned int number, const char* text);

    /// Ends a load: stores the joined texts, then checks every text added or
    /// changed since the last finish. A %n conversion is made harmless (see
    /// OxMsgFormatDisarm); a text of a number the library logs that does not
    /// fit its arguments (OxMsgLibraryArguments) is replaced by a safe text
    /// that shows the arguments, "Message 566: %s %u %u %s". Each of these is
    /// reported on standard error. Without memory std::bad_alloc reaches the
    /// caller; a text that was to be replaced is then empty, never unsafe.
    void finish();

private:
    struct Entry {
        std::uint32_t number;
        std::uint32_t position; ///< index in the list
    };
    struct Block;
    /// Orders entries by number (a type, so that the searches inline it).
    struct ByNumber {
        bool operator()(const Entry& a, const Entry& b) const { return a.number < b.number; }
    };

    /// Whether `number` may be in the table: false is certain, true is
    /// right but for about one number in sixteen (one bit of a filter of 16
    /// bits a number, hashed). It spares a search of every run for the new
    /// numbers of a load, which are most of them.
    bool mayKnow(unsigned int number) const;
    /// Makes the filter large enough for `numbers` numbers (rebuilt at
    /// twice the size when the table outgrew it).
    void growFilter(std::size_t numbers);
    /// Sets the filter bit of `number`.
    void setFilterBit(unsigned int number);

    /// The position of `number` in the list, or -1.
    long long locate(unsigned int number) const;
    void insert(Entry entry);
    /// Merges the runs into one: a search is then one halving.
    void mergeRuns();
    /// A copy of `length` bytes of `text` and a NUL in the text blocks.
    char* store(const char* text, std::size_t length);
    /// The number of the record at list `position` (a scan: for reports).
    std::uint32_t numberAt(std::uint32_t position) const;
    /// Disarms %n in the text at list `position`, reporting on standard error.
    void disarm(std::uint32_t position);
    /// Replaces the text of `record`, a record of a number the library logs,
    /// when it does not fit the arguments the library passes.
    void checkArguments(unsigned int number, OxMsgRecord_s* record);

    OxGList<OxMsgRecord_s*>& records;
    std::vector<Entry> entries;       ///< sorted runs, largest first
    std::vector<std::size_t> runs;    ///< their sizes, powers of two, decreasing
    std::uint32_t firstUnchecked = 0; ///< list position of the first record of this load
    std::unordered_map<std::uint32_t, std::string> joined; ///< list position to joined text
    std::vector<std::uint64_t> filter;                     ///< see mayKnow
    Block* blocks = nullptr;                               ///< text blocks, newest first
    char* unused = nullptr;                                ///< the free part of the newest block
    std::size_t unusedSize = 0;
};

} // namespace detail
} // namespace oxbase

#endif
