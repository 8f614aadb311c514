#include "oxbase/diag/detail/OxMsgFormat.h"

#include <cstring>

namespace oxbase {
namespace detail {

namespace {

/// One conversion of a format, from its '%' to its conversion character.
struct Conversion {
    const char* flags = nullptr;       ///< the first flag character, if any
    const char* amounts = nullptr;     ///< behind the flags: width and precision
    const char* lengthStart = nullptr; ///< the length modifier, or the letter
    const char* end = nullptr;         ///< the character behind the conversion
    char letter = '\0';                ///< the conversion character; '\0' at the text's end
    bool numbered = false;             ///< an argument number (`%1$s`, `*2$`)
    bool star = false;                 ///< a width or precision taken from an argument
    char length[3] = {0, 0, 0};        ///< the length modifier, at most two characters
};

const char* skipDigits(const char* p) {
    while (*p >= '0' && *p <= '9') {
        p++;
    }
    return p;
}

/// A width or precision: digits, or '*' with an optional argument number.
const char* readAmount(const char* p, Conversion& conversion) {
    if (*p != '*') {
        return skipDigits(p);
    }
    conversion.star = true;
    const char* digits = skipDigits(p + 1);
    if (*digits == '$' && digits != p + 1) {
        conversion.numbered = true;
        return digits + 1;
    }
    return p + 1;
}

/// Reads the conversion whose '%' is at `percent`, as the C library's
/// printf family reads it (flags, width, precision, length, letter).
Conversion readConversion(const char* percent) {
    Conversion conversion;
    const char* p = percent + 1;
    const char* digits = skipDigits(p);
    if (*digits == '$' && digits != p) {
        conversion.numbered = true;
        p = digits + 1;
    }
    conversion.flags = p;
    while (*p != '\0' && std::strchr("-+ #0'I", *p) != nullptr) {
        p++;
    }
    conversion.amounts = p;
    p = readAmount(p, conversion);
    if (*p == '.') {
        p = readAmount(p + 1, conversion);
    }
    conversion.lengthStart = p;
    int n = 0;
    while (*p != '\0' && std::strchr("hlLqjzZt", *p) != nullptr && n < 2) {
        conversion.length[n++] = *p++;
    }
    conversion.letter = *p;
    conversion.end = *p != '\0' ? p + 1 : p;
    return conversion;
}

/// The kind of argument a conversion reads ('s' or 'u'), '%' for none, and
/// '?' for anything the library never passes.
char kindOf(const Conversion& conversion) {
    if (conversion.letter == '%' && !conversion.numbered && !conversion.star) {
        return '%';
    }
    if (conversion.numbered || conversion.star || conversion.letter == '\0') {
        return '?';
    }
    const char* length = conversion.length;
    if (conversion.letter == 's') {
        return length[0] == '\0' ? 's' : '?';
    }
    bool intLength =
        length[0] == '\0' || std::strcmp(length, "h") == 0 || std::strcmp(length, "hh") == 0;
    if (intLength && std::strchr("diuoxXc", conversion.letter) != nullptr) {
        return 'u';
    }
    return '?';
}

} // namespace

unsigned int OxMsgFormatDisarm(char* text) {
    if (text == nullptr) {
        return 0;
    }
    unsigned int count = 0;
    char* out = text;
    for (const char* p = text; *p != '\0';) {
        if (*p != '%') {
            *out++ = *p++;
            continue;
        }
        Conversion conversion = readConversion(p);
        if (conversion.letter == 'n') {
            // The argument number, width and precision stay, so that the
            // same arguments are read; flags and length go, and "p" prints
            // the pointer that %n would have written through.
            for (const char* c = p; c != conversion.flags; c++) {
                *out++ = *c;
            }
            for (const char* c = conversion.amounts; c != conversion.lengthStart; c++) {
                *out++ = *c;
            }
            *out++ = 'p';
            count++;
        } else {
            // Copied whole, so that "%%n" stays the literal text "%n".
            for (const char* c = p; c != conversion.end; c++) {
                *out++ = *c;
            }
        }
        p = conversion.end;
    }
    *out = '\0';
    return count;
}

bool OxMsgFormatFits(const char* text, const char* arguments) {
    if (text == nullptr) {
        return true;
    }
    const char* next = arguments != nullptr ? arguments : "";
    for (const char* p = std::strchr(text, '%'); p != nullptr; p = std::strchr(p, '%')) {
        Conversion conversion = readConversion(p);
        char kind = kindOf(conversion);
        if (kind == '?' || (kind != '%' && *next != kind)) {
            return false;
        }
        if (kind != '%') {
            next++;
        }
        p = conversion.end;
    }
    return true;
}

} // namespace detail
} // namespace oxbase
