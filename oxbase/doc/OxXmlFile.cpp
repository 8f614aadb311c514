#include "oxbase/doc/OxXmlFile.h"

#include "oxbase/core/OxString.h"
#include "oxbase/diag/OxMsg.h"
#include "oxbase/diag/OxMsgNumbers.h"
#include "oxbase/io/OxInput.h"
#include "oxbase/io/OxOutput.h"

#include <cctype>
#include <cstring>
#include <iostream>
#include <new>

char const* const OxXmlFile::OX_XML_UNKNOWN = "UNKNOWN";
char const* const OxXmlFile::OX_XML_ASSIGNMENT = "=";
char const* const OxXmlFile::OX_XML_DECLARATION_START = "<?xml";
char const* const OxXmlFile::OX_XML_DECLARATION_END = "?>";
char const* const OxXmlFile::OX_XML_COMMENT_START = "<!--";
char const* const OxXmlFile::OX_XML_COMMENT_END = "-->";
char const* const OxXmlFile::OX_XML_QUOTE = "\"";
char const* const OxXmlFile::OX_XML_START = "<";
char const* const OxXmlFile::OX_XML_END = ">";
char const* const OxXmlFile::OX_XML_NODE_END = "/";
char const* const OxXmlFile::OX_XML_DOCTYPE = "<!DOCTYPE";
char const* const OxXmlFile::OX_XML_CDATA_START = "<![CDATA[";
char const* const OxXmlFile::OX_XML_CDATA_END = "]]>";
char const* const OxXmlFile::OX_XML_ELEMENT_ELEMENT = "element";
char const* const OxXmlFile::OX_XML_ELEMENT_LIST = "list";
char const* const OxXmlFile::OX_XML_FIELD_COLOR = "color";
char const* const OxXmlFile::OX_XML_FIELD_ENCODING = "encoding";
char const* const OxXmlFile::OX_XML_FIELD_END = "end";
char const* const OxXmlFile::OX_XML_FIELD_INDICES = "indices";
char const* const OxXmlFile::OX_XML_FIELD_LENGTH = "length";
char const* const OxXmlFile::OX_XML_FIELD_MATRIX = "matrix";
char const* const OxXmlFile::OX_XML_FIELD_NAME = "name";
char const* const OxXmlFile::OX_XML_FIELD_SCALE = "scale";
char const* const OxXmlFile::OX_XML_FIELD_START = "start";
char const* const OxXmlFile::OX_XML_FIELD_VALUE = "value";
char const* const OxXmlFile::OX_XML_FIELD_VALUELIST = "value_list";
char const* const OxXmlFile::OX_XML_FIELD_VEC2D = "vec2d";
char const* const OxXmlFile::OX_XML_FIELD_VEC3D = "vec3d";
char const* const OxXmlFile::OX_XML_FIELD_VEC4D = "vec4d";
char const* const OxXmlFile::OX_XML_FIELD_VERSION = "version";
char const* const OxXmlFile::OX_XML_VERSION = "1.0";
char const* const OxXmlFile::OX_XMLNS = "xmlns";
char const* const OxXmlFile::OX_XMLNS_XSI = "xmlns:xsi";
char const* const OxXmlFile::OX_XSI_SCHEMALOCATION = "xsi:schemaLocation";
char const* const OxXmlFile::OX_XSI_TYPE = "xsi:type";
char const* const OxXmlFile::OX_XML_LITERAL_NO = "no";
char const* const OxXmlFile::OX_XML_LITERAL_YES = "yes";

short OxXmlFile::curpos = 0;
char OxXmlFile::indent[21] = {};

namespace {

constexpr short kMaxIndent = 20;

bool startsWith(char const* text, char const* marker) {
    return text != nullptr && std::strncmp(text, marker, std::strlen(marker)) == 0;
}

char const* nameOrEmpty(char const* text) {
    return text != nullptr ? text : "";
}

/// The writer's print object. Lines are built in a LineBuffer (below); the
/// object is still made at the first write, as it always was, because
/// building an OxPrt resets the dump indentation of the process.
OxPrt& linePrt() {
    static OxPrt prt;
    return prt;
}

/// A growable text: appending is amortised constant per character, so
/// texts gathered over many lines cost linear time.
class TextBuffer {
public:
    TextBuffer() = default;
    TextBuffer(const TextBuffer&) = delete;
    TextBuffer& operator=(const TextBuffer&) = delete;
    ~TextBuffer() { delete[] data; }

