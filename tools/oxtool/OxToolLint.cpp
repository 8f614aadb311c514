// OxToolLint.cpp: the shadow of the reader, the lint causes and the round trip.
#include "OxToolLint.h"

#include "OxToolMessages.h"

#include "oxbase/doc/OxCsvFile.h"
#include "oxbase/doc/OxXmlAttribute.h"
#include "oxbase/doc/OxXmlElement.h"
#include "oxbase/doc/OxXmlFile.h"

#include <algorithm>
#include <cctype>
#include <cstring>
#include <filesystem>

namespace {

// ---------------------------------------------------------------------------
// Source lines as the readers take them: split at '\n' (a last line without
// one counts), a NUL read as a blank, white space trimmed at both ends.

struct SourceLine {
    unsigned int number = 0;
    std::string raw;     ///< without the line end
    std::string trimmed; ///< as the reader sees it
};

std::string trim(const std::string& text) {
    size_t begin = 0;
    size_t end = text.size();
    while (begin < end && std::isspace(static_cast<unsigned char>(text[begin]))) {
        begin++;
    }
    while (end > begin && std::isspace(static_cast<unsigned char>(text[end - 1]))) {
        end--;
    }
    return text.substr(begin, end - begin);
}

std::vector<SourceLine> splitLines(const std::string& source) {
    std::vector<SourceLine> lines;
    size_t start = 0;
    unsigned int number = 0;
    while (start < source.size()) {
        size_t end = source.find('\n', start);
        if (end == std::string::npos) {
            end = source.size();
        }
        SourceLine line;
        line.number = ++number;
        line.raw = source.substr(start, end - start);
        std::replace(line.raw.begin(), line.raw.end(), '\0', ' ');
        line.trimmed = trim(line.raw);
        lines.push_back(std::move(line));
        start = end + 1;
    }
    return lines;
}

/// A short form of a text for a message: at most 40 characters, one line.
std::string excerpt(const std::string& text) {
    std::string shown = text.substr(0, text.find('\n'));
    if (shown.size() > 40) {
        shown = shown.substr(0, 37) + "...";
    }
    return "'" + shown + "'";
}

bool startsWith(const std::string& text, size_t at, const char* marker) {
    return text.compare(at, std::strlen(marker), marker) == 0;
}

// ---------------------------------------------------------------------------
// The shadow of the XML reader: the same states over the same trimmed lines,
// recording where each node came from instead of building it.

struct ShadowNode {
    enum Kind { Element, Comment, Cdata, Doctype } kind = Element;
    unsigned int line = 0;
    unsigned int lastLine = 0;
    int parent = -1;
    bool inRoot = false;       ///< the root or below it: reachable through getRoot
    std::string before;        ///< raw nodes: text in front of the marker on its line
    std::string after;         ///< raw nodes: text behind the end marker on its line
    bool linesTrimmed = false; ///< raw nodes: a line of it lost white space at an end
    bool subset = false;       ///< DOCTYPE: a '[' before the '>' that ends it
};

struct Shadow {
    std::vector<ShadowNode> nodes;
    unsigned int declarationLine = 0;
    std::string declarationBefore;
    std::string declarationAfter;
    bool declarationEnded = true;
};

class XmlShadow {
public:
    explicit XmlShadow(Shadow& out) : shadow(out) {}

    void run(const std::vector<SourceLine>& lines) {
        for (const SourceLine& line : lines) {
            if (line.trimmed.empty()) {
                continue;
            }
            text = &line.trimmed;
            raw = &line.raw;
            number = line.number;
            cursor = 0;
            while (cursor < text->size() && !stopped) {
                step();
            }
            if (stopped) {
                return;
            }
        }
    }

private:
    enum State {
        START,
        CONTENT,
        COMMENT,
        CDATA,
        DOCTYPE,
        ELEMENT_VALUE,
        ATTRIBUTE,
        ATTRIBUTE_VALUE,
        ATTRIBUTE_VALUE_MORE
    };

    size_t find(char c, size_t from) const {
        size_t at = text->find(c, from);
        return at == std::string::npos ? text->size() : at;
    }
    void skipBlanks() {
        while (cursor < text->size() && (*text)[cursor] == ' ') {
            cursor++;
        }
    }

