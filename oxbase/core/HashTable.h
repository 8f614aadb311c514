// HashTable.h: an open-addressing hash table of texts with use counts.
//
// HashTable keeps each distinct OxString once, in a table of prime size with
// quadratic probing. Inserting a text that is already there raises its use
// count; removing lowers it, and a slot whose count reaches 0 is free again.
// The load stays below one half: the table grows to nextPrime(2 * size) when
// half of it is filled. It is the store behind the interned names of OxName,
// and isPrime/nextPrime also size other tables of the library.
//
//   HashTable table;
//   table.init();                       // 13 free slots
//   table.insert(OxString("part"));     // OxTrue: new entry
//   table.insert(OxString("part"));     // OxFalse: use count now 2
//
// Every insert and remove writes trace lines on standard error (see insert).
// The table takes no lock: one thread at a time.
#ifndef OXBASE_CORE_HASHTABLE_H
#define OXBASE_CORE_HASHTABLE_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/core/OxString.h"
#include "oxbase/core/OxTypes.h"

/// One slot's content: the text and its use count. `ref` 0 means the slot is
/// free, whatever `element` still holds.
///
/// Entries live on the heap, each in a place of its own, and the table's
/// array holds pointers to them. Growth moves the pointers, never the
/// entries, so a pointer to an entry (as an OxName holds) and the text it
/// reads stay valid for the life of the table.
struct HashEntry {
    OxString element;
    unsigned int ref = 0;
};

class OXBASE_API HashTable {
public:
    /// A table with no slots: init (or assignment from an initialised table)
    /// must run before any other operation. The constructor is constexpr so
    /// that a static table is set up before any code runs and a later start-up
    /// step can never undo an init that came first.
    constexpr HashTable() = default;
    /// Releases the entries and the array; tableSize becomes 0.
    ~HashTable();

    /// Copies are made by operator= only.
    HashTable(const HashTable&) = delete;

    /// 13 free slots, currentSize 0. Entries of an earlier state are released.
    void init();

    /// Deep copy of `other`'s slots (text and use count) and counters.
    /// Nothing happens for self-assignment.
    const HashTable& operator=(const HashTable& other);

    /// Adds `x`, or raises its use count when it is there. OxTrue for a new
    /// entry, OxFalse when the text was there already. May grow the table.
    ///
    /// Writes on standard error, one line each:
    ///   "  currentPos = <pos>"
    ///   "  array[currentPos].ref = <ref>"
    ///   "  array[currentPos].element = <text>"
    /// A growth reinserts every entry in use, each with its own lines, between
    /// the first line and the two closing lines of this call.
    OxBool insert(const OxString& x);

    /// Lowers the use count of `x`'s slot when it is not 0. OxTrue when the
    /// slot's count is 0 afterwards (also for a text that was never there).
    /// Writes the position and ref lines, and the element line for a slot in
    /// use, on standard error.
    ///
    /// There is no mark for a removed entry: a slot freed this way ends every
    /// probe that reaches it.
    OxBool remove(const OxString& x);

    /// The text of the slot the probe for `x` reaches. Sets the outcome read by
    /// wasFound: OxTrue when that slot is in use. On a miss the result is the
    /// text a free slot holds: empty, or what a removed entry left behind.
    const OxString& find(const OxString& x);

    /// Whether the probe for `x` reaches a slot in use; wasFound is unchanged.
    OxBool isFound(const OxString& x) const;

    /// The outcome of the last find.
    OxBool wasFound() { return found; }

    /// Frees every slot (use counts 0); the array and its size stay.
    void makeEmpty();

    /// OxTrue for every n below 9; otherwise trial division by the odd numbers
    /// 3, 5, 7, ... up to the square root. Even numbers without an odd divisor
    /// (10, 16) therefore count as prime; nextPrime only asks about odd ones.
    static OxBool isPrime(unsigned int n);

    /// The first n' >= n (n raised to odd first) with isPrime(n') true:
    /// 26 gives 29, 13 gives 13, 0 gives 1.
    static unsigned int nextPrime(unsigned int n);

    // Additions for callers that look inside the table.

    /// Number of slots.
    unsigned int getTableSize() const { return tableSize; }
    /// Slots filled since creation or the last growth (remove does not lower it).
    unsigned int getCurrentSize() const { return currentSize; }
    /// Use count of `x`'s slot; 0 when `x` is not there.
    unsigned int getRef(const OxString& x) const;
    /// The entry that holds `x`, or null when `x` is not there. Sets the
    /// outcome read by wasFound, as find does. The entry keeps its place
    /// across growth.
    const HashEntry* findEntry(const OxString& x);

private:
    unsigned int findPos(const OxString& x) const;
    /// Makes `array` for the current tableSize, all slots free.
    void allocateTable();
    /// Releases the entries and the array.
    void releaseTable();
    /// Places an entry that is in use into the current array, as an insert
    /// would place its text (with its trace lines), with use count 1.
    void reinsert(HashEntry* entry);
    OxBool inUse(unsigned int pos) const;

    unsigned int tableSize = 0;
    unsigned int currentSize = 0;
    OxBool found = OxFalse;
    /// tableSize pointers; null for a slot that never held a text.
    HashEntry** array = nullptr;
};

#endif
