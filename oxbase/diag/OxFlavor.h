// OxFlavor.h: named switches, activated by name or by number.
//
// A caller describes the flavors that exist with a list of OxFlavorEntry
// objects and hands it to OxFlavor, which keeps private copies. The number of
// a flavor is its position in that list, from 0; the `id` of an entry is only
// carried along for its dump. A table whose ids run 0, 1, 2 in order is one
// where ids and numbers agree; with ids 10 and 20, the second flavor is
// still number 1.
//
//   OxFlavorEntry fast("fast", 0), safe("safe", 1);
//   OxGList<OxFlavorEntry *> table;  table.append(&fast);  table.append(&safe);
//   OxFlavor flavors(table);  flavors.addFlavor("safe");  // flavors.isSet(1) is OxTrue
#ifndef OXBASE_DIAG_OXFLAVOR_H
#define OXBASE_DIAG_OXFLAVOR_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/core/OxGList.h"
#include "oxbase/core/OxTypes.h"

/// One flavor that exists: a name and an id.
class OXBASE_API OxFlavorEntry {
public:
    /// Stores a copy of `name` (null for a null or empty name) and `id`; a
    /// null `name` leaves the id 0 as well.
    OxFlavorEntry(const char* name, unsigned int id);
    OxFlavorEntry(const OxFlavorEntry&) = delete;
    OxFlavorEntry& operator=(const OxFlavorEntry&) = delete;
    /// Releases the name.
    ~OxFlavorEntry();

    /// The entry's own copy of the name, or null.
    const char* getName() const { return name; }
    unsigned int getID() const { return id; }

    /// "Flavor ID = <id>, name = \"<name>\"\n"; nothing for an entry without name.
    std::ostrstream* dump(std::ostrstream* stream) const;

private:
    char* name = nullptr;
    unsigned int id = 0;
};

/// The flavors that exist and the ones that are active. Not copyable: the
/// object owns its entries.
class OXBASE_API OxFlavor {
public:
    /// Copies each entry of `flavors` (name and id), in order; a null element
    /// stays a null entry that no name finds. The caller's list and entries
    /// stay the caller's and may go before this object. Nothing is active.
    explicit OxFlavor(const OxGList<OxFlavorEntry*>& flavors);
    OxFlavor(const OxFlavor&) = delete;
    OxFlavor& operator=(const OxFlavor&) = delete;
    /// Deletes the entries.
    ~OxFlavor();

    /// Activates the flavor called `name` (exact comparison, case included).
    /// OxTrue when the name is known, also when it was active already;
    /// OxFalse for a null or unknown name, and then nothing changes.
    OxBool addFlavor(const char* name);
    /// Activates flavor `number` unless it is active. The number is not
    /// checked against the entries.
    void addFlavor(unsigned int number);
    /// Whether flavor `number` is active.
    OxBool isSet(unsigned int number) const;
    /// Nothing is active afterwards; the entries stay.
    void clear();
    /// How many flavors exist.
    unsigned int getNbEntries() const { return entries.getLength(); }

    /// Nothing while no flavor is active. Otherwise "Active flavors:\n" and,
    /// in order of activation, "  " and the name of each active flavor, one a
    /// line. A number without an entry (reported by the list's range report
    /// when it lies beyond the end) or an entry without name shows "<null>".
    std::ostrstream* dump(std::ostrstream* stream) const;

private:
    /// The position of the first entry called `name`; OxFalse when there is none.
    OxBool convertToID(const char* name, unsigned int& number) const;

    OxGList<unsigned int> active;
    OxGList<OxFlavorEntry*> entries;
};

#endif
