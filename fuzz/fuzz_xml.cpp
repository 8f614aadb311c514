// XML documents: reads the input as a document file, reads the tree the way
// callers do (typed getters, dump), and checks the round trip of a document
// that reads without error (readFile OxTrue, no message of type E or worse).
//
// The property. The document format is lossy by definition: an element with
// a value loses its attributes and children on write, a comment inside an
// element moves to the margin, text between elements is dropped, nothing is
// escaped, values are trimmed. So read(write(read(x))) is not read(x), and
// the first tree is not compared. What must hold is that the first write
// reaches a form the reader and writer keep: with T1 = read(x), W1 =
// write(T1), T2 = read(W1), W2 = write(T2), T3 = read(W2), W3 = write(T3):
//   - writeFile(T1) fails exactly when the root tree has a node the writer
//     cannot write (no name and no value, or an attribute without a name on
//     an element written with its attributes);
//   - T2 and T3 read without error and write without failure;
//   - T2 and T3 have the same tree: names, types, values, attributes with a
//     value (one without a value has no written form) and children;
//   - W2 and W3 are the same bytes.
// And for every input: T1 written before any of its nodes was asked for
// (straight from the reader's records) gives the same answer and the same
// bytes as after every node was built.
//
// Documents with these features are only read, dumped and written, not
// checked, because the described behaviour breaks even that property:
//   - markup behind "?>" on the declaration's line, or behind the ">" that
//     ends a DOCTYPE on its line: the reader reads it as content and also
//     keeps it in the node's text, and the writer sends the text back, so
//     every round adds the markup once more;
//   - a comment, CDATA section or DOCTYPE still open at the end of the input
//     (found conservatively: the last marker in the input has no end behind
//     it): the writer puts the closing tags of the open elements behind its
//     text, and the next read takes them into it;
//   - an element whose name begins with "!--", "![CDATA[", "!DOCTYPE" or
//     "?xml" (a blank behind "<" in the input): written as "<" and the name,
//     it reads back as that construct;
//   - an element name holding "<": the reader skips an end tag as text only
//     up to the next "<", so the end tag the writer makes for it opens a tag;
//   - an element or attribute name of white space alone (a tab, or a NUL
//     read as a blank): it is stored as an empty text, written as nothing,
//     and read back as no name, which the writer refuses;
//   - an element without a name that has a value ("<>" and text): the
//     writer writes the value alone on its line, which the next read drops
//     as text between elements, or takes for the value of the element whose
//     start tag stands on the line before (and then wants its end tag);
//   - an attribute value holding a double quote: the writer quotes with
//     double quotes and escapes nothing, so the value ends early and what
//     follows is read as markup;
//   - a second element at top level (message 568): it is kept behind the
//     root, out of reach of getRoot, so the features above cannot be ruled
//     out in it.
#include "OxFuzzSupport.h"

#include "oxbase/diag/OxMsg.h"
#include "oxbase/diag/OxMsgNumbers.h"
#include "oxbase/doc/OxXmlFile.h"
#include "oxbase/geom/OxColor.h"
#include "oxbase/geom/OxVec.h"

#include <cstdint>
#include <cstring>
#include <string>