    void clear() {
        length = 0;
        if (data != nullptr) {
            data[0] = '\0';
        }
    }
    /// False when memory ran out; the text is then unchanged.
    bool append(char const* text, size_t count) {
        if (!reserve(length + count + 1)) {
            return false;
        }
        std::memcpy(data + length, text, count);
        length += count;
        data[length] = '\0';
        return true;
    }
    bool append(char c) { return append(&c, 1); }
    /// The text, NUL-terminated; "" while nothing was appended.
    char const* text() const { return data != nullptr ? data : ""; }
    /// Tells the buffer that its text will not grow beyond `maxLength`
    /// characters (what is left of the input bounds a gathered text).
    void expectAtMost(size_t maxLength) { ceiling = maxLength + 1; }
    /// Hands the text over as a new[] array when that saves a copy of a long
    /// text (it fills at least half of its array); null otherwise, and the
    /// caller copies text().
    char* releaseLong() {
        if (data == nullptr || length < kLongText || length < capacity / 2) {
            return nullptr;
        }
        char* text = data;
        data = nullptr;
        length = 0;
        capacity = 0;
        return text;
    }

private:
    bool reserve(size_t needed) {
        if (needed <= capacity) {
            return true;
        }
        size_t grown = capacity < 64 ? 64 : capacity;
        while (grown < needed) {
            grown *= 2;
        }
        // A long text jumps to the most it can still become, so that it is
        // neither copied at every doubling nor given twice the room it needs.
        if (grown > kLongText && ceiling >= needed) {
            grown = ceiling;
        }
        char* bigger = new (std::nothrow) char[grown];
        if (bigger == nullptr) {
            return false;
        }
        if (length > 0) {
            std::memcpy(bigger, data, length);
        }
        delete[] data;
        data = bigger;
        capacity = grown;
        return true;
    }

    static constexpr size_t kLongText = 1u << 20;
    char* data = nullptr;
    size_t length = 0;
    size_t capacity = 0;
    size_t ceiling = 0;
};

/// One line of the writer, built in a buffer that every line reuses and
/// handed to OxOutput::putline from there: a line costs no allocation and
/// no copy but the output's own, where building it in a print stream and
/// taking it out with flushToString cost a stream reset, a new array and a
/// copy per line. The text is the same as that of the print stream.
class LineBuffer {
public:
    /// `text` right-aligned in a field of `width` characters.
    LineBuffer& field(int width, char const* text) {
        size_t count = std::strlen(text);
        for (int i = static_cast<int>(count); i < width; i++) {
            add(' ');
        }
        return add(text, count);
    }
    LineBuffer& add(char const* text) { return add(text, std::strlen(text)); }
    LineBuffer& add(char c) { return add(&c, 1); }
    /// ` name="value"` of an attribute with a value, as OxXmlAttribute::write
    /// puts it; nothing for one without. False for an attribute without name.
    bool addAttribute(OxXmlAttribute const& attribute) {
        if (attribute.getName() == nullptr) {
            return false;
        }
        if (attribute.getValue() != nullptr) {
            add(' ').add(attribute.getName()).add('=').add('"').add(attribute.getValue()).add('"');
        }
        return true;
    }
    /// Hands the line to `output` and starts the next. False, with nothing
    /// sent, when memory ran out while the line was built.
    bool send(OxOutput& output) {
        bool complete = !failed;
        if (complete) {
            output.putline(text.text());
        }
        discard();
        return complete;
    }
    /// Drops the line in progress.
    void discard() {
        text.clear();
        failed = false;
    }

private:
    LineBuffer& add(char const* part, size_t count) {
        failed = failed || !text.append(part, count);
        return *this;
    }

    TextBuffer text;
    bool failed = false;
};
} // namespace

namespace oxbase {
namespace detail {

/// The lines of a text-mode input, whole, whatever their length.
///
/// One buffer serves the whole file: blocks are read into it behind the
/// unfinished line, a finished line is handed out in place, and the buffer
/// only grows when a single line does not fit. Every byte is read, scanned
/// and moved at most once, so the work is linear in the file's size.
class OxXmlLineSource {
public:
    explicit OxXmlLineSource(OxInput& in) : input(in) {}
    OxXmlLineSource(const OxXmlLineSource&) = delete;
    OxXmlLineSource& operator=(const OxXmlLineSource&) = delete;
    ~OxXmlLineSource() { delete[] buffer; }

    enum Result { Line, End, ReadFailure, NoMemory };

    /// Prepares to read `length` bytes from the current position.
    bool start(long long length) {
        remaining = length > 0 ? length : 0;
        capacity = kInitialCapacity;
        buffer = new (std::nothrow) char[capacity];
        return buffer != nullptr;
    }

    /// The next line without its line end, in place: `line` and `length`.
    /// The byte behind the line may be overwritten by the caller.
    Result next(char*& line, size_t& length) {
        for (;;) {
            char* found = static_cast<char*>(std::memchr(buffer + scan, '\n', filled - scan));
            if (found != nullptr) {
                line = buffer + lineStart;
                length = static_cast<size_t>(found - line);
                lineStart = scan = static_cast<size_t>(found - buffer) + 1;
                return Line;
            }
            scan = filled;
            if (remaining == 0) {
                if (lineStart < filled) {
                    // The last line has no line end: it is read all the same.
                    line = buffer + lineStart;
                    length = filled - lineStart;
                    lineStart = scan = filled;
                    return Line;
                }
                return End;
            }
            Result refill = fill();
            if (refill != Line) {
                return refill;
            }
        }
    }

private:
    static constexpr size_t kInitialCapacity = 64 * 1024;
    static constexpr size_t kMinimumRead = 16 * 1024;
    static constexpr size_t kMaximumRead = 1u << 30;

