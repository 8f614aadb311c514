// OxXmlReader.h: the state machine behind OxXmlFile::readFile.
//
//   OxXmlReader reader(document);   // document opened for input and rewound
//   OxBool complete = reader.run();
#ifndef OXBASE_DOC_DETAIL_OXXMLREADER_H
#define OXBASE_DOC_DETAIL_OXXMLREADER_H

#include "oxbase/doc/OxXmlFile.h"
#include "oxbase/doc/detail/OxLineSource.h"
#include "oxbase/doc/detail/OxXmlPendingAttributes.h"
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
class OxXmlReader {
    /// The names of a document repeat: the raw text of a tag or attribute
    /// name is looked up here first, and the shared text (OxXmlNames) only
    /// when the name is new to the cache. Each entry holds one use of its
    /// name; the cache gives them back at its end.
    class NameCache {
    public:
        /// Every name new to the cache is also held by `store`, for the
        /// pending attributes that refer to it.
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
    /// Reads into `document`, whose store must exist: elements, attributes
    /// and their values are built there.
    explicit OxXmlReader(OxXmlFile& document)
        : file(document), store(*document.store), names(*document.store), source(*document.input) {}
    OxXmlReader(const OxXmlReader&) = delete;
    OxXmlReader& operator=(const OxXmlReader&) = delete;
    /// Children not yet handed to their element (a read left by
    /// std::bad_alloc) are destroyed.
    ~OxXmlReader();

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
    /// `element` becomes the current element; its children are gathered
    /// until it closes.
    void openElement(OxXmlElement* element);
    /// Closes the current element: it gets its children as one exact list
    /// in the store, and its parent becomes the current element.
    void closeCurrent();
    /// Adds `node` to the children of the current element (there is one).
    void addToCurrent(OxXmlElement* node);
    /// Hands the attributes of the tag in progress to their element.
    void commitAttributes();
    /// Opens the attribute [nameBegin, nameEnd) of the current element (none
    /// without one): the attribute in progress, its value to come.
    void openAttribute(char* nameBegin, char* nameEnd);

    /// Gives the attribute in progress the value [text, text + length).
    void setAttributeValue(char const* text, size_t length) {
        if (attributeOpen) {
            tagPairs.data[attribute].value = store.copyValue(text, length);
        }
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

    OxXmlElement* current = nullptr;
    // The open elements, outermost first, each with the place of its first
    // child in openChildren: the children of all of them, in order.
    struct Frame {
        OxXmlElement* element;
        unsigned int first;
    };
    OxGList<Frame> frames;
    OxGList<OxXmlElement*> openChildren;
    // Comment and CDATA in progress: the node and its text so far.
    bool commentOpen[2] = {false, false};
    OxXmlElement* commentNode[2] = {nullptr, nullptr};
    OxXmlTextBuffer commentText[2];
    // The DOCTYPE text: gathered over the whole read, stored at its end.
    bool doctypeLoaded = false;
    OxXmlTextBuffer doctypeText;
    // The attributes of the tag in progress (names and stored values),
    // handed to their element at the tag's end as its pending attributes.
    OxXmlElement* tagElement = nullptr;
    OxGList<OxXmlPendingPair> tagPairs;
    // The attribute in progress (an entry of tagPairs) and its value
    // gathered over several lines.
    bool attributeOpen = false;
    unsigned int attribute = 0;
    char quote = '"';
    bool gatheredValid = false;
    bool gathering = false;
    OxXmlTextBuffer gathered;
};

} // namespace detail
} // namespace oxbase

#endif