    void step() {
        switch (state) {
        case START:
            return doStart();
        case CONTENT:
            return doContent();
        case COMMENT:
            return doRaw(ShadowNode::Comment, "-->");
        case CDATA:
            return doRaw(ShadowNode::Cdata, "]]>");
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
    }

    void doStart() {
        size_t open = find('<', cursor);
        if (open == text->size() || !startsWith(*text, open, "<?xml")) {
            stopped = true;
            return;
        }
        shadow.declarationLine = number;
        shadow.declarationBefore = trim(text->substr(0, open));
        size_t end = text->find("?>", open);
        shadow.declarationEnded = end != std::string::npos;
        shadow.declarationAfter = shadow.declarationEnded ? trim(text->substr(end + 2)) : "";
        cursor = shadow.declarationEnded ? end + 2 : text->size();
        state = CONTENT;
    }

    void doContent() {
        size_t open = find('<', cursor);
        if (open == text->size()) {
            cursor = open;
            return;
        }
        cursor = open;
        if (startsWith(*text, open, "<?xml")) {
            stopped = true;
            return;
        }
        if (startsWith(*text, open, "<!--")) {
            state = COMMENT;
            return;
        }
        if (startsWith(*text, open, "<!DOCTYPE")) {
            state = DOCTYPE;
            return;
        }
        if (startsWith(*text, open, "<![CDATA[")) {
            state = CDATA;
            return;
        }
        size_t nameBegin = open + 1;
        while (nameBegin < text->size() && (*text)[nameBegin] == ' ') {
            nameBegin++;
        }
        size_t nameEnd = nameBegin;
        while (nameEnd < text->size() && (*text)[nameEnd] != ' ' && (*text)[nameEnd] != '/' &&
               (*text)[nameEnd] != '>') {
            nameEnd++;
        }
        if (nameEnd == text->size()) {
            cursor = nameEnd;
            return;
        }
        if ((*text)[nameEnd] == '/' && nameEnd == nameBegin) {
            cursor = nameEnd + 1;
            close();
            return;
        }
        if ((*text)[nameEnd] == '/') {
            if (nameEnd + 1 >= text->size() || (*text)[nameEnd + 1] != '>') {
                stopped = true;
                return;
            }
            create(false);
            cursor = nameEnd + 1;
            return;
        }
        create(true);
        state = (*text)[nameEnd] == '>' ? ELEMENT_VALUE : ATTRIBUTE;
        cursor = nameEnd + 1;
    }

    void doElementValue() {
        skipBlanks();
        if (cursor == text->size()) {
            return;
        }
        if ((*text)[cursor] == '<') {
            state = CONTENT;
            return;
        }
        size_t open = find('<', cursor);
        if (open == text->size() || open + 1 >= text->size() || (*text)[open + 1] != '/') {
            stopped = true;
            return;
        }
        close();
        size_t end = find('>', open + 2);
        cursor = end < text->size() ? end + 1 : end;
        state = CONTENT;
    }

    void doAttribute() {
        skipBlanks();
        while (cursor < text->size() && std::strchr(" /=>", (*text)[cursor]) == nullptr) {
            cursor++;
        }
        skipBlanks();
        if (cursor == text->size()) {
            return;
        }
        char c = (*text)[cursor];
        if (c == '/') {
            if (cursor + 1 >= text->size() || (*text)[cursor + 1] != '>') {
                stopped = true;
                return;
            }
            close();
            cursor++;
            state = CONTENT;
        } else if (c == '=') {
            cursor++;
            state = ATTRIBUTE_VALUE;
        } else if (c == '>') {
            cursor++;
            state = ELEMENT_VALUE;
        }
    }

    void doAttributeValue() {
        skipBlanks();
        if (cursor == text->size()) {
            return;
        }
        char c = (*text)[cursor];
        if (c != '"' && c != '\'') {
            stopped = true;
            return;
        }
        quote = c;
        cursor++;
        size_t end = text->find(quote, cursor);
        if (end != std::string::npos) {
            cursor = end + 1;
            state = ATTRIBUTE;
            return;
        }
        cursor = text->size();
        state = ATTRIBUTE_VALUE_MORE;
    }

    void doAttributeValueMore() {
        size_t end = text->find(quote, cursor);
        if (end == std::string::npos) {
            cursor = text->size();
            return;
        }
        cursor = end + 1;
        state = ATTRIBUTE;
    }

    void doRaw(ShadowNode::Kind kind, const char* marker) {
        int index = kind == ShadowNode::Cdata ? 1 : 0;
        if (open[index] < 0) {
            ShadowNode node;
            node.kind = kind;
            node.line = number;
            node.before = trim(text->substr(0, cursor));
            attach(node);
            open[index] = static_cast<int>(shadow.nodes.size()) - 1;
        }
        ShadowNode& node = shadow.nodes[static_cast<size_t>(open[index])];
        bool firstLine = node.line == number;
        node.lastLine = number;
        size_t end = text->find(marker, cursor);
        // White space inside the construct that the trimming of lines takes:
        // in front of a following line, and behind a line it goes on from.
        bool lead = !raw->empty() && std::isspace(static_cast<unsigned char>(raw->front()));
        bool trail = !raw->empty() && std::isspace(static_cast<unsigned char>(raw->back()));
        node.linesTrimmed =
            node.linesTrimmed || (!firstLine && lead) || (end == std::string::npos && trail);
        if (end != std::string::npos) {
            node.after = trim(text->substr(end + std::strlen(marker)));
            open[index] = -1;
            state = CONTENT;
        }
        cursor = text->size();
    }

    void doDoctype() {
        if (doctype < 0) {
            ShadowNode node;
            node.kind = ShadowNode::Doctype;
            node.line = number;
            node.before = trim(text->substr(0, cursor));
            attach(node);
            doctype = static_cast<int>(shadow.nodes.size()) - 1;
        }
        ShadowNode& node = shadow.nodes[static_cast<size_t>(doctype)];
        node.lastLine = number;
        size_t end = text->find('>', cursor);
        size_t bracket = text->find('[', cursor);
        if (bracket != std::string::npos && (end == std::string::npos || bracket < end)) {
            node.subset = true;
        }
        if (end != std::string::npos) {
            node.after = trim(text->substr(end + 1));
            cursor = end + 1;
            state = CONTENT;
        } else {
            cursor = text->size();
        }
    }

    void create(bool makeCurrent) {
        ShadowNode node;
        node.kind = ShadowNode::Element;
        node.line = node.lastLine = number;
        int index = static_cast<int>(shadow.nodes.size());
        if (!rootSet) {
            rootSet = true;
            node.inRoot = true;
        } else if (current >= 0) {
            node.parent = current;
            node.inRoot = shadow.nodes[static_cast<size_t>(current)].inRoot;
        }
        shadow.nodes.push_back(node);
        if (makeCurrent) {
            current = index;
        }
    }

    void attach(ShadowNode& node) {
        if (current >= 0) {
            node.parent = current;
            node.inRoot = shadow.nodes[static_cast<size_t>(current)].inRoot;
        }
        shadow.nodes.push_back(node);
    }

    void close() {
        if (current >= 0) {
            current = shadow.nodes[static_cast<size_t>(current)].parent;
        }
    }

    Shadow& shadow;
    State state = START;
    const std::string* text = nullptr;
    const std::string* raw = nullptr;
    unsigned int number = 0;
    size_t cursor = 0;
    int current = -1;
    bool rootSet = false;
    int open[2] = {-1, -1};
    int doctype = -1;
    char quote = '"';
    bool stopped = false;
};

// ---------------------------------------------------------------------------
// Findings

void add(std::vector<OxToolFinding>& findings, unsigned int line, const char* cause,
         const std::string& text) {
    OxToolFinding finding;
    finding.severity = OxErrorWarning;
    finding.line = line;
    finding.text = text;
    finding.tag = std::string("lint:") + cause;
    findings.push_back(std::move(finding));
}

/// Text behind the end marker of a comment, CDATA section or DOCTYPE.
void addTextBehindEnd(std::vector<OxToolFinding>& findings, unsigned int line,
                      const std::string& kind, const std::string& after) {
    std::string text = "the text ";
    text += excerpt(after);
    text += " behind the end of the ";
    text += kind;
    text += " is kept in the ";
    text += kind;
    text += " and not read as markup";
    add(findings, line, oxlint::kTextBehindRawEnd, text);
}

void lintRangeText(std::vector<OxToolFinding>& findings, unsigned int line,
                   const std::string& where, const char* value) {
    // A list, not a single number: a long number alone (an identifier, a
    // time) is no range text.
    if (value == nullptr || std::strpbrk(value, "-, ") == nullptr) {
        return;
    }
    for (const OxToolRangeWrap& wrap : oxtoolRangeWraps(value)) {
        add(findings, line, oxlint::kRangeWraps,
            where + " holds the number " + wrap.digits +
                ": read as range text it wraps past 4294967295 to " + std::to_string(wrap.wrapped));
    }
}

std::string elementName(const OxXmlElement& element) {
    return std::string("<") + (element.getName() != nullptr ? element.getName() : "") + ">";
}

const char* rawKind(const OxXmlElement& node) {
    const char* value = node.getValue() != nullptr ? node.getValue() : "";
    if (std::strncmp(value, "<![CDATA[", 9) == 0) {
        return "CDATA section";
    }
    if (std::strncmp(value, "<!DOCTYPE", 9) == 0) {
        return "DOCTYPE";
    }
    return "comment";
}

/// The tree in document order (the order in which the reader created its
/// nodes), with the shadow nodes that stand for them.
void lintTree(const OxXmlElement* root, const Shadow& shadow,
              std::vector<OxToolFinding>& findings) {
    std::vector<const ShadowNode*> sources;
    for (const ShadowNode& node : shadow.nodes) {
        if (node.inRoot) {
            sources.push_back(&node);
        }
    }
    std::vector<const OxXmlElement*> stack{root};
    size_t next = 0;
    while (!stack.empty()) {
        const OxXmlElement* element = stack.back();
        stack.pop_back();
        if (element == nullptr) {
            continue;
        }
        const ShadowNode* source = next < sources.size() ? sources[next] : nullptr;
        next++;
        bool nameless = element->getName() == nullptr;
        if (source != nullptr && (source->kind == ShadowNode::Element) == nameless) {
            source = nullptr; // the shadow lost step: no line rather than a wrong one
            next = sources.size();
        }
        unsigned int line = source != nullptr ? source->line : 0;
        for (unsigned int i = element->getNbChildElements(); i > 0; i--) {
            stack.push_back(element->getChild(i - 1));
        }
        if (nameless) {
            if (source == nullptr) {
                continue;
            }
            std::string kind = rawKind(*element);
            if (!source->after.empty()) {
                addTextBehindEnd(findings, source->lastLine, kind, source->after);
            }
            if (!source->before.empty()) {
                add(findings, line, oxlint::kRawSharesLine,
                    "the " + kind + " inside " +
                        (element->getParent() != nullptr ? elementName(*element->getParent())
                                                         : std::string("the document")) +
                        " shares its line with " + excerpt(source->before) +
                        ": it comes back on lines of its own at the left margin");
            }
            if (source->kind == ShadowNode::Cdata && source->linesTrimmed) {
                add(findings, line, oxlint::kCdataLinesTrimmed,
                    "the white space at the ends of the lines of the CDATA section is not kept");
            }
            continue;
        }
        std::string name = elementName(*element);
        const char* value = element->getValue();
        unsigned int attributes = 0;
        for (unsigned int i = 0; i < element->getNbAttributes(); i++) {
            const OxXmlAttribute* attribute = element->getAttribute(i);
            if (attribute == nullptr || attribute->getName() == nullptr) {
                continue;
            }
            std::string where = "attribute " + std::string(attribute->getName()) + " of " + name;
            if (attribute->getValue() == nullptr) {
                add(findings, line, oxlint::kEmptyAttribute,
                    where + " has an empty value: the writer leaves it out");
                continue;
            }
            attributes++;
            if (std::strchr(attribute->getValue(), '"') != nullptr) {
                add(findings, line, oxlint::kQuoteInAttribute,
                    where + " holds a double quote: written between double quotes, it is cut "
                            "short when read back");
            }
            lintRangeText(findings, line, where, attribute->getValue());
        }
        if (value == nullptr) {
            continue;
        }
        if (attributes > 0) {
            add(findings, line, oxlint::kValueHidesAttributes,
                name + " has a text value and " + std::to_string(attributes) +
                    " attribute(s): the writer writes the value only, the attributes are lost");
        }
        if (element->getNbChildElements() > 0) {
            add(findings, line, oxlint::kValueHidesChildren,
                name + " has a text value and child nodes: the writer writes the value only");
        }
        if (std::strchr(value, '<') != nullptr) {
            add(findings, line, oxlint::kMarkupInValue,
                "the value of " + name + " holds '<': it is cut there when read back");
        }
        lintRangeText(findings, line, "the value of " + name, value);
    }
}

void lintTopLevel(const Shadow& shadow, std::vector<OxToolFinding>& findings) {
    if (!shadow.declarationBefore.empty()) {
        add(findings, shadow.declarationLine, oxlint::kTextBeforeDeclaration,
            "the text " + excerpt(shadow.declarationBefore) +
                " before the declaration (a byte order mark, say) is dropped");
    }
    if (!shadow.declarationEnded) {
        add(findings, shadow.declarationLine, oxlint::kDeclarationUnterminated,
            "the declaration does not end on its line: only that line is kept, and the "
            "declaration is written without its end");
    }
    if (!shadow.declarationAfter.empty()) {
        add(findings, shadow.declarationLine, oxlint::kDeclarationTrailingMarkup,
            "the markup " + excerpt(shadow.declarationAfter) +
                " behind the declaration on its line is kept in the declaration and read again "
                "as content: it doubles on every round trip");
    }
    for (const ShadowNode& node : shadow.nodes) {
        if (node.kind == ShadowNode::Doctype) {
            if (!node.after.empty()) {
                add(findings, node.lastLine, oxlint::kDoctypeTrailingMarkup,
                    "the markup " + excerpt(node.after) +
                        " behind the DOCTYPE on its line is kept in the DOCTYPE and read again as "
                        "content: it doubles on every round trip");
            }
            if (node.subset) {
                add(findings, node.line, oxlint::kDoctypeSubset,
                    "the DOCTYPE has an internal subset: its first '>' ends it, and what follows "
                    "is read as content and dropped");
            }
        } else if (node.kind != ShadowNode::Element && !node.inRoot && !node.after.empty()) {
            addTextBehindEnd(findings, node.lastLine,
                             node.kind == ShadowNode::Cdata ? "CDATA section" : "comment",
                             node.after);
        }
    }
}

/// The first line where `first` and `second` differ, with both texts.
void firstDifference(const std::string& first, const std::string& second, unsigned int& line,
                     std::string& was, std::string& became) {
    std::vector<SourceLine> a = splitLines(first);
    std::vector<SourceLine> b = splitLines(second);
    size_t i = 0;
    while (i < a.size() && i < b.size() && a[i].raw == b[i].raw) {
        i++;
    }
    line = static_cast<unsigned int>(i + 1);
    was = i < a.size() ? a[i].raw : "(end of text)";
    became = i < b.size() ? b[i].raw : "(end of text)";
}

/// Adds the generic round-trip warning when the two writes differ and no
/// finding names a cause that changes the text from one write to the next.
void lintRoundTrip(const std::string& first, const std::string& second, bool written,
                   std::vector<OxToolFinding>& findings, const std::vector<const char*>& unstable) {
    if (written && first == second) {
        return;
    }
    for (const OxToolFinding& finding : findings) {
        for (const char* cause : unstable) {
            if (finding.tag == std::string("lint:") + cause) {
                return;
            }
        }
    }
    if (!written) {
        add(findings, 0, oxlint::kRoundTrip,
            "the document could not be written and read back for the comparison");
        return;
    }
    unsigned int line = 0;
    std::string was;
    std::string became;
    firstDifference(first, second, line, was, became);
    add(findings, 0, oxlint::kRoundTrip,
        "written, read and written again, the document changes: line " + std::to_string(line) +
            " of the written text " + excerpt(was) + " comes back as " + excerpt(became));
}

void sortByLine(std::vector<OxToolFinding>& findings, size_t from) {
    std::stable_sort(findings.begin() + static_cast<std::ptrdiff_t>(from), findings.end(),
                     [](const OxToolFinding& a, const OxToolFinding& b) {
                         return (a.line == 0 ? ~0u : a.line) < (b.line == 0 ? ~0u : b.line);
                     });
}

std::vector<std::string> splitFields(const std::string& line, char separator) {
    std::vector<std::string> fields;
    size_t start = 0;
    for (;;) {
        size_t end = line.find(separator, start);
        fields.push_back(line.substr(start, end == std::string::npos ? end : end - start));
        if (end == std::string::npos) {
            return fields;
        }
        start = end + 1;
    }
}

} // namespace

void oxtoolLintXml(const std::string& source, OxXmlFile& document, const OxToolTempDir& scratch,
                   std::vector<OxToolFinding>& findings) {
    size_t from = findings.size();
    Shadow shadow;
    XmlShadow(shadow).run(splitLines(source));
    lintTopLevel(shadow, findings);
    if (document.getRoot() != nullptr) {
        lintTree(document.getRoot(), shadow, findings);
    }

    // The round trip, out of sight: its messages (the end of each write,
    // what a second read finds) are not the document's.
    std::string first;
    std::string second;
    bool written = false;
    {
        std::vector<OxToolMessage> ignored;
        OxToolMessageCapture quiet(&ignored, true, true);
        std::string firstPath = scratch.file("first.xml");
        std::string secondPath = scratch.file("second.xml");
        if (!scratch.path().empty() && document.open(firstPath.c_str(), OxFile::OxIOOutput) == 0 &&
            document.writeFile() == OxTrue) {
            OxXmlFile again(firstPath.c_str(), OxFile::OxIOInput);
            again.readFile();
            written = again.open(secondPath.c_str(), OxFile::OxIOOutput) == 0 &&
                      again.writeFile() == OxTrue && oxtoolReadBytes(firstPath, first) &&
                      oxtoolReadBytes(secondPath, second);
        }
    }
    lintRoundTrip(first, second, written, findings,
                  {oxlint::kQuoteInAttribute, oxlint::kMarkupInValue,
                   oxlint::kDeclarationTrailingMarkup, oxlint::kDoctypeTrailingMarkup,
                   oxlint::kTextBehindRawEnd});
    sortByLine(findings, from);
}

void oxtoolLintCsv(const std::string& source, OxCsvFile& table, char separator,
                   const OxToolTempDir& scratch, std::vector<OxToolFinding>& findings) {
    size_t from = findings.size();
    const OxGList<char*>& columns = table.getColumnNames();
    bool headerDone = columns.getLength() > 0;
    unsigned int comments = 0;
    unsigned int firstComment = 0;
    unsigned int headerFields = 0;
    for (const SourceLine& line : splitLines(source)) {
        const std::string& text = line.trimmed;
        if (text.empty()) {
            continue;
        }
        if (text[0] == '#') {
            comments++;
            firstComment = firstComment == 0 ? line.number : firstComment;
            continue;
        }
        std::vector<std::string> fields = splitFields(text, separator);
        if (!headerDone) {
            headerFields += static_cast<unsigned int>(fields.size());
            headerDone = text.back() != separator;
            headerFields -= headerDone ? 0u : 1u;
            continue;
        }
        // An empty field with a non-empty one behind it: the writer sends the
        // values in order, so the later ones move into its column.
        for (size_t i = 0; i < fields.size(); i++) {
            if (!trim(fields[i]).empty()) {
                continue;
            }
            size_t later = i + 1;
            while (later < fields.size() && trim(fields[later]).empty()) {
                later++;
            }
            if (later < fields.size()) {
                const char* name =
                    i < columns.getLength() ? columns[static_cast<unsigned int>(i)] : nullptr;
                add(findings, line.number, oxlint::kCsvHole,
                    "the record's field " + std::to_string(i + 1) +
                        (name != nullptr ? " (" + std::string(name) + ")" : std::string()) +
                        " is empty: on write the fields behind it move left into its column");
                break;
            }
        }
        for (size_t i = 0; i + 1 < fields.size(); i++) {
            std::string field = trim(fields[i]);
            if (!field.empty() && field[0] == '"' && (field.size() == 1 || field.back() != '"')) {
                add(findings, line.number, oxlint::kCsvQuoteSplit,
                    "the quoted field " + excerpt(field) +
                        " holds the separator: CSV input has no quoting, so it is read as "
                        "several fields and the columns behind it shift");
                break;
            }
        }
        for (const std::string& field : fields) {
            lintRangeText(findings, line.number, "the field " + excerpt(trim(field)),
                          trim(field).c_str());
        }
    }
    if (comments > 0) {
        add(findings, firstComment, oxlint::kCsvCommentsDropped,
            std::to_string(comments) + " comment line(s) are not written back");
    }

    std::string first;
    std::string second;
    bool written = false;
    {
        std::vector<OxToolMessage> ignored;
        OxToolMessageCapture quiet(&ignored, true, true);
        std::string firstPath = scratch.file("first.csv");
        std::string secondPath = scratch.file("second.csv");
        if (!scratch.path().empty() && table.open(firstPath.c_str(), OxFile::OxIOOutput) == 0 &&
            table.writeFile() == OxTrue) {
            OxCsvFile again(firstPath.c_str(), OxFile::OxIOInput, separator);
            again.readFile();
            written = again.open(secondPath.c_str(), OxFile::OxIOOutput) == 0 &&
                      again.writeFile() == OxTrue && oxtoolReadBytes(firstPath, first) &&
                      oxtoolReadBytes(secondPath, second);
        }
    }
    lintRoundTrip(first, second, written, findings, {oxlint::kCsvQuoteSplit});
    sortByLine(findings, from);
}

std::vector<OxToolRangeWrap> oxtoolRangeWraps(const std::string& text) {
    std::vector<OxToolRangeWrap> wraps;
    if (text.find_first_of("0123456789") == std::string::npos ||
        text.find_first_not_of("0123456789-, \t\r\n") != std::string::npos) {
        return wraps;
    }
    size_t i = 0;
    while (i < text.size()) {
        if (!std::isdigit(static_cast<unsigned char>(text[i]))) {
            i++;
            continue;
        }
        size_t start = i;
        unsigned long long exact = 0;
        bool above = false;
        std::uint32_t wrapped = 0;
        while (i < text.size() && std::isdigit(static_cast<unsigned char>(text[i]))) {
            unsigned int digit = static_cast<unsigned int>(text[i] - '0');
            wrapped = wrapped * 10u + digit;
            above = above || exact > (0xFFFFFFFFull - digit) / 10;
            exact = above ? exact : exact * 10 + digit;
            i++;
        }
        if (above) {
            OxToolRangeWrap wrap;
            wrap.position = static_cast<unsigned int>(start + 1);
            wrap.digits = text.substr(start, i - start);
            wrap.wrapped = wrapped;
            wraps.push_back(wrap);
        }
    }
    return wraps;
}

std::vector<OxToolFinding> oxtoolWalkFindings(const std::string& walkErrors,
                                              const std::vector<std::string>& unreadable) {
    // The walk's debug texts: "FUNCTION: returning -1 at line N", with a
    // "dirbuf: "PATH"" line behind it where the walk names a path.
    std::vector<OxToolFinding> findings;
    std::vector<SourceLine> lines = splitLines(walkErrors);
    for (size_t i = 0; i < lines.size(); i++) {
        const std::string& text = lines[i].raw;
        size_t at = text.find(": returning -1 at line ");
        if (at == std::string::npos) {
            continue;
        }
        unsigned long where = std::strtoul(text.c_str() + at + 23, nullptr, 10);
        std::string path;
        if (i + 1 < lines.size() && lines[i + 1].raw.compare(0, 9, "dirbuf: \"") == 0) {
            const std::string& next = lines[i + 1].raw;
            path = next.substr(9, next.size() >= 10 ? next.size() - 10 : 0);
        }
        std::error_code error;
        static_cast<void>(std::filesystem::status(path, error));
        std::string reason = error ? error.message() : std::string("status refused");
        OxToolFinding finding;
        if (text.compare(0, at, "OxFileTreeWalk::open_dir_stream") == 0 && where == 736) {
            if (std::find(unreadable.begin(), unreadable.end(), path) != unreadable.end()) {
                continue; // reported as unreadable, not walked as empty
            }
            finding.severity = OxErrorWarning;
            finding.tag = std::string("lint:") + oxlint::kWalkUnlisted;
            finding.text = "the directory " + path;
            finding.text += " cannot be listed (" + reason;
            finding.text += "): the walk treats it as empty, and nothing in it is checked";
        } else if (error == std::errc::too_many_symbolic_link_levels) {
            finding.severity = OxErrorError;
            finding.tag = std::string("lint:") + oxlint::kWalkLoop;
            finding.text = "the symbolic link " + path +
                           " loops: the walk ends there, and the entries behind it are missing";
        } else {
            finding.severity = OxErrorError;
            finding.tag = std::string("lint:") + oxlint::kWalkLoop;
            finding.text = "the walk ended early at " + (path.empty() ? text : path) + " (" +
                           reason + "): the entries behind it are missing";
        }
        findings.push_back(std::move(finding));
    }
    return findings;
}

bool oxtoolWalkEndedEarly(const std::vector<OxToolFinding>& findings) {
    for (const OxToolFinding& finding : findings) {
        if (finding.severity >= OxErrorError) {
            return true;
        }
    }
    return false;
}