    Result fill() {
        if (lineStart > 0) {
            std::memmove(buffer, buffer + lineStart, filled - lineStart);
            filled -= lineStart;
            scan -= lineStart;
            lineStart = 0;
        }
        if (capacity - 1 - filled < kMinimumRead) {
            char* bigger = new (std::nothrow) char[capacity * 2];
            if (bigger == nullptr) {
                return NoMemory;
            }
            std::memcpy(bigger, buffer, filled);
            delete[] buffer;
            buffer = bigger;
            capacity *= 2;
        }
        size_t want = capacity - 1 - filled;
        if (static_cast<long long>(want) > remaining) {
            want = static_cast<size_t>(remaining);
        }
        if (want > kMaximumRead) {
            want = kMaximumRead;
        }
        long long got = input.read(buffer + filled, static_cast<unsigned int>(want));
        if (got != static_cast<long long>(want)) {
            return ReadFailure; // reported by the input (2 or 3 and the state)
        }
        filled += want;
        remaining -= static_cast<long long>(want);
        return Line;
    }

public:
    /// Bytes not yet handed out as lines: the rest of the buffer and of the file.
    size_t unconsumed() const { return static_cast<size_t>(remaining) + (filled - lineStart); }

private:
    OxInput& input;
    long long remaining = 0;
    char* buffer = nullptr;
    size_t capacity = 0;
    size_t filled = 0;
    size_t lineStart = 0;
    size_t scan = 0;
};

/// The state machine of OxXmlFile::readFile, over one document.
///
/// Each line is trimmed; blank lines are skipped in every state. The state
/// survives the line end, the position inside a tag does not always:
///
///   START                 the first markup must be "<?xml"; its line is the
///                         declaration node
///   CONTENT               looks for the next "<": comment, DOCTYPE, CDATA,
///                         end tag (closes the open element by nesting),
///                         empty element, or start tag
///   ELEMENT_VALUE         behind ">": a text value must close on its line
///   ATTRIBUTE             an attribute name, "/>", ">" or the line's end
///   ATTRIBUTE_VALUE       the opening quote and the value on its line
///   ATTRIBUTE_VALUE_MORE  a value going on over lines, joined by one blank
///   COMMENT, CDATA        raw text up to "-->" / "]]>", lines joined by "\n"
///   DOCTYPE               raw text up to the first ">"
///
/// Only the blank counts as space inside a tag. Nothing is decoded: values
/// keep their bytes. Texts gathered over many lines grow in place and are
/// stored once, so the work stays linear in the size of the input.
class OxXmlReader {
public:
    explicit OxXmlReader(OxXmlFile& document) : file(document), source(*document.input) {}
    OxXmlReader(const OxXmlReader&) = delete;
    OxXmlReader& operator=(const OxXmlReader&) = delete;

    OxBool run();

private:
    enum State {
        START,
        CONTENT,
        COMMENT,
        DOCTYPE,
        CDATA,
        ELEMENT_VALUE,
        ATTRIBUTE,
        ATTRIBUTE_VALUE,
        ATTRIBUTE_VALUE_MORE
    };
    /// What a state step gives: go on, a syntax error (its number), or the
    /// silent end of a value that opened at a line end.
    static constexpr int kGoOn = 0;
    static constexpr int kAbort = -1;

    int step();
    int doStart();
    int doContent();
    int doElementValue();
    int doAttribute();
    int doAttributeValue();
    int doAttributeValueMore();
    int doComment(bool cdata);
    int doDoctype();

    char* find(char* from, char c) const {
        return static_cast<char*>(std::memchr(from, c, static_cast<size_t>(lineEnd - from)));
    }
    void skipBlanks() {
        while (cursor < lineEnd && *cursor == ' ') {
            cursor++;
        }
    }
    unsigned int offsetOf(char const* position) const {
        return static_cast<unsigned int>(position - lineText);
    }
    /// A trimmed copy of [begin, end) stored by `store` (setValue, a constructor).
    template <class Store> void withText(char* begin, char* end, Store store) {
        char saved = *end;
        *end = '\0';
        store(begin);
        *end = saved;
    }
    void createElement(char* tagStart, char* nameBegin, char* nameEnd, bool makeCurrent);
    void closeByEndTag(char* tagStart, char* nameBegin);
    void attach(OxXmlElement* node);
    void finishComment(bool cdata);
    void finish();
    char const* fileName() const { return nameOrEmpty(file.input->getFilename()); }

