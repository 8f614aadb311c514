// OxXmlReader.h: the state machine behind OxXmlFile::readFile.
//
//   OxXmlReader reader(document);   // document opened for input and rewound
//   OxBool complete = reader.run();
#ifndef OXBASE_DOC_DETAIL_OXXMLREADER_H
#define OXBASE_DOC_DETAIL_OXXMLREADER_H

#include "oxbase/doc/OxXmlFile.h"
#include "oxbase/doc/detail/OxLineSource.h"
#include "oxbase/doc/detail/OxXmlRecords.h"
#include "oxbase/doc/detail/OxXmlStore.h"
#include "oxbase/doc/detail/OxXmlTextBuffer.h"

#include <cstddef>
#include <cstdint>
#include <cstring>

class OxXmlElement;

namespace oxbase {
namespace detail {

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
///
/// What is read is left as records in the document's store (OxXmlRecords.h):
/// a tag becomes its record at its end, when its attributes are known, and
/// is linked behind its elder sibling. Only the nodes at top level become
/// objects at once (the root and what stands beside it); everything below
/// them is built when a caller first asks for it.
class OxXmlReader {
    /// The names of a document repeat: the raw text of a tag or attribute
    /// name is looked up here first, and the shared text (OxXmlNames) only
    /// when the name is new to the cache. Each entry holds one use of its
    /// name; the cache gives them back at its end.
    class NameCache {
    public:
        /// Every name new to the cache is also held by `store`, for the
        /// records and shapes that refer to it.
        explicit NameCache(OxXmlStore& nameStore) : store(nameStore) {}
        NameCache(const NameCache&) = delete;
        NameCache& operator=(const NameCache&) = delete;
        ~NameCache();
        /// The shared text of the `length` raw characters at `text`, as
        /// OxXmlNames::acquire makes it; the cache keeps the use.
        char const* lookup(char const* text, size_t length);

    private:
        struct Entry {
            char const* raw = nullptr; ///< the raw text, a copy owned here
            std::uint64_t key = 0;     ///< its first eight characters
            size_t length = 0;
            char const* shared = nullptr;
        };
        /// Puts the name [text, text + length) into `entry`, its slot.
        char const* fill(Entry& entry, char const* text, size_t length, std::uint64_t key);
        /// Slots by the length and the first eight characters: the few
        /// dozen names of a document rarely meet in one slot.
        static constexpr size_t kSlots = 256;
        OxXmlStore& store;
        Entry slots[kSlots];
    };

public:
    /// Reads into `document`, whose store must exist: the records of the
    /// nodes and their texts are left there.
    explicit OxXmlReader(OxXmlFile& document)
        : file(document), store(*document.store), names(*document.store), source(*document.input) {}
    OxXmlReader(const OxXmlReader&) = delete;
    OxXmlReader& operator=(const OxXmlReader&) = delete;
    ~OxXmlReader() = default;

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
    /// Opens the tag named [nameBegin, nameEnd): its record is made when its
    /// attributes are known (commitTag), at once for an empty element tag
    /// without attributes (`makeCurrent` false).
    void createElement(char* tagStart, char* nameBegin, char* nameEnd, bool makeCurrent);
    void closeByEndTag(char* tagStart, char* nameBegin);
    /// Places `node`, a comment, CDATA or DOCTYPE object: in the current
    /// element (the store owns it then), else beside the root. Without
    /// memory std::bad_alloc, and the caller still owns it.
    void attach(OxXmlElement* node);
    /// Makes the record of the tag in progress, an empty element tag when
    /// `leaf`, links it into the current element or places its element at
    /// top level, and opens it unless it is a leaf.
    void commitTag(bool leaf) { commitTag(leaf ? OxXmlShape::kLeaf : OxXmlShape::kTag); }
    /// The same for a start tag whose ">" is at `close`: a valued tag when
    /// its value stands behind it on this line (doElementValue reads it
    /// there and the end tag must follow), with that value in its record; a
    /// leaf, opened, when its end tag stands right behind it.
    void commitStartTag(char* close);
    /// `open`: a leaf that its end tag closes.
    void commitTag(OxXmlShape::Kind kind, char const* value = nullptr, size_t valueLength = 0,
                   bool open = false);
    /// Links `record` behind the last child of the current element.
    void link(OxXmlRecord* record);
    /// Closes the current element; its parent becomes the current one.
    void closeCurrent();
    /// Opens the attribute [nameBegin, nameEnd) of the tag in progress (none
    /// without one): the attribute in progress, its value to come.
    void openAttribute(char* nameBegin, char* nameEnd);
    /// Ends the attribute in progress: one without a value gets none.
    void endAttribute();

    /// Gives the attribute in progress the value [text, text + length),
    /// trimmed: none for an empty text, an empty one for white space alone.
    void setAttributeValue(char const* text, size_t length) {
        if (!attributeOpen || valueSet) {
            return;
        }
        if (length == 0) {
            tagValues.append(" ", 2); // no value (OxXmlTagRecord)
        } else {
            char const* first = text;
            char const* last = text + length;
            OxXmlNames::trim(first, last);
            tagValues.append(first, static_cast<size_t>(last - first));
            tagValues.append('\0');
        }
        valueSet = true;
    }
    void finishComment(bool cdata);
    void finish();
    static char const* nameOrEmpty(char const* text) { return text != nullptr ? text : ""; }
    char const* fileName() const { return nameOrEmpty(file.input->getFilename()); }

    OxXmlFile& file;
    OxXmlStore& store;
    NameCache names;
    OxLineSource source;
    State state = START;
    unsigned int lineNumber = 0;
    char* lineText = nullptr;
    char* lineEnd = nullptr;
    char* cursor = nullptr;

    // The open elements, outermost first: the record of each, its last
    // child so far, and for one at top level its element (which gets the
    // value too).
    struct Frame {
        OxXmlRecord* record;
        OxXmlRecord* last;
        OxXmlElement* element;
    };
    OxGList<Frame> frames;
    OxXmlRecord* current = nullptr;
    // Comment and CDATA in progress: the node and its text so far.
    bool commentOpen[2] = {false, false};
    OxXmlElement* commentNode[2] = {nullptr, nullptr};
    OxXmlTextBuffer commentText[2];
    // The DOCTYPE text: gathered over the whole read, stored at its end.
    bool doctypeLoaded = false;
    OxXmlTextBuffer doctypeText;
    // The tag in progress: its name and its attributes (their names, and
    // their values laid out as its record keeps them).
    bool tagOpen = false;
    char const* tagName = nullptr;
    OxGList<char const*> tagNames;
    OxXmlTextBuffer tagValues;
    // The attribute in progress (the last of tagNames), whether it has its
    // value, and its value gathered over several lines.
    bool attributeOpen = false;
    bool valueSet = false;
    char quote = '"';
    bool gatheredValid = false;
    bool gathering = false;
    OxXmlTextBuffer gathered;
};

} // namespace detail
} // namespace oxbase

#endif
