// OxXmlAttribute.h: one name and value pair of an XML element or CSV record.
//
// The value is always held as text. The constructors fix how numbers, lists,
// colours, rotations and vectors are spelled inside a document: a float has
// nine digits behind the point, a double is cut after its last significant
// digit, and a list puts a line end behind every eleventh value.
//
//   OxXmlAttribute id("id", 7);                     // id="7"
//   OxXmlAttribute point("vec3d", OxVec3d(1, 2, 3)); // vec3d="1.0 2.0 3.0"
//   id.write(prt.getStr());                         // ` id="7"`
#ifndef OXBASE_DOC_OXXMLATTRIBUTE_H
#define OXBASE_DOC_OXXMLATTRIBUTE_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/core/OxGList.h"
#include "oxbase/core/OxTypes.h"

#include <cstddef>
#include <cstdint>
#include <new>

class OxString;
class OxPrt;
class OxXmlElement;
namespace oxbase {
namespace detail {
class OxXmlStore;
} // namespace detail
} // namespace oxbase
class OxColor;
class OxRot;
class OxVec2d;
class OxVec3d;
class OxVec4d;

class OXBASE_API OxXmlAttribute {
public:
    /// How the value is held; text is the one kind in use.
    enum OX_XML_ATTRIBUTE_DATA_TYPE : std::int32_t { OX_XML_ATTRIBUTE_TEXT = 0 };

    // Every constructor stores a trimmed copy of `name` (null for a null or
    // empty name) and forms the value as stated. An empty input stores null; a
    // non-empty input of white space alone stores an empty text.

    /// No value.
    explicit OxXmlAttribute(char const* name);
    /// A copy of `value`, trimmed; null stays null.
    OxXmlAttribute(char const* name, char const* value);
    /// The string's text; a null pointer or an empty string leaves no value.
    OxXmlAttribute(char const* name, OxString const* value);
    /// The one character (a blank trims to an empty value).
    OxXmlAttribute(char const* name, char value);
    OxXmlAttribute(char const* name, unsigned char value);
    /// Decimal digits, "-" in front of a negative.
    OxXmlAttribute(char const* name, int value);
    OxXmlAttribute(char const* name, unsigned int value);
    /// Fixed notation, exactly nine digits behind the point: 1.5 -> "1.500000000".
    OxXmlAttribute(char const* name, float value);
    /// Fixed notation with nine digits, trailing zeros cut to one: 1.5 -> "1.5",
    /// -1e-12 -> "-0.0" (tiny values are not rounded to zero here).
    OxXmlAttribute(char const* name, double value);
    /// List forms: values separated by one blank, with "\n " behind every
    /// eleventh value. No values give no value.
    OxXmlAttribute(char const* name, OxGList<unsigned int> const& values);
    OxXmlAttribute(char const* name, OxGList<double> const& values);
    OxXmlAttribute(char const* name, unsigned int count, double* values);
    /// Each int spelled as a double: 3 -> "3.0".
    OxXmlAttribute(char const* name, unsigned int count, int* values);
    /// Red, green and blue by toString, one blank between.
    OxXmlAttribute(char const* name, OxColor const& color);
    /// The nine elements row by row by toString, one blank between.
    OxXmlAttribute(char const* name, OxRot const& rotation);
    /// The coordinates in index order by toString, one blank between.
    OxXmlAttribute(char const* name, OxVec2d const& vector);
    OxXmlAttribute(char const* name, OxVec3d const& vector);
    OxXmlAttribute(char const* name, OxVec4d const& vector);

    OxXmlAttribute(const OxXmlAttribute&) = delete;
    OxXmlAttribute& operator=(const OxXmlAttribute&) = delete;
    virtual ~OxXmlAttribute();

    /// Attributes come from a pool of their own, as elements do (see
    /// OxXmlElement); a derived class of another size uses the general heap.
    static void* operator new(std::size_t size);
    static void* operator new(std::size_t size, std::nothrow_t const&) noexcept;
    static void operator delete(void* memory, std::size_t size);
    static void operator delete(void* memory, std::nothrow_t const&) noexcept;

    /// The stored texts; null when absent.
    char const* getName() const { return name; }
    char const* getValue() const { return value; }
    /// The same value, writable in place; the caller must not lengthen it.
    char* getValueForUpdate() { return value; }
    OX_XML_ATTRIBUTE_DATA_TYPE getType() const { return type; }
    /// Replaces the value by a trimmed copy of `value` (null or empty: none).
    void setValue(char const* value);

    /// The number text of a document: magnitudes below 1e-9 become 0.0, then
    /// fixed notation with nine digits, trailing zeros cut to one behind the
    /// point (2 -> "2.0", -0.25 -> "-0.25"). A new array for the caller to
    /// release with delete[]; null only when no text could be made.
    static char* toString(double value);

    /// Writes ` name="value"` to `stream`, nothing escaped. With no name
    /// writes nothing and returns OxFalse; with no value writes nothing and
    /// returns OxTrue.
    OxBool write(std::ostrstream* stream) const;

    /// One indented line "XML Attribute: name="value"" ("<unknown>" for no
    /// value); nothing for an attribute without a name. Returns `stream`.
    virtual std::ostrstream* dump(std::ostrstream* stream) const;

private:
    friend struct OxStatics;
    friend class OxXmlElement;
    friend class oxbase::detail::OxXmlStore;
    /// Where the object and its value live: bits of `storage`. A stored
    /// object was built by a document's store (OxXmlStore) and goes with it;
    /// a stored value is a text in that store, replaced by a heap copy when
    /// the value is set.
    enum : std::uint8_t { kStoredNode = 1, kStoredValue = 2 };
    /// Destroys `attribute` as its storage requires (null is ignored).
    static void release(OxXmlAttribute* attribute);
    /// The scratch print object of the constructors that format a value
    /// (defined in oxbase/core/OxStatics.cpp).
    static OxPrt conversionPrt;

    /// Takes the text out of the scratch print object and stores it.
    void storeFormatted();
    /// Stores the list form of `count` texts made by `text(i)`.
    template <class Text> void storeList(unsigned int count, Text text);
    /// Stores the texts of `count` numbers joined by one blank.
    void storeJoined(unsigned int count, const double* numbers);

    char const* name = nullptr; ///< shared with equal names (OxXmlNames)
    char* value = nullptr;
    OX_XML_ATTRIBUTE_DATA_TYPE type = OX_XML_ATTRIBUTE_TEXT;
    std::uint8_t storage = 0;
};

#endif
