#include "oxbase/doc/OxXmlFile.h"

#include "oxbase/core/OxString.h"
#include "oxbase/core/detail/OxNoMemory.h"
#include "oxbase/diag/OxMsg.h"
#include "oxbase/diag/OxMsgNumbers.h"
#include "oxbase/doc/detail/OxXmlReader.h"
#include "oxbase/doc/detail/OxXmlRecords.h"
#include "oxbase/doc/detail/OxXmlStore.h"
#include "oxbase/doc/detail/OxXmlTextBuffer.h"
#include "oxbase/io/OxInput.h"
#include "oxbase/io/OxOutput.h"

#include <cctype>
#include <cstring>
#include <iostream>
#include <memory>
#include <new>

using namespace oxbase::detail;

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

/// One line of the writer, built in a buffer that every line reuses and
/// handed to the sink from there: a line costs no allocation and no copy but
/// the output's own, where building it in a print stream and taking it out
/// with flushToString cost a stream reset, a new array and a copy per line.
/// The text is the same as that of the print stream.
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
        return addAttribute(attribute.getName(), attribute.getValue());
    }
    /// The same for an attribute of that name and value.
    bool addAttribute(char const* name, char const* value) {
        if (name == nullptr) {
            return false;
        }
        if (value != nullptr) {
            add(' ').add(name).add('=').add('"').add(value).add('"');
        }
        return true;
    }
    /// Hands the line to `sink` and starts the next.
    void send(OxXmlLineSink& sink);
    /// Drops the line in progress.
    void discard() { text.clear(); }

private:
    LineBuffer& add(char const* part, size_t count) {
        text.append(part, count);
        return *this;
    }

    OxXmlTextBuffer text;
};
} // namespace

namespace oxbase {
namespace detail {

/// Where the writer's finished lines go. Flushing every line, each goes to
/// OxOutput::putline (a write and a flush per line). Otherwise the lines are
/// gathered, each with its line end, and handed to OxOutput::write in blocks
/// of about 64 KiB, so that the stream is called once per block; finish
/// hands over the rest. The bytes that reach the output are the same, and a
/// failed block is reported by the output (message 179) and leaves it failed.
class OxXmlLineSink {
public:
    OxXmlLineSink(OxOutput& out, bool flushEveryLine) : output(out), perLine(flushEveryLine) {
        if (!perLine) {
            pending.reserveFor(kBlock + kBlock / 4);
        }
    }
    /// One line, `length` characters at `text` (NUL-terminated), without its
    /// line end. Without memory std::bad_alloc, and the line is not taken.
    void line(char const* text, size_t length) {
        if (perLine) {
            output.putline(text);
            return;
        }
        pending.reserveFor(pending.size() + length + 1);
        pending.append(text, length);
        pending.append('\n');
        if (pending.size() >= kBlock) {
            finish();
        }
    }
    /// Hands every gathered line to the output.
    void finish() {
        if (pending.size() > 0) {
            output.write(pending.text(), static_cast<long long>(pending.size()));
            pending.clear();
        }
    }

private:
    static constexpr size_t kBlock = 64 * 1024;
    OxOutput& output;
    bool perLine;
    OxXmlTextBuffer pending;
};

} // namespace detail
} // namespace oxbase

void LineBuffer::send(OxXmlLineSink& sink) {
    sink.line(text.text(), text.size());
    discard();
}

// ---------------------------------------------------------------------------
// The document

OxXmlFile::OxXmlFile(char const* filename, OxFile::OxIOType type) {
    open(filename, type);
}

OxXmlFile::~OxXmlFile() {
    delete input;
    delete output;
    clearDocument();
    delete store; // behind the nodes built there
}

void OxXmlFile::clearDocument() {
    OxXmlElement::release(root);
    root = nullptr;
    OxXmlElement::release(declaration);
    declaration = nullptr;
    doctype = nullptr; // a node of the lists or of the tree
    for (unsigned int i = 0; i < preRootNodes.length; i++) {
        OxXmlElement::release(preRootNodes.data[i]);
    }
    preRootNodes.length = 0;
    for (unsigned int i = 0; i < postRootNodes.length; i++) {
        OxXmlElement::release(postRootNodes.data[i]);
    }
    postRootNodes.length = 0;
}

