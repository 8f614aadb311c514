#include "oxbase/diag/OxPrt.h"

#include "oxbase/core/OxString.h"
#include "oxbase/diag/OxMsg.h"

#include <algorithm>
#include <iomanip>

namespace {
// Terminates the text of `stream` with one NUL and freezes its buffer. The
// text stays valid until the stream is thawed and released. A stream in a
// failed state (a null text was inserted, say) is cleared first, so that the
// terminator always gets in and the text is never read past its end.
const char* terminateText(std::ostrstream* stream) {
    stream->clear();
    *stream << std::flush << std::ends;
    stream->freeze(true);
    char* text = stream->str();
    std::streamsize length = stream->pcount();
    if (text == nullptr || length <= 0) {
        return "";
    }
    if (text[length - 1] != '\0') {
        // The terminator found no room (memory exhausted): give up the last character.
        text[length - 1] = '\0';
    }
    return text;
}

const char kBlanks[] = "                                         "; // 41 blanks
} // namespace

char const* const OxPrt::sep_major_top =
    "-------------------------------==<<</|\\>>>==-------------------------------\n";
char const* const OxPrt::sep_major_bot =
    "-------------------------------==<<<\\|/>>>==-------------------------------\n";
char const* const OxPrt::sep_minor =
    "----------------------------------------------------------------------------\n";
char OxPrt::indent[41] = {};
short OxPrt::curpos = 0;
unsigned int OxPrt::trace_threshold = 0;

OxPrt::OxPrt() {
    newStream();
    str->setf(std::ios::fixed | std::ios::dec | std::ios::right | std::ios::showpoint);
    indent[0] = '\0';
    curpos = 0;
}

OxPrt::~OxPrt() {
    flushPrt();
    delete str;
    str = nullptr;
    indent[0] = '\0';
    curpos = 0;
}

// After a flush the object holds a stream as a new one would be: empty, in
// a clean state, with the format of a new stream (general notation,
// precision 6, no width, blank fill, decimal). A stream whose text stayed
// small is reset in place, which spares the construction of a stream for
// every line of a writer; one that grew large is replaced, so that its
// memory goes back at once.
void OxPrt::renewStream() {
    constexpr std::streamsize kReuseLimit = 65536;
    str->freeze(false);
    if (str->pcount() > kReuseLimit) {
        delete str;
        newStream();
        return;
    }
    str->seekp(0);
    str->clear();
    str->flags(std::ios::skipws | std::ios::dec);
    str->precision(6);
    str->width(0);
    str->fill(' ');
}

void OxPrt::newStream() {
    str = new std::ostrstream;
    // A size request only: the buffer of a dynamic ostrstream grows as needed.
    str->rdbuf()->pubsetbuf(nullptr, bufferSize);
}

void OxPrt::flushPrt() {
    const char* text = terminateText(str);
    OxMsg::LogForce(text);
    if (callback != nullptr) {
        callback(text, userData);
    }
    renewStream();
}

char* OxPrt::flushToString() {
    char* text = OxString::dup(terminateText(str));
    renewStream();
    return text;
}

OxBool OxPrt::isFull() const {
    return OxToBool(str->pcount() > 2000000);
}

void OxPrt::setDefaultFormat() {
    str->setf(std::ios::fixed | std::ios::dec | std::ios::right | std::ios::showpoint);
}

void OxPrt::resetFormat() {
    str->unsetf(std::ios::floatfield);
    str->unsetf(std::ios::basefield);
    str->unsetf(std::ios::adjustfield);
    str->unsetf(std::ios::showpoint);
}

std::ostrstream& OxPrt::trace() {
    return *tracePrt.str;
}

void OxPrt::flushTrace() {
    tracePrt.flushPrt();
}

void OxPrt::moveIndent(short to) {
    indent[curpos] = ' ';
    curpos = to;
    indent[to] = '\0';
}

void OxPrt::setIndent(short value) {
    if (value == curpos || value < 0 || value > 40) {
        return;
    }
    moveIndent(value);
}

void OxPrt::adjustIndent(short delta) {
    int target = curpos + delta;
    if (target < 0 || target > 40) {
        return;
    }
    moveIndent(static_cast<short>(target));
}

void OxPrt::printHex(std::ostrstream* stream, const unsigned char* bytes, size_t count,
                     size_t offset) {
    if (stream == nullptr || (bytes == nullptr && count != 0)) {
        return;
    }
    char column[16];
    std::fill(column, column + 16, ' ');
    for (size_t i = 0; i < count; i++) {
        size_t p = offset + i;
        size_t c = p % 16;
        if (c == 0) {
            stream->setf(std::ios::right, std::ios::adjustfield);
            *stream << std::hex << std::setfill('0') << std::setw(6)
                    << static_cast<unsigned long long>(p) << " ";
        }
        *stream << std::hex << std::setfill('0') << std::setw(2)
                << static_cast<unsigned int>(bytes[i]) << " ";
        column[c] = (bytes[i] >= 0x20 && bytes[i] <= 0x7F) ? static_cast<char>(bytes[i]) : '.';
        if (c == 15) {
            *stream << "| ";
            stream->write(column, 16);
            *stream << "\n";
            std::fill(column, column + 16, ' ');
        }
    }
    *stream << std::dec;
    size_t end = offset + count;
    *stream << std::setfill(' ');
    if (end % 16 == 0) {
        return;
    }
    size_t r = end % 16;
    *stream << std::setw(static_cast<int>(50 - 3 * r)) << "| ";
    stream->write(column, 16);
    *stream << "\n"
            << "\n";
}

void OxPrt::printHex(std::ostrstream* stream, const unsigned char* bytes, size_t count) {
    printHex(stream, bytes, count, 0);
}

void OxPrtInit() {}

std::ostrstream& oxIndent(std::ostrstream& stream) {
    // Written unformatted, so that neither the fill character nor a pending
    // width of the caller's stream changes the indentation.
    short depth = std::min<short>(std::max<short>(OxPrt::curpos, 0), 40);
    stream.write(kBlanks, depth + 1);
    return stream;
}
