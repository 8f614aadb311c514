// OxCounters.h: named unsigned counts, looked up by name.
//
// An OxCounter is a name and a 32-bit unsigned count; OxCounters is a set of
// them with at most one counter per name (exact comparison, case included,
// linear lookup). Only `add` brings a counter in: every other operation on
// an unknown name does nothing and answers 0, null or OxFalse. Counting
// down one by one wraps below 0, subtracting an amount stops at 0.
//
//   OxCounters counters;
//   counters.add("parts");  counters.increment("parts");
//   counters.addToCount("parts", -5);   // floors at 0
#ifndef OXBASE_DIAG_OXCOUNTERS_H
#define OXBASE_DIAG_OXCOUNTERS_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/core/OxGList.h"
#include "oxbase/core/OxTypes.h"

/// A named count, 0 at construction.
class OXBASE_API OxCounter {
public:
    /// Stores a copy of `name`; null for a null or empty name.
    explicit OxCounter(const char* name);
    OxCounter(const OxCounter&) = delete;
    OxCounter& operator=(const OxCounter&) = delete;
    /// Releases the name.
    ~OxCounter();

    /// The counter's own copy of the name, or null.
    char* getName() const { return name; }
    unsigned int getCount() const { return count; }

    /// Adds 1 (4,294,967,295 wraps to 0).
    void increment() { count++; }
    /// Subtracts 1 with no floor: 0 wraps to 4,294,967,295.
    void decrement() { count--; }
    /// Adds `amount` when it is 0 or more (with unsigned wrap). A negative
    /// amount is subtracted when its magnitude is below the count; otherwise
    /// the count becomes 0.
    void addToCount(int amount);

    /// "Counter name: <name>, count: <count>\n", "<null>" for a missing name.
    std::ostrstream* dump(std::ostrstream* stream) const;

private:
    char* name = nullptr;
    unsigned int count = 0;
};

/// A set of counters that owns them. Elements may be read as a list; a null
/// element or one without name is passed over by every lookup.
class OXBASE_API OxCounters : public OxGList<OxCounter*> {
public:
    OxCounters() = default;
    OxCounters(const OxCounters&) = delete;
    OxCounters& operator=(const OxCounters&) = delete;
    /// Deletes every counter in the set.
    ~OxCounters() override;

    /// Takes over `counter` when it is not null, has a name, and no counter
    /// of that name is in the set. Otherwise nothing happens and the caller
    /// keeps (and eventually deletes) the object: after the call,
    /// `getByName(counter->getName()) == counter` tells which case it was.
    void add(OxCounter* counter);
    /// Creates a counter called `name` unless `name` is null or already
    /// known. An empty text makes a counter without name, which no lookup finds.
    void add(const char* name);

    /// The counter called `name`, still owned by the set; null when there is
    /// none or `name` is null.
    OxCounter* getByName(const char* name) const;
    OxBool exists(const char* name) const { return OxToBool(getByName(name) != nullptr); }
    /// The count of `name`; 0 for an unknown or null name.
    unsigned int getCount(const char* name) const;
    void increment(const char* name);
    void decrement(const char* name);
    /// OxCounter::addToCount on `name`, when it is known and `amount` is not 0.
    void addToCount(const char* name, int amount);

    /// For each counter at index i: the indentation, "counter[<i>]: " and the
    /// counter's dump. Nothing for an empty set.
    std::ostrstream* dump(std::ostrstream* stream) const;
};

#endif