    OxXmlFile& file;
    OxXmlLineSource source;
    State state = START;
    unsigned int lineNumber = 0;
    char* lineText = nullptr;
    char* lineEnd = nullptr;
    char* cursor = nullptr;

    OxXmlElement* current = nullptr;
    // Comment and CDATA in progress: the node and its text so far.
    bool commentOpen[2] = {false, false};
    OxXmlElement* commentNode[2] = {nullptr, nullptr};
    TextBuffer commentText[2];
    // The DOCTYPE text: gathered over the whole read, stored at its end.
    bool doctypeLoaded = false;
    TextBuffer doctypeText;
    // The attribute in progress and its value gathered over several lines.
    OxXmlAttribute* attribute = nullptr;
    char quote = '"';
    bool gatheredValid = false;
    bool gathering = false;
    TextBuffer gathered;
};

OxBool OxXmlReader::run() {
    if (!source.start(file.input->getFileLength())) {
        std::cerr << "FATAL: Dynamic storage allocation failure." << std::endl;
        return OxFalse;
    }
    OxBool result = OxTrue;
    for (;;) {
        char* line = nullptr;
        size_t length = 0;
        OxXmlLineSource::Result got = source.next(line, length);
        if (got == OxXmlLineSource::End) {
            // Leave the input at its end, as a line reader would: it is then
            // no longer good, and a second read stops at once.
            char probe[2];
            file.input->getline(probe, sizeof probe, '\n');
            break;
        }
        if (got == OxXmlLineSource::ReadFailure) {
            result = OxFalse;
            break;
        }
        if (got == OxXmlLineSource::NoMemory) {
            std::cerr << "FATAL: Dynamic storage allocation failure." << std::endl;
            result = OxFalse;
            break;
        }
        lineNumber++;
        // A NUL byte cannot stand in a text: it is read as a blank.
        unsigned int nuls = 0;
        for (char* nul = static_cast<char*>(std::memchr(line, '\0', length)); nul != nullptr;
             nul = static_cast<char*>(std::memchr(nul, '\0', length - (nul - line)))) {
            *nul = ' ';
            nuls++;
        }
        if (nuls > 0) {
            OxMsg::Log(OxMsgXmlNulBytes, fileName(), lineNumber, nuls);
        }
        char* begin = line;
        char* end = line + length;
        while (begin < end && std::isspace(static_cast<unsigned char>(*begin))) {
            begin++;
        }
        while (end > begin && std::isspace(static_cast<unsigned char>(end[-1]))) {
            end--;
        }
        if (begin == end) {
            continue; // a blank line adds nothing in any state
        }
        *end = '\0';
        lineText = begin;
        lineEnd = end;
        cursor = begin;
        int outcome = kGoOn;
        while (cursor < lineEnd && outcome == kGoOn) {
            outcome = step();
        }
        if (outcome > 0) {
            OxMsg::Log(OxMsgXmlErrorPlace, fileName(), lineNumber, offsetOf(cursor), lineText);
            OxMsg::Log(static_cast<unsigned int>(outcome));
            result = OxFalse;
            break;
        }
        if (outcome == kAbort) {
            result = OxFalse;
            break;
        }
    }
    finish();
    return result;
}

int OxXmlReader::step() {
    switch (state) {
    case START:
        return doStart();
    case CONTENT:
        return doContent();
    case COMMENT:
        return doComment(false);
    case CDATA:
        return doComment(true);
    case DOCTYPE:
        return doDoctype();
    case ELEMENT_VALUE:
        return doElementValue();
    case ATTRIBUTE:
        return doAttribute();
    case ATTRIBUTE_VALUE:
        return doAttributeValue();
    case ATTRIBUTE_VALUE_MORE:
        return doAttributeValueMore();
    }
    return kGoOn;
}

int OxXmlReader::doStart() {
    char* open = find(cursor, '<');
    if (open == nullptr || !file.isDeclaration(open)) {
        return OxMsgXmlNoDeclaration;
    }
    cursor = open;
    OxXmlElement* node =
        new (std::nothrow) OxXmlElement(OxXmlElement::XML_TYPE_DECLARATION, nullptr);
    if (node != nullptr) {
        node->setValue(cursor);
        delete file.declaration;
        file.declaration = node;
    }
    char* end = std::strstr(cursor, OxXmlFile::OX_XML_DECLARATION_END);
    cursor = end != nullptr ? end + 2 : lineEnd;
    state = CONTENT;
    return kGoOn;
}

int OxXmlReader::doContent() {
    char* open = find(cursor, '<');
    if (open == nullptr) {
        cursor = lineEnd; // text between elements is ignored
        return kGoOn;
    }
    cursor = open;
    if (file.isDeclaration(cursor)) {
        return OxMsgXmlInnerDeclaration;
    }
    if (file.isComment(cursor)) {
        state = COMMENT;
        return kGoOn;
    }
    if (file.isDoctype(cursor)) {
        state = DOCTYPE;
        return kGoOn;
    }
    if (file.isCdata(cursor)) {
        state = CDATA;
        return kGoOn;
    }
    char* nameBegin = cursor + 1;
    while (nameBegin < lineEnd && *nameBegin == ' ') {
        nameBegin++;
    }
    char* nameEnd = nameBegin;
    while (nameEnd < lineEnd && *nameEnd != ' ' && *nameEnd != '/' && *nameEnd != '>') {
        nameEnd++;
    }
    if (nameEnd == lineEnd) {
        cursor = lineEnd; // a tag name and its end must stand on one line
        return kGoOn;
    }
    if (*nameEnd == '/' && nameEnd == nameBegin) {
        cursor = nameEnd + 1;
        closeByEndTag(open, cursor);
        return kGoOn; // the rest of the end tag is skipped as text
    }
    if (*nameEnd == '/') {
        cursor = nameEnd;
        if (nameEnd[1] != '>') {
            return OxMsgXmlBadTagEnd;
        }
        createElement(open, nameBegin, nameEnd, false);
        cursor = nameEnd + 1;
        return kGoOn;
    }
    createElement(open, nameBegin, nameEnd, true);
    state = *nameEnd == '>' ? ELEMENT_VALUE : ATTRIBUTE;
    cursor = nameEnd + 1;
    return kGoOn;
}

int OxXmlReader::doElementValue() {
    skipBlanks();
    if (cursor == lineEnd) {
        return kGoOn;
    }
    if (*cursor == '<') {
        state = CONTENT;
        return kGoOn;
    }
    char* open = find(cursor, '<');
    char* valueEnd = open != nullptr ? open : lineEnd;
    if (current != nullptr) {
        withText(cursor, valueEnd, [this](char const* text) { current->setValue(text); });
    }
    cursor = valueEnd;
    if (open == nullptr || open[1] != '/') {
        return OxMsgXmlBadTagEnd;
    }
    closeByEndTag(open, open + 2);
    char* close = find(open + 2, '>');
    cursor = close != nullptr ? close + 1 : lineEnd;
    state = CONTENT;
    return kGoOn;
}

int OxXmlReader::doAttribute() {
    skipBlanks();
    char* nameBegin = cursor;
    while (cursor < lineEnd && *cursor != ' ' && *cursor != '/' && *cursor != '=' &&
           *cursor != '>') {
        cursor++;
    }
    char* nameEnd = cursor;
    skipBlanks();
    if (cursor == lineEnd) {
        return kGoOn; // the tag goes on on the next line
    }
    switch (*cursor) {
    case '/':
        if (cursor[1] != '>') {
            return OxMsgXmlBadTagEnd;
        }
        if (current != nullptr) {
            current = current->getParent();
        }
        cursor++;
        state = CONTENT;
        return kGoOn;
    case '=':
        withText(nameBegin, nameEnd,
                 [this](char const* text) { attribute = new (std::nothrow) OxXmlAttribute(text); });
        if (current != nullptr) {
            current->addAttribute(attribute);
        } else {
            delete attribute;
            attribute = nullptr;
        }
        cursor++;
        state = ATTRIBUTE_VALUE;
        return kGoOn;
    case '>':
        cursor++;
        state = ELEMENT_VALUE;
        return kGoOn;
    default:
        return kGoOn; // a name without "=" is dropped
    }
}

int OxXmlReader::doAttributeValue() {
    skipBlanks();
    if (cursor == lineEnd) {
        return kGoOn;
    }
    if (*cursor != '"' && *cursor != '\'') {
        return OxMsgXmlNoQuote;
    }
    quote = *cursor++;
    char* close = find(cursor, quote);
    if (close != nullptr) {
        if (attribute != nullptr) {
            withText(cursor, close, [this](char const* text) { attribute->setValue(text); });
        }
        cursor = close + 1;
        state = ATTRIBUTE;
        return kGoOn;
    }
    // The value goes on on the next lines; each line end becomes one blank.
    // A quote that ends its line leaves nothing to gather, and the value then
    // fails at its closing quote.
    gathered.clear();
    gatheredValid = cursor < lineEnd &&
                    gathered.append(cursor, static_cast<size_t>(lineEnd - cursor)) &&
                    gathered.append(' ');
    gathering = true;
    cursor = lineEnd;
    state = ATTRIBUTE_VALUE_MORE;
    return kGoOn;
}

int OxXmlReader::doAttributeValueMore() {
    char* close = find(cursor, quote);
    if (close == nullptr) {
        if (gatheredValid) {
            gatheredValid = gathered.append(cursor, static_cast<size_t>(lineEnd - cursor)) &&
                            gathered.append(' ');
        }
        cursor = lineEnd;
        return kGoOn;
    }
    gathering = false;
    if (!gatheredValid) {
        return kAbort;
    }
    if (!gathered.append(cursor, static_cast<size_t>(close - cursor))) {
        return kAbort;
    }
    if (attribute != nullptr) {
        attribute->setValue(gathered.text());
    }
    gathered.clear();
    cursor = close + 1;
    state = ATTRIBUTE;
    return kGoOn;
}

int OxXmlReader::doComment(bool cdata) {
    int kind = cdata ? 1 : 0;
    size_t length = static_cast<size_t>(lineEnd - cursor);
    if (!commentOpen[kind]) {
        commentOpen[kind] = true;
        commentNode[kind] =
            new (std::nothrow) OxXmlElement(OxXmlElement::XML_TYPE_COMMENT, nullptr);
        attach(commentNode[kind]);
        commentText[kind].clear();
        commentText[kind].expectAtMost(length + source.unconsumed());
        commentText[kind].append(cursor, length);
    } else {
        commentText[kind].append('\n');
        commentText[kind].append(cursor, length);
    }
    char const* marker = cdata ? OxXmlFile::OX_XML_CDATA_END : OxXmlFile::OX_XML_COMMENT_END;
    if (std::strstr(cursor, marker) != nullptr) {
        // The rest of the line is in the value but is not read.
        finishComment(cdata);
        state = CONTENT;
    }
    cursor = lineEnd;
    return kGoOn;
}

int OxXmlReader::doDoctype() {
    size_t length = static_cast<size_t>(lineEnd - cursor);
    if (file.doctype == nullptr) {
        OxXmlElement* node =
            new (std::nothrow) OxXmlElement(OxXmlElement::XML_TYPE_DOCTYPE, nullptr);
        file.doctype = node;
        attach(node);
        doctypeText.clear();
        doctypeText.append(cursor, length);
        doctypeLoaded = true;
    } else {
        if (!doctypeLoaded) {
            // A DOCTYPE of an earlier read: go on from its text.
            char const* old = file.doctype->getValue();
            doctypeText.clear();
            doctypeText.append(nameOrEmpty(old), std::strlen(nameOrEmpty(old)));
            doctypeLoaded = true;
        }
        doctypeText.append('\n');
        doctypeText.append(cursor, length);
    }
    char* close = find(cursor, '>');
    if (close != nullptr) {
        cursor = close + 1; // the rest of the line is read as content
        state = CONTENT;
    } else {
        cursor = lineEnd;
    }
    return kGoOn;
}

void OxXmlReader::createElement(char* tagStart, char* nameBegin, char* nameEnd, bool makeCurrent) {
    OxXmlElement* element = nullptr;
    withText(nameBegin, nameEnd,
             [&element](char const* text) { element = new (std::nothrow) OxXmlElement(text); });
    if (element == nullptr) {
        return; // no memory: the node is absent
    }
    if (file.root == nullptr) {
        file.root = element;
    } else if (current != nullptr) {
        current->addChild(element);
        element->setParent(current);
    } else {
        // A second element at top level has no parent to go to: it is kept
        // behind the root, where the writer writes it back.
        OxMsg::Log(OxMsgXmlSecondTopLevel, fileName(), lineNumber, offsetOf(tagStart),
                   nameOrEmpty(element->getName()));
        file.postRootNodes.append(element);
    }
    if (makeCurrent) {
        current = element;
    }
}

void OxXmlReader::closeByEndTag(char* tagStart, char* nameBegin) {
    if (current == nullptr) {
        return; // no open element: the end tag is ignored
    }
    char* nameEnd = nameBegin;
    while (nameEnd < lineEnd && *nameEnd != ' ' && *nameEnd != '>') {
        nameEnd++;
    }
    char const* openName = nameOrEmpty(current->getName());
    size_t length = static_cast<size_t>(nameEnd - nameBegin);
    if (std::strlen(openName) != length || std::strncmp(openName, nameBegin, length) != 0) {
        withText(nameBegin, nameEnd, [this, openName, tagStart](char const* endName) {
            OxMsg::Log(OxMsgXmlEndTagMismatch, fileName(), lineNumber, offsetOf(tagStart), endName,
                       openName);
        });
    }
    current = current->getParent();
}

void OxXmlReader::attach(OxXmlElement* node) {
    if (node == nullptr) {
        return;
    }
    if (current != nullptr) {
        current->addChild(node);
        node->setParent(current);
    } else if (file.root == nullptr) {
        file.preRootNodes.append(node);
    } else {
        file.postRootNodes.append(node);
    }
}

void OxXmlReader::finishComment(bool cdata) {
    int kind = cdata ? 1 : 0;
    if (commentNode[kind] != nullptr) {
        char* whole = commentText[kind].releaseLong();
        if (whole != nullptr) {
            commentNode[kind]->adoptValue(whole);
        } else {
            commentNode[kind]->setValue(commentText[kind].text());
        }
    }
    commentNode[kind] = nullptr;
    commentOpen[kind] = false;
    commentText[kind].clear();
}

void OxXmlReader::finish() {
    // What stands open at the end keeps what was gathered.
    if (commentOpen[0]) {
        finishComment(false);
    }
    if (commentOpen[1]) {
        finishComment(true);
    }
    if (doctypeLoaded && file.doctype != nullptr) {
        file.doctype->setValue(doctypeText.text());
    }
    if (gathering && gatheredValid && attribute != nullptr) {
        attribute->setValue(gathered.text());
    }
}

} // namespace detail
} // namespace oxbase

