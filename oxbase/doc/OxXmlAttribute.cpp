#include "oxbase/doc/OxXmlAttribute.h"

#include "oxbase/core/OxString.h"
#include "oxbase/core/detail/OxSlabPool.h"
#include "oxbase/diag/OxPrt.h"
#include "oxbase/doc/detail/OxXmlNames.h"
#include "oxbase/geom/OxColor.h"
#include "oxbase/geom/OxRot.h"
#include "oxbase/geom/OxVec.h"

#include <cmath>
#include <iomanip>

using namespace oxbase::detail;

namespace {
/// A trimmed copy of `text`: null for null or empty input.
char* trimmedCopy(char const* text) {
    return OxString::stripWhite(OxString::dup(text));
}

/// Puts `stream` into the fixed notation with nine digits behind the point.
void setNineDigits(std::ostrstream* stream) {
    stream->setf(std::ios::fixed, std::ios::floatfield);
    stream->setf(std::ios::showpoint);
    stream->precision(9);
}

/// The blocks of every OxXmlAttribute.
OxSlabPool attributePool(sizeof(OxXmlAttribute));

/// Values per line of the list form.
constexpr unsigned int kListLineValues = 11;
} // namespace

OxXmlAttribute::OxXmlAttribute(char const* name) : name(OxXmlNames::acquire(name)) {}

OxXmlAttribute::OxXmlAttribute(char const* name, char const* value)
    : name(OxXmlNames::acquire(name)), value(trimmedCopy(value)) {}

OxXmlAttribute::OxXmlAttribute(char const* name, OxString const* value)
    : name(OxXmlNames::acquire(name)),
      value(trimmedCopy(value != nullptr ? value->getString() : nullptr)) {}

OxXmlAttribute::OxXmlAttribute(char const* name, char value) : name(OxXmlNames::acquire(name)) {
    char text[2] = {value, '\0'};
    this->value = trimmedCopy(text);
}

OxXmlAttribute::OxXmlAttribute(char const* name, unsigned char value)
    : OxXmlAttribute(name, static_cast<char>(value)) {}

OxXmlAttribute::OxXmlAttribute(char const* name, int value) : name(OxXmlNames::acquire(name)) {
    std::ostrstream* stream = conversionPrt.getStr();
    stream->unsetf(std::ios::basefield);
    *stream << std::dec << value;
    storeFormatted();
}

OxXmlAttribute::OxXmlAttribute(char const* name, unsigned int value)
    : name(OxXmlNames::acquire(name)) {
    std::ostrstream* stream = conversionPrt.getStr();
    *stream << std::dec << value;
    storeFormatted();
}

OxXmlAttribute::OxXmlAttribute(char const* name, float value) : name(OxXmlNames::acquire(name)) {
    std::ostrstream* stream = conversionPrt.getStr();
    setNineDigits(stream);
    *stream << value;
    storeFormatted();
}

OxXmlAttribute::OxXmlAttribute(char const* name, double value) : name(OxXmlNames::acquire(name)) {
    std::ostrstream* stream = conversionPrt.getStr();
    setNineDigits(stream);
    *stream << value;
    storeFormatted();
    OxString::stripTrailingZeros(this->value, '\0');
}

OxXmlAttribute::OxXmlAttribute(char const* name, OxGList<unsigned int> const& values)
    : name(OxXmlNames::acquire(name)) {
    storeList(values.getLength(), [&values](unsigned int i) {
        // The decimal digits, in a new array like the texts of toString.
        char digits[16];
        std::ostrstream text(digits, sizeof digits);
        text << std::dec << values[i] << std::ends;
        return OxString::dup(digits);
    });
}

OxXmlAttribute::OxXmlAttribute(char const* name, OxGList<double> const& values)
    : name(OxXmlNames::acquire(name)) {
    storeList(values.getLength(), [&values](unsigned int i) { return toString(values[i]); });
}

OxXmlAttribute::OxXmlAttribute(char const* name, unsigned int count, double* values)
    : name(OxXmlNames::acquire(name)) {
    if (values != nullptr) {
        storeList(count, [values](unsigned int i) { return toString(values[i]); });
    }
}

OxXmlAttribute::OxXmlAttribute(char const* name, unsigned int count, int* values)
    : name(OxXmlNames::acquire(name)) {
    if (values != nullptr) {
        storeList(count,
                  [values](unsigned int i) { return toString(static_cast<double>(values[i])); });
    }
}

OxXmlAttribute::OxXmlAttribute(char const* name, OxColor const& color)
    : name(OxXmlNames::acquire(name)) {
    double channels[3] = {0.0, 0.0, 0.0};
    color.getColor(channels[0], channels[1], channels[2]);
    storeJoined(3, channels);
}