namespace {

/// Calls `visit` on every element of the tree below and with `root`,
/// without recursion (a fuzzed document may nest deeply).
template <class Visit> void forEachElement(OxXmlElement const* root, Visit visit) {
    OxGList<OxXmlElement const*> pending;
    pending.append(root);
    while (pending.getLength() > 0) {
        OxXmlElement const* element = pending.data[--pending.length];
        if (element == nullptr) {
            continue;
        }
        visit(*element);
        for (unsigned int i = element->getNbChildElements(); i-- > 0;) {
            pending.append(element->getChild(i));
        }
    }
}

/// Reads every element the way callers do: typed getters and lookups.
void readTree(OxXmlElement const* root) {
    forEachElement(root, [](OxXmlElement const& element) {
        OxColor color;
        OxVec2d point2;
        OxVec3d point3;
        OxVec4d point4;
        OxGList<unsigned int> indices;
        element.getColor(color);
        element.getPoint(point2);
        element.getPoint(point3);
        element.getPoint(point4);
        element.getIndices(&indices);
        element.getChildByName("part");
        element.getChildrenByName("point");
        element.isYes("visible");
    });
}

bool startsWith(char const* text, char const* prefix) {
    return text != nullptr && std::strncmp(text, prefix, std::strlen(prefix)) == 0;
}

/// Whether the last `marker` in `text` has no `end` behind it.
bool endsInside(const std::string& text, const char* marker, const char* end) {
    size_t last = text.rfind(marker);
    return last != std::string::npos && text.find(end, last) == std::string::npos;
}

/// Whether a line that holds `marker` has a "<" behind the first `end`
/// that follows the marker (that end may stand on a later line).
bool markupBehind(const std::string& text, const char* marker, const char* end) {
    for (size_t at = text.find(marker); at != std::string::npos; at = text.find(marker, at + 1)) {
        size_t close = text.find(end, at);
        if (close == std::string::npos) {
            return false;
        }
        size_t lineEnd = text.find('\n', close);
        size_t open = text.find('<', close);
        if (open != std::string::npos && (lineEnd == std::string::npos || open < lineEnd)) {
            return true;
        }
    }
    return false;
}

/// The features of the root tree for which the property is not checked.
bool hasLossyElement(OxXmlElement const* root) {
    bool lossy = false;
    forEachElement(root, [&lossy](OxXmlElement const& element) {
        for (char const* marker : {"!--", "![CDATA[", "!DOCTYPE", "?xml"}) {
            lossy = lossy || startsWith(element.getName(), marker);
        }
        char const* name = element.getName();
        lossy = lossy || (name == nullptr && element.getType() == OxXmlElement::XML_TYPE_ELEMENT &&
                          element.getValue() != nullptr);
        lossy = lossy || (name != nullptr && (*name == '\0' || std::strchr(name, '<') != nullptr));
        for (unsigned int i = 0; i < element.getNbAttributes(); i++) {
            OxXmlAttribute const* attribute = element.getAttribute(i);
            if (attribute == nullptr) {
                continue;
            }
            lossy = lossy || (attribute->getName() != nullptr && *attribute->getName() == '\0') ||
                    (attribute->getValue() != nullptr &&
                     std::strchr(attribute->getValue(), '"') != nullptr);
        }
    });
    return lossy;
}

/// Whether the writer must fail on the root tree: a node with neither name
/// nor value, or a nameless attribute on an element written with its
/// attributes (one with a name and no value).
bool hasUnwritableNode(OxXmlElement const* root) {
    bool unwritable = false;
    forEachElement(root, [&unwritable](OxXmlElement const& element) {
        if (element.getName() == nullptr) {
            unwritable = unwritable || element.getValue() == nullptr;
            return;
        }
        if (element.getValue() != nullptr) {
            return;
        }
        for (unsigned int i = 0; i < element.getNbAttributes(); i++) {
            OxXmlAttribute const* attribute = element.getAttribute(i);
            unwritable = unwritable || (attribute != nullptr && attribute->getName() == nullptr);
        }
    });
    return unwritable;
}

std::string textOf(char const* text) {
    return text != nullptr ? std::string("\"") + text + "\"" : std::string("null");
}

bool sameText(char const* a, char const* b) {
    return (a == nullptr && b == nullptr) ||
           (a != nullptr && b != nullptr && std::strcmp(a, b) == 0);
}

/// The attributes that have a value, in order.
OxGList<OxXmlAttribute const*> valuedAttributes(OxXmlElement const& element) {
    OxGList<OxXmlAttribute const*> list;
    for (unsigned int i = 0; i < element.getNbAttributes(); i++) {
        OxXmlAttribute const* attribute = element.getAttribute(i);
        if (attribute != nullptr && attribute->getValue() != nullptr) {
            list.append(attribute);
        }
    }
    return list;
}

/// Compares two trees node by node, without recursion; a difference aborts
/// with the path of the node.
void checkSameTree(OxXmlElement const* first, OxXmlElement const* second) {
    struct Pair {
        OxXmlElement const* a;
        OxXmlElement const* b;
    };
    OxGList<Pair> pending;
    pending.append(Pair{first, second});
    while (pending.getLength() > 0) {
        Pair pair = pending.data[--pending.length];
        OXFUZZ_CHECK((pair.a == nullptr) == (pair.b == nullptr), "one tree has a node, one not");
        if (pair.a == nullptr) {
            continue;
        }
        OxXmlElement const& a = *pair.a;
        OxXmlElement const& b = *pair.b;
        OXFUZZ_CHECK(sameText(a.getName(), b.getName()) && a.getType() == b.getType(),
                     "element %s (type %d) became %s (type %d)", textOf(a.getName()).c_str(),
                     a.getType(), textOf(b.getName()).c_str(), b.getType());
        OXFUZZ_CHECK(sameText(a.getValue(), b.getValue()), "element %s: value %s became %s",
                     textOf(a.getName()).c_str(), oxfuzz::shown(textOf(a.getValue())).c_str(),
                     oxfuzz::shown(textOf(b.getValue())).c_str());
        OxGList<OxXmlAttribute const*> attributesA = valuedAttributes(a);
        OxGList<OxXmlAttribute const*> attributesB = valuedAttributes(b);
        OXFUZZ_CHECK(attributesA.getLength() == attributesB.getLength(),
                     "element %s: %u attributes became %u", textOf(a.getName()).c_str(),
                     attributesA.getLength(), attributesB.getLength());
        for (unsigned int i = 0; i < attributesA.getLength(); i++) {
            OxXmlAttribute const* x = attributesA[i];
            OxXmlAttribute const* y = attributesB[i];
            OXFUZZ_CHECK(sameText(x->getName(), y->getName()) &&
                             sameText(x->getValue(), y->getValue()),
                         "element %s: attribute %s=%s became %s=%s", textOf(a.getName()).c_str(),
                         oxfuzz::shown(textOf(x->getName())).c_str(),
                         oxfuzz::shown(textOf(x->getValue())).c_str(),
                         oxfuzz::shown(textOf(y->getName())).c_str(),
                         oxfuzz::shown(textOf(y->getValue())).c_str());
        }
        OXFUZZ_CHECK(a.getNbChildElements() == b.getNbChildElements(),
                     "element %s: %u children became %u", textOf(a.getName()).c_str(),
                     a.getNbChildElements(), b.getNbChildElements());
        for (unsigned int i = a.getNbChildElements(); i-- > 0;) {
            pending.append(Pair{a.getChild(i), b.getChild(i)});
        }
    }
}

/// Whether the read went without a message of type E or worse.
bool readCleanly(OxXmlFile& document) {
    oxfuzz::forgetLogged();
    OxBool read = document.readFile();
    return read == OxTrue && OxMsg::getErrorCode() < OxErrorError;
}

/// Writes `document` to `path` from the left margin; OxTrue when written whole.
OxBool writeTo(OxXmlFile& document, const std::string& path) {
    OxXmlFile::setIndent(0);
    if (document.open(path.c_str(), OxFile::OxIOOutput) != 0) {
        return OxFalse;
    }
    return document.writeFile();
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, size_t size) {
    oxfuzz::startMessages();
    static const std::string input = oxfuzz::scratchFile("input.xml");
    static const std::string written[] = {oxfuzz::scratchFile("write1.xml"),
                                          oxfuzz::scratchFile("write2.xml"),
                                          oxfuzz::scratchFile("write3.xml")};
    static const std::string untouchedOut = oxfuzz::scratchFile("untouched.xml");
    oxfuzz::writeFile(input, data, size);

    OxBool untouchedWrite = OxFalse;
    {
        OxXmlFile untouched(input.c_str(), OxFile::OxIOInput);
        untouched.readFile();
        untouchedWrite = writeTo(untouched, untouchedOut);
    }
    OxXmlFile first(input.c_str(), OxFile::OxIOInput);
    bool clean = readCleanly(first);
    bool secondTopLevel = oxfuzz::wasLogged(OxMsgXmlSecondTopLevel);
    readTree(first.getRoot());
    std::ostrstream dumped;
    first.dump(&dumped);
    dumped.freeze(false);
    OxBool firstWrite = writeTo(first, written[0]);
    OXFUZZ_CHECK(firstWrite == untouchedWrite, "writeFile answered %d untouched, %d built",
                 untouchedWrite, firstWrite);
    OXFUZZ_CHECK(oxfuzz::readFile(untouchedOut) == oxfuzz::readFile(written[0]),
                 "the writes before and after building differ:\n%s\n----\n%s",
                 oxfuzz::shown(oxfuzz::readFile(untouchedOut), 2000).c_str(),
                 oxfuzz::shown(oxfuzz::readFile(written[0]), 2000).c_str());
    if (!clean) {
        return 0;
    }
    std::string text(reinterpret_cast<const char*>(data), size);
    std::string write1 = oxfuzz::readFile(written[0]);
    std::string declarationLine = write1.substr(0, write1.find('\n'));
    if (secondTopLevel || hasLossyElement(first.getRoot()) || endsInside(text, "<!--", "-->") ||
        endsInside(text, "<![CDATA[", "]]>") || endsInside(text, "<!DOCTYPE", ">") ||
        markupBehind(declarationLine, "<?xml", "?>") || markupBehind(text, "<!DOCTYPE", ">")) {
        return 0;
    }
    OXFUZZ_CHECK(firstWrite == (hasUnwritableNode(first.getRoot()) ? OxFalse : OxTrue),
                 "writeFile of the first tree answered %d", firstWrite);

    OxXmlFile second(written[0].c_str(), OxFile::OxIOInput);
    OXFUZZ_CHECK(readCleanly(second), "the first write does not read back (error code %d)",
                 OxMsg::getErrorCode());
    OXFUZZ_CHECK(writeTo(second, written[1]) == OxTrue, "the second write failed");
    OxXmlFile third(written[1].c_str(), OxFile::OxIOInput);
    OXFUZZ_CHECK(readCleanly(third), "the second write does not read back (error code %d)",
                 OxMsg::getErrorCode());
    checkSameTree(second.getRoot(), third.getRoot());
    OXFUZZ_CHECK(writeTo(third, written[2]) == OxTrue, "the third write failed");
    std::string write2 = oxfuzz::readFile(written[1]);
    std::string write3 = oxfuzz::readFile(written[2]);
    OXFUZZ_CHECK(write2 == write3, "the second and third writes differ:\n%s\n----\n%s",
                 oxfuzz::shown(write2, 2000).c_str(), oxfuzz::shown(write3, 2000).c_str());
    return 0;
}
