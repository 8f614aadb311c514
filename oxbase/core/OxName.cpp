// OxName.cpp: interning through the process-wide name table.
#include "oxbase/core/OxName.h"

#include <cctype>
#include <cstring>

char const OxName::underline = '_';

namespace {

/// Longest text stripWhite copies when white space trails the name.
constexpr size_t maxStrippedLength = 512;

bool isWhite(char c) {
    return std::isspace(static_cast<unsigned char>(c)) != 0;
}

} // namespace

void OxName::intern(const OxString& text) {
    // The table is set up at load; a name made by another library's static
    // set-up before that point finds it empty and starts it here.
    if (table.getTableSize() == 0) {
        table.init();
    }
    table.insert(text);
    entry = table.findEntry(text); // also sets the table's wasFound
}

OxName::OxName(const OxString& text) : entry(nullptr) {
    intern(text);
}

OxName::OxName(const char* text) : entry(nullptr) {
    intern(OxString(text != nullptr ? text : ""));
}

OxName::OxName() : entry(nullptr) {
    intern(OxString());
}

OxName OxName::stripWhite(const char* text) {
    if (text == nullptr) {
        return OxName();
    }
    long long firstNonWhite = -1;
    long long lastNonWhite = -1;
    long long lastWhite = -1;
    for (long long i = 0; text[i] != '\0'; i++) {
        if (isWhite(text[i])) {
            lastWhite = i;
        } else {
            if (firstNonWhite < 0) {
                firstNonWhite = i;
            }
            lastNonWhite = i;
        }
    }
    if (firstNonWhite < 0) {
        return OxName();
    }
    if (lastWhite < lastNonWhite) {
        // Nothing trails: the text behind the leading white space, whole.
        return OxName(text + firstNonWhite);
    }
    size_t length = static_cast<size_t>(lastNonWhite - firstNonWhite + 1);
    if (length > maxStrippedLength) {
        length = maxStrippedLength;
    }
    return OxName(OxString(text + firstNonWhite, length));
}

OxBool OxName::isIdentChar(char c) {
    auto u = static_cast<unsigned char>(c);
    if (std::iscntrl(u) != 0 || std::isspace(u) != 0) {
        return OxFalse;
    }
    switch (c) {
    case '"':
    case '\'':
    case '+':
    case '\\':
    case '{':
    case '}':
        return OxFalse;
    default:
        return OxTrue;
    }
}

OxBool OxName::isIdentStartChar(char c) {
    return OxToBool(std::isalpha(static_cast<unsigned char>(c)) != 0);
}
