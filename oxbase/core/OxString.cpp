#include "oxbase/core/OxString.h"

#include "oxbase/diag/OxPrt.h"

#include <algorithm>
#include <cctype>
#include <cstdio>
#include <cstring>

char const* const OxString::str_empty = "<empty>";
char const* const OxString::str_none = "<none>";
char const* const OxString::str_null = "<null>";
char const* const OxString::str_unknown = "<unknown>";

// ---------------------------------------------------------------------------
// The value class

OxString::OxString() {
    init();
}

OxString::OxString(const OxString& other) {
    init();
    *this = other.str;
}

OxString::OxString(const char* text) {
    init();
    *this = text;
}

OxString::OxString(int value) {
    init();
    char buffer[512];
    std::snprintf(buffer, sizeof buffer, "%d", value);
    *this = buffer;
}

OxString::OxString(const char* text, size_t count) {
    init();
    capacity = count + 1;
    if (capacity > sizeof small) {
        str = new char[capacity];
    }
    size_t used = text != nullptr ? ::strnlen(text, count) : 0;
    std::memcpy(str, text != nullptr ? text : "", used);
    std::memset(str + used, 0, count + 1 - used);
}

OxString::OxString(const char* text, int start, int end) {
    init();
    OxString whole(text);
    *this = whole.getSubString(start, end);
}

OxString::~OxString() {
    if (onHeap()) {
        delete[] str;
    }
    str = small;
}

void OxString::init() {
    str = small;
    small[0] = '\0';
    capacity = sizeof small;
}

size_t OxString::getLength() const {
    return std::strlen(str);
}

OxString& OxString::operator=(const OxString& other) {
    if (this != &other) {
        *this = other.str;
    }
    return *this;
}

OxString& OxString::operator=(const char* text) {
    if (text == nullptr) {
        text = ""; // outside the contract; treated as the empty text
    }
    size_t length = std::strlen(text);
    // A text that lives in our own buffer (self-assignment, a piece of the
    // text) must survive the buffer change below.
    if (text >= str && text < str + capacity) {
        if (text == str) {
            return *this;
        }
        OxString copy(text);
        assign(copy.str, length);
        return *this;
    }
    assign(text, length);
    return *this;
}

void OxString::assign(const char* text, size_t length) {
    size_t need = length + 1;
    if (capacity >= need && need >= std::strlen(str)) {
        std::memmove(str, text, need);
        return;
    }
    if (need < sizeof small) {
        if (onHeap()) {
            delete[] str;
        }
        str = small;
        capacity = sizeof small;
    } else if (capacity < need) {
        char* grown = new char[need]; // first: without memory the text stays
        if (onHeap()) {
            delete[] str;
        }
        str = grown;
    }
    std::memmove(str, text, need);
    capacity = need;
}

OxString& OxString::operator+=(const OxString& other) {
    return *this += other.str;
}

OxString& OxString::operator+=(const char* text) {
    if (text == nullptr || *text == '\0') {
        return *this;
    }
    size_t have = std::strlen(str);
    size_t more = std::strlen(text);
    char* joined = new char[have + more + 1];
    std::memcpy(joined, str, have);
    std::memcpy(joined + have, text, more + 1);
    assign(joined, have + more);
    delete[] joined;
    return *this;
}

OxString OxString::getSubString(int start, int end) const {
    int length = static_cast<int>(std::strlen(str));
    if (start < 0) {
        start = 0;
    }
    if (start > length) {
        start = length;
    }
    if (end == -1 || end >= length) {
        return OxString(str + start);
    }
    if (end < start) {
        start = 0;
        end = 0;
    }
    return OxString(str + start, static_cast<size_t>(end - start + 1));
}

void OxString::deleteSubString(int start, int end) {
    int length = static_cast<int>(std::strlen(str));
    if (end == -1) {
        end = length - 1;
    }
    if (end < start || start < 0 || start >= length) {
        return;
    }
    if (end >= length) {
        end = length - 1;
    }
    OxString joined(str, static_cast<size_t>(start));
    joined += str + end + 1;
    *this = joined;
}

void OxString::makeEmpty(OxBool release) {
    if (release == OxTrue && onHeap()) {
        delete[] str;
    }
    init();
}

