// OxXmlElementNumbers.cpp: the typed getters of OxXmlElement, which read
// numbers out of attribute values (see "Typed getters" in OxXmlElement.h).
#include "oxbase/core/OxString.h"
#include "oxbase/core/OxSystem.h"
#include "oxbase/doc/OxXmlElement.h"
#include "oxbase/doc/OxXmlFile.h"
#include "oxbase/geom/OxColor.h"
#include "oxbase/geom/OxVec.h"

#include <cstdlib>

namespace {
/// The delimiters of the number lists: blank and tab, not the line end.
char const* const kNumberDelimiters = " \t";
} // namespace

int OxXmlElement::readNumbers(char const* attributeName, double* numbers,
                              unsigned int count) const {
    char const* text = getAttributeValue(attributeName);
    if (text == nullptr) {
        return 0;
    }
    char* copy = OxString::dup(text);
    if (copy == nullptr) {
        return -1;
    }
    unsigned int found = 0;
    for (char* token = OxSystem::OxStrtok(copy, kNumberDelimiters);
         token != nullptr && found < count;
         token = OxSystem::OxStrtok(nullptr, kNumberDelimiters)) {
        numbers[found++] = std::atof(OxString::stripWhite(token));
    }
    delete[] copy;
    return found == count ? 1 : -1;
}

OxBool OxXmlElement::getIndices(OxGList<unsigned int>* indices) const {
    if (indices == nullptr) {
        return OxTrue;
    }
    char const* text = getAttributeValue(OxXmlFile::OX_XML_FIELD_INDICES);
    if (text == nullptr) {
        return OxTrue;
    }
    char* copy = OxString::stripWhite(OxString::dup(text));
    if (copy == nullptr) {
        return OxFalse;
    }
    unsigned int found = 0;
    for (char* token = OxSystem::OxStrtok(copy, kNumberDelimiters); token != nullptr;
         token = OxSystem::OxStrtok(nullptr, kNumberDelimiters)) {
        indices->append(static_cast<unsigned int>(std::atol(OxString::stripWhite(token))));
        found++;
    }
    delete[] copy;
    return OxToBool(found > 0);
}

OxBool OxXmlElement::getColor(OxColor& color) const {
    double rgb[3];
    int result = readNumbers(OxXmlFile::OX_XML_FIELD_COLOR, rgb, 3);
    if (result > 0) {
        color.setColor(rgb[0], rgb[1], rgb[2]);
    }
    return OxToBool(result >= 0);
}

OxBool OxXmlElement::getPoint(OxVec2d& point) const {
    return getPoint(OxXmlFile::OX_XML_FIELD_VEC2D, point);
}

OxBool OxXmlElement::getPoint(OxVec3d& point) const {
    return getPoint(OxXmlFile::OX_XML_FIELD_VEC3D, point);
}

OxBool OxXmlElement::getPoint(OxVec4d& point) const {
    return getPoint(OxXmlFile::OX_XML_FIELD_VEC4D, point);
}

template <class Point>
OxBool OxXmlElement::readPoint(char const* attributeName, Point& point, unsigned int count) const {
    if (attributeName == nullptr) {
        return OxFalse;
    }
    double numbers[4];
    int result = readNumbers(attributeName, numbers, count);
    if (result > 0) {
        for (unsigned int i = 0; i < count; i++) {
            point[static_cast<int>(i)] = numbers[i];
        }
    }
    return OxToBool(result >= 0);
}

OxBool OxXmlElement::getPoint(char const* attributeName, OxVec2d& point) const {
    return readPoint(attributeName, point, 2);
}

OxBool OxXmlElement::getPoint(char const* attributeName, OxVec3d& point) const {
    return readPoint(attributeName, point, 3);
}

OxBool OxXmlElement::getPoint(char const* attributeName, OxVec4d& point) const {
    return readPoint(attributeName, point, 4);
}