// ---------------------------------------------------------------------------
// The document

OxXmlFile::OxXmlFile(char const* filename, OxFile::OxIOType type) {
    open(filename, type);
}

OxXmlFile::~OxXmlFile() {
    delete input;
    delete output;
    delete root;
    delete declaration;
    for (unsigned int i = 0; i < preRootNodes.length; i++) {
        delete preRootNodes.data[i];
    }
    for (unsigned int i = 0; i < postRootNodes.length; i++) {
        delete postRootNodes.data[i];
    }
}

int OxXmlFile::open(char const* filename, OxFile::OxIOType type) {
    if (type == OxFile::OxIOInput) {
        delete input;
        input = new OxInput(filename, OxFile::FILE_MODE_TEXT);
        return input->isGood() ? 0 : -1;
    }
    if (type == OxFile::OxIOOutput) {
        delete output;
        output = new OxOutput(filename, OxFile::FILE_MODE_TEXT);
        return output->isGood() ? 0 : -1;
    }
    return 0;
}

OxBool OxXmlFile::isGood(OxFile::OxIOType type) const {
    if (type == OxFile::OxIOInput) {
        return OxToBool(input != nullptr && input->isGood());
    }
    if (type == OxFile::OxIOOutput) {
        return OxToBool(output != nullptr && output->isGood());
    }
    return OxFalse;
}