unsigned int OxString::hash() const {
    return hash(str);
}

unsigned int OxString::hash(const char* text) {
    unsigned int h = 0;
    if (text == nullptr) {
        return h;
    }
    for (; *text != '\0'; text++) {
        auto c = static_cast<unsigned int>(static_cast<int>(static_cast<signed char>(*text)));
        h ^= c ^ (h << 5);
    }
    return h;
}

// ---------------------------------------------------------------------------
// The toolbox

char* OxString::dup(const char* text) {
    if (text == nullptr || *text == '\0') {
        return nullptr;
    }
    size_t length = std::strlen(text);
    char* copy = new char[length + 1];
    std::memcpy(copy, text, length + 1);
    return copy;
}

char* OxString::dup(const char* text, size_t count) {
    if (text == nullptr || count == 0) {
        return nullptr;
    }
    char* copy = new char[count + 1];
    std::memset(copy, 0, count + 1);
    std::memcpy(copy, text, ::strnlen(text, count));
    return copy;
}

char* OxString::combine(const char* first, const char* second) {
    if (first == nullptr || second == nullptr) {
        return nullptr;
    }
    size_t a = std::strlen(first);
    size_t b = std::strlen(second);
    if (a + b == 0) {
        return nullptr;
    }
    char* joined = new char[a + b + 1];
    // NOLINTNEXTLINE(bugprone-not-null-terminated-result): the terminator comes with `second`
    std::memcpy(joined, first, a);
    std::memcpy(joined + a, second, b + 1);
    return joined;
}

char* OxString::append(char* text, const char* tail) {
    char* joined = combine(text, tail);
    if (joined != nullptr) {
        delete[] text;
    }
    return joined;
}

char* OxString::append(char* text, char c) {
    if (text == nullptr) {
        return nullptr;
    }
    size_t length = std::strlen(text);
    char* joined = new char[length + 2];
    std::memcpy(joined, text, length);
    joined[length] = c;
    joined[length + 1] = '\0';
    delete[] text;
    return joined;
}

char* OxString::stripCRLF(char* text) {
    if (text == nullptr) {
        return nullptr;
    }
    char* out = text;
    for (const char* in = text; *in != '\0'; in++) {
        if (*in == '\r' && in[1] == '\n') {
            continue; // the LF that follows turns into the blank
        }
        *out++ = (*in == '\r' || *in == '\n') ? ' ' : *in;
    }
    *out = '\0';
    return text;
}

char* OxString::stripWhite(char* text) {
    if (text == nullptr) {
        return nullptr;
    }
    size_t length = std::strlen(text);
    size_t first = 0;
    while (first < length && std::isspace(static_cast<unsigned char>(text[first]))) {
        first++;
    }
    size_t last = length;
    while (last > first && std::isspace(static_cast<unsigned char>(text[last - 1]))) {
        last--;
    }
    if (first > 0) {
        std::memmove(text, text + first, last - first);
    }
    text[last - first] = '\0';
    return text;
}

char* OxString::stripTrailingZeros(char* text, char fill) {
    if (text == nullptr) {
        return nullptr;
    }
    stripWhite(text);
    unsigned char first = static_cast<unsigned char>(text[0]);
    if (!(std::isdigit(first) || first == '.' || first == '+' || first == '-')) {
        return text;
    }
    long point = -1;
    long run = -1;
    for (long i = 0; text[i] != '\0'; i++) {
        char c = text[i];
        if (c == '.') {
            if (point >= 0) {
                return text; // a second point: no number we know
            }
            point = i;
            continue;
        }
        if (point < 0) {
            continue;
        }
        if (!std::isdigit(static_cast<unsigned char>(c))) {
            return text; // an exponent or other text behind the point
        }
        if (c == '0') {
            if (run < 0) {
                run = i;
            }
        } else {
            run = -1;
        }
    }
    if (point < 0 || run < 0) {
        return text;
    }
    if (run == point + 1) {
        run++; // keep one zero behind the point: 1.000 gives 1.0
    }
    for (long i = run; text[i] != '\0'; i++) {
        text[i] = fill;
        if (fill == '\0') {
            break;
        }
    }
    return text;
}

