// OxXmlFile.h: an XML document on disk, its line-oriented reader and writer.
//
// OxXmlFile opens a text-mode OxInput or OxOutput on a file and holds the
// document: the declaration, the element tree under one root, and the
// comment, CDATA and DOCTYPE nodes before and behind the root. The reader
// handles the subset of XML that the writer produces: one tag per line or
// several, attribute values over several lines, no entities decoded and
// nothing escaped. Syntax errors are logged (566 with the place, then the
// error's number) and make readFile answer OxFalse.
//
//   OxXmlFile in("assembly.xml", OxFile::OxIOInput);
//   if (in.readFile()) in.getRoot()->getChildByName("part");
//   in.open("copy.xml", OxFile::OxIOOutput);  in.writeFile();
#ifndef OXBASE_DOC_OXXMLFILE_H
#define OXBASE_DOC_OXXMLFILE_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/core/OxGList.h"
#include "oxbase/core/OxTypes.h"
#include "oxbase/diag/OxPrt.h"
#include "oxbase/doc/OxXmlElement.h"
#include "oxbase/io/OxFile.h"

class OxInput;
class OxOutput;

namespace oxbase {
namespace detail {
class OxXmlReader;
class OxXmlLineSink;
class OxXmlStore;
} // namespace detail
} // namespace oxbase

class OXBASE_API OxXmlFile {
public:
    // The vocabulary of documents. Markers and literals the reader and writer
    // use, and names of attributes and elements for callers.
    static char const* const OX_XML_UNKNOWN;           ///< "UNKNOWN"
    static char const* const OX_XML_ASSIGNMENT;        ///< "="
    static char const* const OX_XML_DECLARATION_START; ///< "<?xml"
    static char const* const OX_XML_DECLARATION_END;   ///< "?>"
    static char const* const OX_XML_COMMENT_START;     ///< "<!--"
    static char const* const OX_XML_COMMENT_END;       ///< "-->"
    static char const* const OX_XML_QUOTE;             ///< "\""
    static char const* const OX_XML_START;             ///< "<"
    static char const* const OX_XML_END;               ///< ">"
    static char const* const OX_XML_NODE_END;          ///< "/"
    static char const* const OX_XML_DOCTYPE;           ///< "<!DOCTYPE"
    static char const* const OX_XML_CDATA_START;       ///< "<![CDATA["
    static char const* const OX_XML_CDATA_END;         ///< "]]>"
    static char const* const OX_XML_ELEMENT_ELEMENT;   ///< "element"
    static char const* const OX_XML_ELEMENT_LIST;      ///< "list"
    static char const* const OX_XML_FIELD_COLOR;       ///< "color"
    static char const* const OX_XML_FIELD_ENCODING;    ///< "encoding"
    static char const* const OX_XML_FIELD_END;         ///< "end"
    static char const* const OX_XML_FIELD_INDICES;     ///< "indices"
    static char const* const OX_XML_FIELD_LENGTH;      ///< "length"
    static char const* const OX_XML_FIELD_MATRIX;      ///< "matrix"
    static char const* const OX_XML_FIELD_NAME;        ///< "name"
    static char const* const OX_XML_FIELD_SCALE;       ///< "scale"
    static char const* const OX_XML_FIELD_START;       ///< "start"
    static char const* const OX_XML_FIELD_VALUE;       ///< "value"
    static char const* const OX_XML_FIELD_VALUELIST;   ///< "value_list"
    static char const* const OX_XML_FIELD_VEC2D;       ///< "vec2d"
    static char const* const OX_XML_FIELD_VEC3D;       ///< "vec3d"
    static char const* const OX_XML_FIELD_VEC4D;       ///< "vec4d"
    static char const* const OX_XML_FIELD_VERSION;     ///< "version"
    static char const* const OX_XML_VERSION;           ///< "1.0"
    static char const* const OX_XMLNS;                 ///< "xmlns"
    static char const* const OX_XMLNS_XSI;             ///< "xmlns:xsi"
    static char const* const OX_XSI_SCHEMALOCATION;    ///< "xsi:schemaLocation"
    static char const* const OX_XSI_TYPE;              ///< "xsi:type"
    static char const* const OX_XML_LITERAL_NO;        ///< "no"
    static char const* const OX_XML_LITERAL_YES;       ///< "yes"

    /// Indentation of written element lines, shared by every document of the
    /// process: `curpos` blanks, 0 to 20. `indent` follows it (a zero at
    /// `curpos`, blanks before); no output reads it.
    static short curpos;
    static char indent[21];