int OxXmlFile::open(char const* filename, OxFile::OxIOType type) {
    if (type == OxFile::OxIOInput) {
        delete input;
        input = nullptr; // closed first, so that nothing holds the file
        input = new OxInput(filename, OxFile::FILE_MODE_TEXT);
        return input->isGood() ? 0 : -1;
    }
    if (type == OxFile::OxIOOutput) {
        delete output;
        output = nullptr; // closed first: the new output may replace the file
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
    OxBool result = OxFalse;
    if (!withMemory([&] {
            if (store == nullptr) {
                store = new OxXmlStore;
            }
            oxbase::detail::OxXmlReader reader(*this);
            result = reader.run();
        })) {
        // No part of a document: what was read before the failure goes,
        // and so does the store it was built in.
        reportNoMemory();
        clearDocument();
        delete store;
        store = nullptr;
        return OxFalse;
    }
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
    OxBool result = OxFalse;
    std::unique_ptr<OxXmlLineSink> sink;
    short indentBefore = curpos;
    if (!withMemory([&] {
            sink.reset(new OxXmlLineSink(*output, flushEveryLine != OxFalse));
            result = writeDocument(*sink);
        })) {
        reportNoMemory(); // the lines finished so far still go to the file
        result = OxFalse;
        // The attributes of an element are built when it is written, so
        // memory may run out deep in the tree: the indentation goes back to
        // where the document began.
        setIndent(indentBefore);
    }
    if (sink != nullptr) {
        sink->finish();
    }
    // A failed line does not stop the writer (the output reports it), but
    // the stream stays failed, so the closing flush tells whether everything
    // reached the file: a document that did not is never reported written.
    if (output->flush() != OxTrue) {
        result = OxFalse;
    }
    OxMsg::Log(OxMsgXmlWritten, nameOrEmpty(output->getFilename()));
    return result;
}

OxBool OxXmlFile::writeDocument(OxXmlLineSink& sink) {
    if (declaration != nullptr) {
        if (declaration->getValue() != nullptr) {
            sink.line(declaration->getValue(), std::strlen(declaration->getValue()));
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
            .send(sink);
    }
    for (unsigned int i = 0; i < preRootNodes.length; i++) {
        writeTopLevelNode(preRootNodes.data[i], sink);
    }
    OxBool result = root != nullptr ? write(root, sink) : OxTrue;
    for (unsigned int i = 0; i < postRootNodes.length; i++) {
        writeTopLevelNode(postRootNodes.data[i], sink);
    }
    return result;
}

void OxXmlFile::writeTopLevelNode(OxXmlElement const* node, OxXmlLineSink& sink) {
    if (node == nullptr) {
        return;
    }
    if (node->getName() != nullptr) {
        write(node, sink); // a second top-level element kept by the reader
    } else if (node->getValue() != nullptr) {
        sink.line(node->getValue(), std::strlen(node->getValue()));
    }
}

OxBool OxXmlFile::write(OxXmlElement const* element, OxXmlLineSink& sink) {
    // Depth-first with an explicit stack, so that any depth is safe. The
    // lines and the indentation steps are those of the natural recursion:
    // up by one behind a start tag with children (dropped beyond 20), down by
    // one before its end tag (dropped below 0), and on a failure the levels
    // left early keep their step up. Children that nobody asked for are
    // written straight from their records, without building them (see
    // OxXmlElement): a frame then walks the records instead of a list.
    struct Frame {
        OxXmlElement const* element; ///< null for a frame of records
        unsigned int next;
        OxXmlRecord* record; ///< the next child record
        char const* name;    ///< for the end tag
    };
    linePrt();
    OxGList<Frame> stack;
    LineBuffer line;
    enum Visit { Done, Opened, Failed };
    // The start tag of `name` with `value` and the attributes that
    // `addAttributes` adds; then its children, if `hasChildren`, as `frame`.
    auto tag = [&stack, &line, &sink](char const* name, char const* value, auto addAttributes,
                                      bool hasChildren, Frame frame) -> Visit {
        line.field(curpos + 1, OX_XML_START).add(name);
        if (value != nullptr) {
            line.add(OX_XML_END)
                .add(value)
                .add(OX_XML_START)
                .add(OX_XML_NODE_END)
                .add(name)
                .add(OX_XML_END);
            line.send(sink);
            return Done;
        }
        if (!addAttributes()) {
            line.discard(); // the line in progress is not sent
            return Failed;
        }
        if (!hasChildren) {
            line.add(OX_XML_NODE_END).add(OX_XML_END);
            line.send(sink);
            return Done;
        }
        line.add(OX_XML_END);
        line.send(sink);
        adjustIndent(1);
        stack.append(frame);
        return Opened;
    };
    // The attributes of a read tag that nobody asked for are written as
    // they were read, without building them.
    auto recordAttributes = [&line](OxXmlRecord* record) {
        bool named = true;
        record->forEachTagAttribute([&line, &named](char const* name, char const* value) {
            named = named && line.addAttribute(name, value);
        });
        return named;
    };
    auto visit = [&tag, &line, &sink, &recordAttributes](OxXmlElement const* node) -> Visit {
        if (node == nullptr) {
            return Done;
        }
        if (node->getName() == nullptr) {
            if (node->getValue() == nullptr) {
                return Failed;
            }
            // Raw nodes stand at the margin.
            sink.line(node->getValue(), std::strlen(node->getValue()));
            return Done;
        }
        auto attributes = [node, &line, &recordAttributes]() {
            if (OxXmlRecord* record = node->pendingTag()) {
                return recordAttributes(record);
            }
            unsigned int count = node->getNbAttributes();
            for (unsigned int i = 0; i < count; i++) {
                OxXmlAttribute const* attribute = node->getAttribute(i);
                if (attribute != nullptr && !line.addAttribute(*attribute)) {
                    return false;
                }
            }
            return true;
        };
        if ((node->storage & OxXmlElement::kPendingChildren) != 0) {
            OxXmlRecord* first = node->childRecords->firstChild();
            return tag(node->getName(), node->getValue(), attributes, first != nullptr,
                       Frame{nullptr, 0, first, node->getName()});
        }
        return tag(node->getName(), node->getValue(), attributes, node->getNbChildElements() != 0,
                   Frame{node, 0, nullptr, node->getName()});
    };
    // A record of a read document (a CSV record never stands in an XML tree).
    auto visitRecord = [&tag, &visit, &sink, &recordAttributes](OxXmlRecord* record) -> Visit {
        if (record->shape->kind == OxXmlShape::kNode) {
            return visit(static_cast<OxXmlNodeRecord*>(record)->node);
        }
        if (!record->shape->isTag()) {
            return Failed;
        }
        OxXmlRecord* read = record;
        if (read->shape->name == nullptr) {
            // A tag without a name is written as the raw node it reads as.
            if (read->value() == nullptr) {
                return Failed;
            }
            sink.line(read->value(), std::strlen(read->value()));
            return Done;
        }
        return tag(
            read->shape->name, read->value(),
            [read, &recordAttributes]() { return recordAttributes(read); },
            read->firstChild() != nullptr,
            Frame{nullptr, 0, read->firstChild(), read->shape->name});
    };
    if (visit(element) == Failed) {
        return OxFalse;
    }
    while (stack.length > 0) {
        Frame& top = stack.data[stack.length - 1];
        if (top.element == nullptr && top.record != nullptr) {
            OxXmlRecord* child = top.record;
            top.record = child->next;
            if (visitRecord(child) == Failed) {
                return OxFalse;
            }
            continue;
        }
        if (top.element != nullptr && top.next < top.element->getNbChildElements()) {
            OxXmlElement const* child = top.element->getChild(top.next++);
            if (visit(child) == Failed) {
                return OxFalse;
            }
            continue;
        }
        adjustIndent(-1);
        line.field(curpos + 1, OX_XML_START).add(OX_XML_NODE_END).add(top.name).add(OX_XML_END);
        line.send(sink);
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
