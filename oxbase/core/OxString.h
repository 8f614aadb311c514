// OxString.h: the library's text value and its toolbox for plain `char *` texts.
//
// As a value, an OxString holds one NUL-terminated text, in a 16-byte buffer
// inside the object for up to 15 characters and on the heap beyond that. As a
// toolbox, its static members work on texts that are arrays from `new[]`:
// `dup` copies (an empty text copies to null, so empty and missing are the
// same null pointer everywhere), `append` and `combine` join, `stripWhite`
// trims in place.
//
//   char * name = OxString::dup("  part  ");
//   OxString::stripWhite(name);              // "part"
//   name = OxString::append(name, ".xml");   // "part.xml", old array released
#ifndef OXBASE_CORE_OXSTRING_H
#define OXBASE_CORE_OXSTRING_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/core/OxTypes.h"

#include <cstddef>
#include <ctime>

class OxPrt;

class OXBASE_API OxString {
public:
    static char const* const str_empty;   ///< "<empty>"
    static char const* const str_none;    ///< "<none>"
    static char const* const str_null;    ///< "<null>", printed for a null name
    static char const* const str_unknown; ///< "<unknown>", printed for a value not yet set

    OxString();
    OxString(const OxString& other);
    /// `text` must not be null.
    OxString(const char* text);
    /// The decimal text of `value`.
    explicit OxString(int value);
    /// The first `count` bytes of `text`.
    OxString(const char* text, size_t count);
    /// `text` cut down as getSubString(start, end) would.
    OxString(const char* text, int start, int end);
    ~OxString();

    OxString& operator=(const OxString& other);
    /// Replaces the text; `text` must not be null.
    OxString& operator=(const char* text);
    OxString& operator+=(const OxString& other);
    OxString& operator+=(const char* text);

    /// Characters `start` through `end`; `end` of -1 or beyond the text means
    /// the tail; `end` below `start` gives the first character.
    OxString getSubString(int start, int end) const;
    /// Removes characters `start` through `end` (-1: the last); nothing when
    /// `end` is below `start`.
    void deleteSubString(int start, int end);
    /// Back to the empty state; a heap buffer is released only with OxTrue.
    void makeEmpty(OxBool release);

    const char* getString() const { return str; }
    size_t getLength() const;
    int operator!() const { return str[0] == '\0' ? 1 : 0; }
    /// h = h ^ (c ^ (h << 5)) over the signed characters; "abc" gives 100384.
    unsigned int hash() const;
    /// Hash of a plain text by the same rule (shared with HashTable).
    static unsigned int hash(const char* text);

    // Toolbox on `char *` texts. A "new array" is one from new[] that the
    // caller releases with delete[].

    /// New copy; null for a null or empty text.
    static char* dup(const char* text);
    /// New zero-filled array of count + 1 bytes holding up to `count`
    /// characters of `text`; null for a null text or count 0.
    static char* dup(const char* text, size_t count);
    /// New array with both texts; null when either is null or both are empty.
    static char* combine(const char* first, const char* second);
    /// New array with `tail` behind `text`, which is released; on a null
    /// result `text` stays with the caller.
    static char* append(char* text, const char* tail);
    /// New array with `c` behind `text`, which is released.
    static char* append(char* text, char c);
    /// CR LF becomes one blank, any other CR or LF one blank; in place.
    static char* stripCRLF(char* text);
    /// Removes leading and trailing white space in place.
    static char* stripWhite(char* text);
    /// Overwrites the last run of zeros behind the decimal point with `fill`,
    /// keeping one zero directly behind the point ("1.000" -> "1.0").
    static char* stripTrailingZeros(char* text, char fill);
    static char* toLower(char* text);
    static char* toUpper(char* text);
    static unsigned int occurances(const char* text, char c);
    /// Translates each character found in `from` to the one at the same place
    /// in `to`; returns how many were translated. See OxString.cpp for squeeze.
    static unsigned int tr(char* text, const char* from, const char* to, OxBool squeeze);
    static unsigned int tr(char* text, char from, char to, OxBool squeeze);

    /// Number and time texts made on the private conversion print object.
    /// New arrays; null for a null `time`.
    static char* toString(int value);
    static char* toString(unsigned int value);
    static char* toString(float value);
    static char* toString(double value);
    static char* toString(tm* time);

private:
    friend struct OxStatics;
    static OxPrt conversionPrt; // defined in oxbase/core/OxStatics.cpp

    void init();
    void assign(const char* text, size_t length);
    bool onHeap() const { return str != small; }

    char* str;
    size_t capacity;
    char small[16];
};

#endif