OxXmlAttribute::OxXmlAttribute(char const* name, OxRot const& rotation)
    : name(OxXmlNames::acquire(name)) {
    double const(&m)[3][3] = rotation.getValue();
    double elements[9];
    for (unsigned int i = 0; i < 9; i++) {
        elements[i] = m[i / 3][i % 3];
    }
    storeJoined(9, elements);
}

OxXmlAttribute::OxXmlAttribute(char const* name, OxVec2d const& vector)
    : name(OxXmlNames::acquire(name)) {
    double coordinates[2] = {vector[0], vector[1]};
    storeJoined(2, coordinates);
}

OxXmlAttribute::OxXmlAttribute(char const* name, OxVec3d const& vector)
    : name(OxXmlNames::acquire(name)) {
    double coordinates[3] = {vector[0], vector[1], vector[2]};
    storeJoined(3, coordinates);
}

OxXmlAttribute::OxXmlAttribute(char const* name, OxVec4d const& vector)
    : name(OxXmlNames::acquire(name)) {
    double coordinates[4] = {vector[0], vector[1], vector[2], vector[3]};
    storeJoined(4, coordinates);
}

void* OxXmlAttribute::operator new(std::size_t size) {
    return attributePool.allocateObject(size);
}

void* OxXmlAttribute::operator new(std::size_t size, std::nothrow_t const& tag) noexcept {
    return attributePool.allocateObject(size, tag);
}

void OxXmlAttribute::operator delete(void* memory, std::size_t size) {
    attributePool.releaseObject(memory, size);
}

void OxXmlAttribute::operator delete(void* memory, std::nothrow_t const&) noexcept {
    attributePool.releaseObject(memory);
}

OxXmlAttribute::~OxXmlAttribute() {
    OxXmlNames::release(name);
    if ((storage & kStoredValue) == 0) {
        delete[] value;
    }
}

void OxXmlAttribute::release(OxXmlAttribute* attribute) {
    if (attribute == nullptr) {
        return;
    }
    if ((attribute->storage & kStoredNode) != 0) {
        attribute->~OxXmlAttribute(); // the memory goes with the store
    } else {
        delete attribute;
    }
}

void OxXmlAttribute::setValue(char const* text) {
    char* copy = trimmedCopy(text); // first: without memory the value stays
    if ((storage & kStoredValue) == 0) {
        delete[] value;
    }
    value = copy;
    storage &= static_cast<std::uint8_t>(~kStoredValue);
}

void OxXmlAttribute::storeFormatted() {
    char* text = OxString::stripWhite(conversionPrt.flushToString());
    delete[] value; // constructors only: never a stored value
    value = text;
}

template <class Text> void OxXmlAttribute::storeList(unsigned int count, Text text) {
    std::ostrstream* stream = conversionPrt.getStr();
    for (unsigned int i = 0; i < count; i++) {
        char* number = text(i);
        if (number == nullptr) {
            // A half-formed list is not stored: empty the scratch stream.
            delete[] conversionPrt.flushToString();
            return;
        }
        *stream << " " << number;
        delete[] number;
        if ((i + 1) % kListLineValues == 0) {
            *stream << "\n";
        }
    }
    storeFormatted();
}

void OxXmlAttribute::storeJoined(unsigned int count, const double* numbers) {
    std::ostrstream* stream = conversionPrt.getStr();
    for (unsigned int i = 0; i < count; i++) {
        char* number = toString(numbers[i]);
        if (number == nullptr) {
            delete[] conversionPrt.flushToString();
            return;
        }
        if (i > 0) {
            *stream << " ";
        }
        *stream << number;
        delete[] number;
    }
    storeFormatted();
}

char* OxXmlAttribute::toString(double number) {
    static OxPrt prt;
    if (std::fabs(number) < 1e-9) {
        number = 0.0;
    }
    std::ostrstream* stream = prt.getStr();
    setNineDigits(stream);
    *stream << number;
    return OxString::stripTrailingZeros(prt.flushToString(), '\0');
}

OxBool OxXmlAttribute::write(std::ostrstream* stream) const {
    if (name == nullptr) {
        return OxFalse;
    }
    if (value == nullptr || stream == nullptr) {
        return OxTrue;
    }
    *stream << " " << name << "="
            << "\"" << value << "\"";
    return OxTrue;
}

std::ostrstream* OxXmlAttribute::dump(std::ostrstream* stream) const {
    if (stream == nullptr || name == nullptr) {
        return stream;
    }
    oxIndent(*stream) << "XML Attribute: " << name;
    if (value != nullptr) {
        *stream << "=\"" << value << "\"\n";
    } else {
        *stream << OxString::str_unknown << "\n";
    }
    return stream;
}