    /// An empty document, then open(filename, type); isGood tells the result.
    OxXmlFile(char const* filename, OxFile::OxIOType type);
    OxXmlFile(const OxXmlFile&) = delete;
    OxXmlFile& operator=(const OxXmlFile&) = delete;
    /// Closes the streams and frees the whole document.
    virtual ~OxXmlFile();

    /// Opens a text-mode input (OxIOInput) or output (OxIOOutput) on
    /// `filename`: 0 when the new stream is good, -1 when not. Any other type
    /// does nothing and gives 0. Meant once per direction.
    int open(char const* filename, OxFile::OxIOType type);
    /// Whether the stream of that direction exists and is good.
    OxBool isGood(OxFile::OxIOType type) const;
    /// The input stream; only for a document opened for reading.
    OxInput& getInput() { return *input; }
    OxPrt& getPrt() { return prt; }
    /// The root element or null; the document keeps ownership.
    OxXmlElement const* getRoot() const { return root; }
    OxXmlElement* getRootForUpdate() const { return root; }

    /// Reads the document from the start of the input (the state machine is
    /// in doc/detail/OxXmlReader). OxFalse on a syntax error (logged as 566
    /// and the error's number), with no input, or when the input is no
    /// longer good; what was read until then stays in the document. Without
    /// memory: the fatal line on standard error, OxFalse, and the document
    /// holds nothing at all (no part of a tree).
    OxBool readFile();
    /// Writes the document from the start of the output: the declaration (a
    /// generated one followed by an empty line), the nodes before the root,
    /// the element tree one blank per level, the nodes behind the root; then
    /// logs 579. OxFalse with no good output or for a node that cannot be
    /// written (no name and no value, an attribute without a name), when
    /// memory ran out (the fatal line on standard error; the lines sent so
    /// far stay, the line in progress is not sent), or when the output
    /// failed on the way (its own message 179 tells): the output is flushed
    /// at the end, so a document that did not reach the file whole is never
    /// answered OxTrue.
    OxBool writeFile();
    /// Whether writeFile flushes the output at every line (OxTrue, the
    /// default: each line is in the file as soon as it is written) or hands
    /// the lines over in large blocks and flushes once at the end (OxFalse:
    /// the same bytes, much faster). A failed write is reported alike in
    /// both modes: the output's message 179 and writeFile answering OxFalse.
    void setFlushEveryLine(OxBool flush) { flushEveryLine = flush != OxFalse ? OxTrue : OxFalse; }
    OxBool getFlushEveryLine() const { return flushEveryLine; }

    static short getIndent() { return curpos; }
    /// Moves the indentation to `position`; values outside 0..20 change nothing.
    static void setIndent(short position);
    /// Moves the indentation by `delta`; a result outside 0..20 changes nothing.
    static void adjustIndent(short delta);

    /// Calls dumpXML.
    virtual std::ostrstream* dump(std::ostrstream* stream) const;
    /// The file names, the declaration and DOCTYPE nodes, the nodes before
    /// the root, the root's tree (two blanks deeper) and the nodes behind it.
    std::ostrstream* dumpXML(std::ostrstream* stream) const;

private:
    friend class oxbase::detail::OxXmlReader;

    OxBool isDeclaration(char const* text);
    OxBool isComment(char const* text);
    OxBool isDoctype(char const* text);
    OxBool isCdata(char const* text);
    /// Writes one element and its subtree (without recursion).
    OxBool write(OxXmlElement const* element, oxbase::detail::OxXmlLineSink& sink);
    /// Writes a node of the lists before and behind the root.
    void writeTopLevelNode(OxXmlElement const* node, oxbase::detail::OxXmlLineSink& sink);
    /// The lines of writeFile, from the declaration to the last node behind
    /// the root, handed to `sink`; std::bad_alloc reaches writeFile.
    OxBool writeDocument(oxbase::detail::OxXmlLineSink& sink);
    /// Deletes the tree, the declaration and the nodes beside the root.
    void clearDocument();
    static void moveIndent(short to);

    OxInput* input = nullptr;
    OxOutput* output = nullptr;
    OxXmlElement* root = nullptr;
    OxXmlElement* declaration = nullptr;
    OxXmlElement* doctype = nullptr;
    OxGList<OxXmlElement*> preRootNodes;
    OxGList<OxXmlElement*> postRootNodes;
    OxPrt prt;
    OxBool flushEveryLine = OxTrue;
    /// Where the reader builds the nodes (doc/detail/OxXmlStore): made by the
    /// first read, freed behind the tree.
    oxbase::detail::OxXmlStore* store = nullptr;
};

#endif
