#include "oxbase/doc/detail/OxXmlReader.h"

#include "oxbase/core/OxString.h"
#include "oxbase/diag/OxMsg.h"
#include "oxbase/diag/OxMsgNumbers.h"
#include "oxbase/doc/OxXmlAttribute.h"
#include "oxbase/doc/OxXmlElement.h"
#include "oxbase/doc/detail/OxXmlNames.h"
#include "oxbase/io/OxInput.h"

#include <cctype>
#include <cstring>
#include <iostream>
#include <memory>

namespace oxbase {
namespace detail {

namespace {
/// What ends a name inside a tag, by character: kTagName a tag name (a blank,
/// "/", ">"), kAttributeName an attribute name (those and "="). Both end at
/// the NUL that the reader puts behind each line, so a scan needs no bound.
enum : unsigned char { kTagName = 1, kAttributeName = 2 };
struct NameEnds {
    unsigned char of[256] = {};
    constexpr NameEnds() {
        of[static_cast<unsigned char>(' ')] = kTagName | kAttributeName;
        of[static_cast<unsigned char>('/')] = kTagName | kAttributeName;
        of[static_cast<unsigned char>('>')] = kTagName | kAttributeName;
        of[0] = kTagName | kAttributeName;
        of[static_cast<unsigned char>('=')] = kAttributeName;
    }
    bool ends(char c, unsigned char kind) const {
        return (of[static_cast<unsigned char>(c)] & kind) != 0;
    }
};
constexpr NameEnds kNameEnds;

} // namespace

OxBool OxXmlReader::run() {
    source.start(file.input->getFileLength());
    OxBool result = OxTrue;
    for (;;) {
        char* line = nullptr;
        size_t length = 0;
        OxLineSource::Result got = source.next(line, length);
        if (got == OxLineSource::End) {
            break;
        }
        if (got == OxLineSource::ReadFailure) {
            result = OxFalse;
            break;
        }
        lineNumber++;
        // A NUL byte cannot stand in a text: it is read as a blank. (The
        // scanners below also rely on the NUL behind the line being the
        // only one.)
        if (source.lineMayHoldNul()) {
            unsigned int nuls = 0;
            for (char* nul = static_cast<char*>(std::memchr(line, '\0', length)); nul != nullptr;
                 nul = static_cast<char*>(std::memchr(nul, '\0', length - (nul - line)))) {
                *nul = ' ';
                nuls++;
            }
            if (nuls > 0) {
                OxMsg::Log(OxMsgXmlNulBytes, fileName(), lineNumber, nuls);
            }
        }
        char* begin = line;
        char* end = line + length;
        OxXmlNames::trim(begin, end);
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
    std::unique_ptr<OxXmlElement> node(
        new OxXmlElement(OxXmlElement::XML_TYPE_DECLARATION, nullptr));
    node->setValue(cursor);
    delete file.declaration;
    file.declaration = node.release();
    char* end = std::strstr(cursor, OxXmlFile::OX_XML_DECLARATION_END);
    cursor = end != nullptr ? end + 2 : lineEnd;
    state = CONTENT;
    return kGoOn;
}

int OxXmlReader::doContent() {
    char* open = *cursor == '<' ? cursor : find(cursor, '<');
    if (open == nullptr) {
        cursor = lineEnd; // text between elements is ignored
        return kGoOn;
    }
    cursor = open;
    // Every marker begins "<?" or "<!": a tag needs none of the comparisons.
    if (open[1] == '?' || open[1] == '!') {
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
    }
    char* nameBegin = cursor + 1;
    while (nameBegin < lineEnd && *nameBegin == ' ') {
        nameBegin++;
    }
    char* nameEnd = nameBegin;
    while (!kNameEnds.ends(*nameEnd, kTagName)) {
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
        cursor = nameEnd + 2; // CONTENT would skip the ">" as text
        return kGoOn;
    }
    createElement(open, nameBegin, nameEnd, true);
    cursor = nameEnd + 1;
    if (*nameEnd == '>') {
        commitStartTag(nameEnd); // no attributes
        state = ELEMENT_VALUE;
        return kGoOn;
    }
    state = ATTRIBUTE;
    return cursor < lineEnd ? doAttribute() : kGoOn;
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
    if (current != nullptr && current->shape->kind == OxXmlShape::kTag) {
        // (A valued tag got this value with its record.)
        char* text = store.copyValue(cursor, static_cast<size_t>(valueEnd - cursor));
        static_cast<OxXmlTagRecord*>(current)->text = text;
        if (OxXmlElement* element = frames.data[frames.length - 1].element) {
            element->value = text; // kStoredValue since fromRecord
        }
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
    // One pass over the attributes of the line, the cursor in a local while
    // names are scanned, until the tag ends, the line does, or a value does
    // not close on its line. The states and cursors left behind are those of
    // a step per state.
    char* p = cursor;
    for (;;) {
        while (*p == ' ') {
            p++;
        }
        char* nameBegin = p;
        while (!kNameEnds.ends(*p, kAttributeName)) {
            p++;
        }
        char* nameEnd = p;
        while (*p == ' ') {
            p++;
        }
        cursor = p;
        if (p == lineEnd) {
            return kGoOn; // the tag goes on on the next line
        }
        switch (*p) {
        case '/':
            if (p[1] != '>') {
                return OxMsgXmlBadTagEnd;
            }
            commitTag(true); // an empty element tag: a leaf, never opened
            cursor = p + 2;  // CONTENT would skip the ">" as text
            state = CONTENT;
            return kGoOn;
        case '=': {
            openAttribute(nameBegin, nameEnd);
            cursor = p + 1;
            state = ATTRIBUTE_VALUE;
            int outcome = doAttributeValue();
            if (outcome != kGoOn || state != ATTRIBUTE) {
                return outcome; // an error, or a value that goes on
            }
            p = cursor;
            continue;
        }
        case '>':
            commitStartTag(p);
            cursor = p + 1;
            state = ELEMENT_VALUE;
            return kGoOn;
        default:
            continue; // a name without "=" is dropped
        }
    }
}

void OxXmlReader::openAttribute(char* nameBegin, char* nameEnd) {
    endAttribute();
    if (!tagOpen) {
        return;
    }
    tagNames.append(names.lookup(nameBegin, static_cast<size_t>(nameEnd - nameBegin)));
    // Its record gets it at the tag's end; its value comes next.
    attributeOpen = true;
    valueSet = false;
}

void OxXmlReader::endAttribute() {
    if (attributeOpen && !valueSet) {
        tagValues.append(" ", 2); // no value (OxXmlTagRecord)
    }
    attributeOpen = false;
}

int OxXmlReader::doAttributeValue() {
    char* p = cursor;
    while (*p == ' ') { // the NUL behind the line stops it
        p++;
    }
    cursor = p;
    if (p == lineEnd) {
        return kGoOn;
    }
    char open = *p;
    if (open != '"' && open != '\'') {
        return OxMsgXmlNoQuote;
    }
    quote = open;
    p++;
    auto* close = static_cast<char*>(std::memchr(p, open, static_cast<size_t>(lineEnd - p)));
    if (close != nullptr) {
        setAttributeValue(p, static_cast<size_t>(close - p));
        cursor = close + 1;
        state = ATTRIBUTE;
        return kGoOn;
    }
    cursor = p;
    // The value goes on on the next lines; each line end becomes one blank.
    // A quote that ends its line leaves nothing to gather, and the value then
    // fails at its closing quote.
    gathered.clear();
    gatheredValid = cursor < lineEnd;
    if (gatheredValid) {
        gathered.append(cursor, static_cast<size_t>(lineEnd - cursor));
        gathered.append(' ');
    }
    gathering = true;
    cursor = lineEnd;
    state = ATTRIBUTE_VALUE_MORE;
    return kGoOn;
}

int OxXmlReader::doAttributeValueMore() {
    char* close = find(cursor, quote);
    if (close == nullptr) {
        if (gatheredValid) {
            gathered.append(cursor, static_cast<size_t>(lineEnd - cursor));
            gathered.append(' ');
        }
        cursor = lineEnd;
        return kGoOn;
    }
    gathering = false;
    if (!gatheredValid) {
        return kAbort;
    }
    gathered.append(cursor, static_cast<size_t>(close - cursor));
    setAttributeValue(gathered.text(), gathered.size());
    gathered.clear();
    cursor = close + 1;
    state = ATTRIBUTE;
    return kGoOn;
}

int OxXmlReader::doComment(bool cdata) {
    int kind = cdata ? 1 : 0;
    size_t length = static_cast<size_t>(lineEnd - cursor);
    if (!commentOpen[kind]) {
        std::unique_ptr<OxXmlElement> node(
            new OxXmlElement(OxXmlElement::XML_TYPE_COMMENT, nullptr));
        attach(node.get());
        commentNode[kind] = node.release(); // its place in the document has it
        commentOpen[kind] = true;
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
        std::unique_ptr<OxXmlElement> node(
            new OxXmlElement(OxXmlElement::XML_TYPE_DOCTYPE, nullptr));
        attach(node.get());
        file.doctype = node.release(); // its place in the document has it
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
    commitTag(false);
    tagName = names.lookup(nameBegin, static_cast<size_t>(nameEnd - nameBegin));
    tagOpen = true;
    if (current == nullptr && file.root != nullptr) {
        // A second element at top level has no parent to go to: it is
        // kept behind the root, where the writer writes it back.
        OxMsg::Log(OxMsgXmlSecondTopLevel, fileName(), lineNumber, offsetOf(tagStart),
                   nameOrEmpty(tagName));
    }
    if (!makeCurrent) {
        commitTag(true); // an empty element tag without attributes
    }
}

void OxXmlReader::commitStartTag(char* close) {
    // What doElementValue will find behind the ">" on this line.
    char* p = close + 1;
    while (p < lineEnd && *p == ' ') {
        p++;
    }
    if (p < lineEnd && *p == '<') {
        char* q = p + 1;
        while (q < lineEnd && *q == ' ') {
            q++;
        }
        // An end tag right behind: no value, no children, but it is the end
        // tag that closes the element (and tells a name that differs).
        commitTag(*q == '/' ? OxXmlShape::kLeaf : OxXmlShape::kTag, nullptr, 0, true);
        return;
    }
    if (p == lineEnd) {
        commitTag(OxXmlShape::kTag);
        return;
    }
    char* open = find(p, '<');
    char* valueEnd = open != nullptr ? open : lineEnd;
    commitTag(OxXmlShape::kValued, p, static_cast<size_t>(valueEnd - p));
}

void OxXmlReader::commitTag(OxXmlShape::Kind kind, char const* value, size_t valueLength,
                            bool open) {
    endAttribute();
    if (!tagOpen) {
        return;
    }
    if (kind == OxXmlShape::kValued) {
        // Trimmed as setValue trims: white space alone is an empty text.
        char const* first = value;
        char const* last = value + valueLength;
        OxXmlNames::trim(first, last);
        tagValues.append(first, static_cast<size_t>(last - first));
        tagValues.append('\0');
    }
    OxXmlShape const* shape = store.tagShape(tagName, tagNames.data, tagNames.length, kind);
    OxXmlRecord* record = store.newTag(shape, tagValues.text(), tagValues.size());
    tagOpen = false;
    tagNames.length = 0;
    tagValues.clear();
    OxXmlElement* element = nullptr;
    if (current != nullptr) {
        link(record);
    } else {
        element = OxXmlElement::fromRecord(record, true);
        if (file.root == nullptr) {
            file.root = element;
        } else {
            try {
                file.postRootNodes.append(element);
            } catch (const std::bad_alloc&) {
                OxXmlElement::release(element); // an element of the store
                throw;
            }
        }
    }
    if (open || kind != OxXmlShape::kLeaf) {
        frames.append(Frame{record, nullptr, element});
        current = record;
    }
}

void OxXmlReader::link(OxXmlRecord* record) {
    Frame& frame = frames.data[frames.length - 1];
    if (frame.last == nullptr) {
        // Only a start tag (kTag) gets children: a valued tag or an opened
        // leaf is closed by the end tag behind it before anything else is
        // read.
        static_cast<OxXmlTagRecord*>(frame.record)->first = record;
    } else {
        frame.last->next = record;
    }
    frame.last = record;
}

void OxXmlReader::closeByEndTag(char* tagStart, char* nameBegin) {
    if (current == nullptr) {
        return; // no open element: the end tag is ignored
    }
    char* nameEnd = nameBegin;
    while (nameEnd < lineEnd && *nameEnd != ' ' && *nameEnd != '>') {
        nameEnd++;
    }
    char const* openName = nameOrEmpty(current->shape->name);
    size_t length = static_cast<size_t>(nameEnd - nameBegin);
    if (std::strlen(openName) != length || std::strncmp(openName, nameBegin, length) != 0) {
        withText(nameBegin, nameEnd, [this, openName, tagStart](char const* endName) {
            OxMsg::Log(OxMsgXmlEndTagMismatch, fileName(), lineNumber, offsetOf(tagStart), endName,
                       openName);
        });
    }
    closeCurrent();
}

void OxXmlReader::attach(OxXmlElement* node) {
    if (node == nullptr) {
        return;
    }
    if (current != nullptr) {
        link(store.newNode(node));
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
    if (gathering && gatheredValid) {
        setAttributeValue(gathered.text(), gathered.size());
    }
    commitTag(false); // a tag the input left open stays open
    if (commentOpen[0]) {
        finishComment(false);
    }
    if (commentOpen[1]) {
        finishComment(true);
    }
    if (doctypeLoaded && file.doctype != nullptr) {
        file.doctype->setValue(doctypeText.text());
    }
    while (current != nullptr) {
        closeCurrent(); // the elements still open get their children
    }
}

void OxXmlReader::closeCurrent() {
    frames.length--;
    current = frames.length > 0 ? frames.data[frames.length - 1].record : nullptr;
}

} // namespace detail
} // namespace oxbase