OxBool OxXmlFile::isDeclaration(char const* text) {
    return OxToBool(startsWith(text, OX_XML_DECLARATION_START));
}

OxBool OxXmlFile::isComment(char const* text) {
    return OxToBool(startsWith(text, OX_XML_COMMENT_START));
}

OxBool OxXmlFile::isDoctype(char const* text) {
    return OxToBool(startsWith(text, OX_XML_DOCTYPE));
}

OxBool OxXmlFile::isCdata(char const* text) {
    return OxToBool(startsWith(text, OX_XML_CDATA_START));
}

OxBool OxXmlFile::readFile() {
    if (input == nullptr || !input->isGood()) {
        return OxFalse;
    }
    if (!input->seek(0, 0)) {
        OxMsg::Log(OxMsgFileShortRead, nameOrEmpty(input->getFilename()));
        return OxFalse;
    }
    oxbase::detail::OxXmlReader reader(*this);
    OxBool result = reader.run();
    if (result && !input->isGood() && !input->eof()) {
        OxMsg::Log(OxMsgFileRead, nameOrEmpty(input->getFilename()));
        return OxFalse;
    }
    return result;
}

// ---------------------------------------------------------------------------
// The writer

void OxXmlFile::moveIndent(short to) {
    indent[curpos] = ' ';
    curpos = to;
    indent[to] = '\0';
}