char* OxString::toLower(char* text) {
    for (char* p = text; p != nullptr && *p != '\0'; p++) {
        *p = static_cast<char>(std::tolower(static_cast<unsigned char>(*p)));
    }
    return text;
}

char* OxString::toUpper(char* text) {
    for (char* p = text; p != nullptr && *p != '\0'; p++) {
        *p = static_cast<char>(std::toupper(static_cast<unsigned char>(*p)));
    }
    return text;
}

unsigned int OxString::occurances(const char* text, char c) {
    unsigned int count = 0;
    for (const char* p = text; p != nullptr && *p != '\0'; p++) {
        if (*p == c) {
            count++;
        }
    }
    return count;
}

// Squeeze: a character that matches the first entry of `from` directly after
// a character translated by that same first entry is neither translated nor
// counted; instead the characters behind it are copied down one place while
// they still equal that entry, and the scan resumes behind the last one
// copied. The text keeps its length. After a squeeze the memory of the
// previous translation is cleared, as it is by a mismatch or by a match at a
// later entry of `from`.
unsigned int OxString::tr(char* text, const char* from, const char* to, OxBool squeeze) {
    if (text == nullptr || from == nullptr || to == nullptr || *text == '\0') {
        return 0;
    }
    size_t n = std::min(std::strlen(from), std::strlen(to));
    if (n == 0) {
        return 0;
    }
    unsigned int count = 0;
    bool afterFirstEntry = false;
    for (size_t i = 0; text[i] != '\0'; i++) {
        // Only the first n entries of `from` take part: no terminator is wanted here.
        const void* hit =
            std::memchr(from, text[i], n); // NOLINT(bugprone-not-null-terminated-result)
        if (hit == nullptr) {
            afterFirstEntry = false;
            continue;
        }
        size_t j = static_cast<size_t>(static_cast<const char*>(hit) - from);
        if (squeeze == OxTrue && j == 0 && afterFirstEntry) {
            while (text[i + 1] != '\0' && text[i + 1] == from[0]) {
                text[i] = text[i + 1];
                i++;
            }
            afterFirstEntry = false;
            continue;
        }
        text[i] = to[j];
        count++;
        afterFirstEntry = (j == 0);
    }
    return count;
}

unsigned int OxString::tr(char* text, char from, char to, OxBool squeeze) {
    if (text == nullptr) {
        return 0;
    }
    const char fromSet[2] = {from, '\0'};
    const char toSet[2] = {to, '\0'};
    return tr(text, fromSet, toSet, squeeze);
}

// ---------------------------------------------------------------------------
// Number and time texts, formatted on the private conversion print object

namespace {
template <class Number> char* formatNumber(OxPrt& prt, Number value) {
    std::ostrstream* stream = prt.getStr();
    stream->setf(std::ios::showpoint);
    stream->precision(9);
    *stream << value;
    char* text = prt.flushToString();
    return OxString::stripTrailingZeros(text, '\0');
}

// The fields are widened first: a broken-down time from outside may hold any
// int, and adding the base year or month must not overflow.
void twoDigits(std::ostrstream* stream, const char* tag, long long value) {
    *stream << tag;
    if (value < 10) {
        *stream << "0";
    }
    *stream << value;
}
} // namespace

char* OxString::toString(int value) {
    return formatNumber(conversionPrt, value);
}
char* OxString::toString(unsigned int value) {
    return formatNumber(conversionPrt, value);
}
char* OxString::toString(float value) {
    return formatNumber(conversionPrt, value);
}
char* OxString::toString(double value) {
    return formatNumber(conversionPrt, value);
}

char* OxString::toString(tm* time) {
    if (time == nullptr) {
        return nullptr;
    }
    std::ostrstream* stream = conversionPrt.getStr();
    stream->setf(std::ios::showpoint);
    stream->precision(9);
    *stream << std::dec << "_y" << static_cast<long long>(time->tm_year) + 1900;
    twoDigits(stream, "_m", static_cast<long long>(time->tm_mon) + 1);
    twoDigits(stream, "_d", time->tm_mday);
    twoDigits(stream, "_h", time->tm_hour);
    twoDigits(stream, "_m", time->tm_min);
    twoDigits(stream, "_s", time->tm_sec);
    return conversionPrt.flushToString();
}
