// OxRangeList.h: sets of unsigned 32-bit numbers held as closed ranges.
//
// An OxRangeList parses range text such as "1-5,9,12-20", or is built from a
// plain list of numbers. It answers membership, walks its members in
// ascending order, merges another set in and forms the complement within a
// span.
//
//   OxRangeList pages("1-3,10-12", "page");
//   unsigned int n;
//   if (pages.getFirstEntry(n)) do { print(n); } while ((n = pages.getNextEntry(n)) != 0);
//
// Range text: a series of ranges, each a number or two numbers joined by "-"
// with nothing between them. One "," or one blank ends a range, and white
// space may follow before the next one. A blank in front of a "," is a syntax
// error (the blank ends the range, the "," starts none), as is a tab behind a
// number; line ends count as blanks. Numbers are decimal, computed in 32-bit
// unsigned arithmetic: too many digits wrap around without a report.
//
// A separator as the very last character ("1,2,") ends the parse with the
// range in front of it not stored: "1,2," holds the number 1 alone and is
// valid. Strip such a separator first for the other reading.
//
// The list is not safe for concurrent use: even the walking operations may
// compact (sort and merge) the records.
#ifndef OXBASE_RANGES_OXRANGELIST_H
#define OXBASE_RANGES_OXRANGELIST_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/core/OxGBinaryTree.h"
#include "oxbase/core/OxGList.h"
#include "oxbase/core/OxTypes.h"

/// One closed range; `first` <= `last` in every stored record.
struct OxRangeListRecord {
    unsigned int first = 0;
    unsigned int last = 0;
};

/// The list owns its records: they are deleted when they leave it and by the
/// destructor. Records keep the order in which they came until sort or compact
/// runs; a list that is not compact may hold overlapping and repeated records.
class OXBASE_API OxRangeList : public OxGList<OxRangeListRecord*> {
public:
    /// An empty list; isValid() is OxFalse.
    OxRangeList();
    /// Parses `text`. A syntax error logs message 293 (type word, position,
    /// text), a range that runs backwards message 294 (type word, first,
    /// last); either leaves an empty, invalid list. Null or empty text gives an
    /// invalid empty list, white space alone a valid empty one. `typeName` is
    /// the word for the messages; null means "integer".
    OxRangeList(char const* text, char const* typeName);
    /// Sorts `numbers` and removes its repeats, in the caller's list, then
    /// parses its range spelling ({7, 1, 2, 3, 3} is "1-3,7"). An empty
    /// `numbers` gives a valid empty list.
    OxRangeList(OxGList<unsigned int>& numbers, char const* typeName);
    /// Releases the records and a tree that exists.
    ~OxRangeList() override;

    OxRangeList(const OxRangeList&) = delete;
    OxRangeList& operator=(const OxRangeList&) = delete;

    /// Whether the text was accepted.
    OxBool isValid() const { return valid; }

    /// Orders the records by `first`, keeping the order of records with equal
    /// `first`. The list counts as not compact afterwards.
    void sort();
    /// Sorts, then merges each record whose `first` is at or below the `last`
    /// of the run before it into that run. Touching ranges stay apart:
    /// "1-3,4-6" stays two records, "1-3,3-6" becomes "1-6".
    void compact();
    /// Appends a copy of each record of `other` (which stays unchanged), then
    /// compacts. Without memory for a copy the merge stops there, with
    /// message 228; what was merged before stays.
    void merge(OxRangeList& other);
    /// Replaces the list by the numbers of `from`..`to` it does not hold: the
    /// gaps between its records, whole, plus the piece from `from` up to the
    /// lowest member and the piece behind the highest member up to `to`. The
    /// span adds pieces, it clips nothing: "1-3,10-12,20-22" with (11, 15)
    /// gives "4-9,13-19". An empty list gives the whole span. OxFalse, with
    /// nothing changed, when `from` is above `to` or a record cannot be
    /// allocated (message 228).
    OxBool negate(unsigned int from, unsigned int to);
    /// Whether some record holds `number`; needs no compaction.
    OxBool isInRange(unsigned int number) const;
    /// Compacts if needed. OxFalse with `number` 0 for an empty list; else
    /// `number` is the lowest member and the result OxTrue.
    OxBool getFirstEntry(unsigned int& number);
    /// Compacts if needed. The member behind `number`, or 0 at the end and for
    /// a `number` that is no member. A walk from getFirstEntry costs a constant
    /// time per step.
    unsigned int getNextEntry(unsigned int number);
    /// The records in list order as range text ("9,1-3"), a new array the
    /// caller releases with delete[]; null for an empty list. Does not compact.
    char* convertToString();
    /// The records one a line, then the tree when there is one.
    std::ostrstream* dump(std::ostrstream* stream) const;

protected:
    /// Parses `text` and appends its records; see the text constructor.
    /// Without memory: message 228, and the list is left empty and invalid.
    OxBool build(char const* text, char const* typeName);
    /// The work of build; std::bad_alloc reaches build.
    OxBool parse(char const* text, char const* typeName);
    /// Whether the records are known to be sorted and without overlap.
    OxBool isCompact() const { return compacted; }

    /// Optional tree of the records, owned; no operation of this class fills it.
    OxGBinaryTree<OxRangeListRecord*>* tree = nullptr;

private:
    OxBool insert(OxRangeListRecord* record);
    /// Deletes every record and releases the array (capacity 0).
    void releaseRecords();
    /// Empties and deletes the tree when there is one.
    void releaseTree();
    /// The list changed: the walk must search again.
    void forgetWalk() { walkIndex = noWalk; }

    static constexpr unsigned int noWalk = ~0u;

    OxBool valid = OxFalse;
    OxBool compacted = OxFalse;
    /// Index of the record that held the last answer of the walk, and that
    /// answer; noWalk when there is none to go on from.
    unsigned int walkIndex = noWalk;
    unsigned int walkAnswer = 0;
};

#endif