void OxXmlFile::setIndent(short position) {
    if (position == curpos || position < 0 || position > kMaxIndent) {
        return;
    }
    moveIndent(position);
}

void OxXmlFile::adjustIndent(short delta) {
    int target = curpos + delta;
    if (target < 0 || target > kMaxIndent) {
        return;
    }
    moveIndent(static_cast<short>(target));
}

OxBool OxXmlFile::writeFile() {
    if (output == nullptr || !output->isGood()) {
        return OxFalse;
    }
    if (!output->seek(0, 0)) {
        OxMsg::Log(OxMsgFileShortRead, nameOrEmpty(output->getFilename()));
        return OxFalse;
    }
    if (declaration != nullptr) {
        if (declaration->getValue() != nullptr) {
            output->putline(declaration->getValue());
        }
    } else {
        // putline adds a second line end: an empty line follows.
        linePrt();
        LineBuffer line;
        line.field(curpos + 1, OX_XML_DECLARATION_START)
            .add(' ')
            .add(OX_XML_FIELD_VERSION)
            .add(OX_XML_ASSIGNMENT)
            .add(OX_XML_QUOTE)
            .add(OX_XML_VERSION)
            .add(OX_XML_QUOTE)
            .add(' ')
            .add(OX_XML_FIELD_ENCODING)
            .add(OX_XML_ASSIGNMENT)
            .add(OX_XML_QUOTE)
            .add("UTF-8")
            .add(OX_XML_QUOTE)
            .add(OX_XML_DECLARATION_END)
            .add('\n')
            .send(*output);
    }
    for (unsigned int i = 0; i < preRootNodes.length; i++) {
        writeTopLevelNode(preRootNodes.data[i]);
    }
    OxBool result = root != nullptr ? write(root) : OxTrue;
    for (unsigned int i = 0; i < postRootNodes.length; i++) {
        writeTopLevelNode(postRootNodes.data[i]);
    }
    // A failed line does not stop the writer (putline reports it), but the
    // stream stays failed, so the closing flush tells whether everything
    // reached the file: a document that did not is never reported written.
    if (output->flush() != OxTrue) {
        result = OxFalse;
    }
    OxMsg::Log(OxMsgXmlWritten, nameOrEmpty(output->getFilename()));
    return result;
}

