// OxName.h: interned identifiers.
//
// An OxName is one pointer to the single copy of its text in the process-wide
// name table, so names with the same text share that copy: comparing two
// names is comparing two pointers, and copying a name costs no lookup.
//
//   OxName a("bracket");
//   OxName b = OxName::stripWhite("  bracket ");
//   bool same = a.getString() == b.getString();   // true
//
// Interning writes the trace lines of HashTable::insert on standard error.
// The table is shared and unlocked: one thread at a time.
#ifndef OXBASE_CORE_OXNAME_H
#define OXBASE_CORE_OXNAME_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/core/HashTable.h"
#include "oxbase/core/OxString.h"
#include "oxbase/core/OxTypes.h"

#include <cstddef>

class OxNameTableGuard;

class OXBASE_API OxName {
public:
    /// The character "_".
    static char const underline;

    /// Interns `text` (insert into the table, use count up) and refers to its
    /// entry; the table's wasFound outcome is set.
    OxName(const OxString& text);
    /// The same for a plain text; `text` must not be null.
    OxName(const char* text);
    /// The empty name, an entry like any other.
    OxName();
    /// Copies refer to the same entry; no count changes.
    OxName(const OxName& other) = default;
    OxName& operator=(const OxName& other) = default;
    /// Does nothing: an entry's use count never falls by the loss of a name.
    ~OxName() = default;

    /// The interned text; the same pointer for every name of the same text,
    /// valid for as long as the table lives.
    const char* getString() const { return entry->element.getString(); }
    size_t getLength() const { return entry->element.getLength(); }
    /// 1 for the empty name, else 0.
    int operator!() const { return !entry->element; }

    /// The name of `text` without leading and trailing white space (inner
    /// white space stays). When white space trails, at most 512 characters
    /// from the first to the last non-white one are kept. Only white space or
    /// nothing gives the empty name. `text` must not be null.
    static OxName stripWhite(const char* text);
    /// OxFalse for control characters, white space, '"', '\'', '+', '\\',
    /// '{' and '}'; OxTrue for everything else.
    static OxBool isIdentChar(char c);
    /// OxTrue when the character is a letter (isalpha).
    static OxBool isIdentStartChar(char c);

private:
    friend class OxNameTableGuard;

    void intern(const OxString& text);

    const HashEntry* entry;

    static HashTable table; // defined in oxbase/core/OxStatics.cpp
};

#endif