void OxXmlFile::writeTopLevelNode(OxXmlElement const* node) {
    if (node == nullptr) {
        return;
    }
    if (node->getName() != nullptr) {
        write(node); // a second top-level element kept by the reader
    } else if (node->getValue() != nullptr) {
        output->putline(node->getValue());
    }
}

OxBool OxXmlFile::write(OxXmlElement const* element) {
    // Depth-first with an explicit stack, so that any depth is safe. The
    // lines and the indentation steps are those of the natural recursion:
    // up by one behind a start tag with children (dropped beyond 20), down by
    // one before its end tag (dropped below 0), and on a failure the levels
    // left early keep their step up.
    struct Frame {
        OxXmlElement const* element;
        unsigned int next;
    };
    linePrt();
    OxGList<Frame> stack;
    LineBuffer line;
    enum Visit { Done, Opened, Failed };
    auto visit = [this, &stack, &line](OxXmlElement const* node) -> Visit {
        if (node == nullptr) {
            return Done;
        }
        if (node->getName() == nullptr) {
            if (node->getValue() == nullptr) {
                return Failed;
            }
            output->putline(node->getValue()); // raw nodes stand at the margin
            return Done;
        }
        line.field(curpos + 1, OX_XML_START).add(node->getName());
        if (node->getValue() != nullptr) {
            line.add(OX_XML_END)
                .add(node->getValue())
                .add(OX_XML_START)
                .add(OX_XML_NODE_END)
                .add(node->getName())
                .add(OX_XML_END);
            return line.send(*output) ? Done : Failed;
        }
        for (unsigned int i = 0; i < node->getNbAttributes(); i++) {
            OxXmlAttribute const* attribute = node->getAttribute(i);
            if (attribute != nullptr && !line.addAttribute(*attribute)) {
                line.discard(); // the line in progress is not sent
                return Failed;
            }
        }
        if (node->getNbChildElements() == 0) {
            line.add(OX_XML_NODE_END).add(OX_XML_END);
            return line.send(*output) ? Done : Failed;
        }
        line.add(OX_XML_END);
        if (!line.send(*output)) {
            return Failed;
        }
        adjustIndent(1);
        stack.append(Frame{node, 0});
        return Opened;
    };
    if (visit(element) == Failed) {
        return OxFalse;
    }
    while (stack.length > 0) {
        Frame& top = stack.data[stack.length - 1];
        if (top.next < top.element->getNbChildElements()) {
            OxXmlElement const* child = top.element->getChild(top.next++);
            if (visit(child) == Failed) {
                return OxFalse;
            }
            continue;
        }
        adjustIndent(-1);
        line.field(curpos + 1, OX_XML_START)
            .add(OX_XML_NODE_END)
            .add(top.element->getName())
            .add(OX_XML_END);
        if (!line.send(*output)) {
            return OxFalse;
        }
        stack.length--;
    }
    return OxTrue;
}

// ---------------------------------------------------------------------------
// Dump

std::ostrstream* OxXmlFile::dump(std::ostrstream* stream) const {
    return dumpXML(stream);
}

std::ostrstream* OxXmlFile::dumpXML(std::ostrstream* stream) const {
    if (stream == nullptr) {
        return stream;
    }
    oxIndent(*stream) << "OxXmlFile :"
                      << "\n";
    if (input != nullptr) {
        oxIndent(*stream) << "  XML Input File Name: " << nameOrEmpty(input->getFilename()) << "\n";
    }
    if (output != nullptr) {
        oxIndent(*stream) << "  XML Output File Name: " << nameOrEmpty(output->getFilename())
                          << "\n";
    }
    if (declaration != nullptr) {
        declaration->dump(stream);
    }
    if (doctype != nullptr) {
        doctype->dump(stream);
    }
    for (unsigned int i = 0; i < preRootNodes.length; i++) {
        if (preRootNodes.data[i] != nullptr) {
            preRootNodes.data[i]->dump(stream);
        }
    }
    if (root != nullptr) {
        OxPrt::adjustIndent(2);
        root->dump(stream);
        OxPrt::adjustIndent(-2);
    }
    for (unsigned int i = 0; i < postRootNodes.length; i++) {
        if (postRootNodes.data[i] != nullptr) {
            postRootNodes.data[i]->dump(stream);
        }
    }
    return stream;
}
