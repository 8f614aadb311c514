#include "oxbase/doc/OxXmlElement.h"

#include "oxbase/core/OxString.h"
#include "oxbase/core/detail/OxSlabPool.h"
#include "oxbase/diag/OxPrt.h"
#include "oxbase/doc/OxXmlFile.h"
#include "oxbase/doc/detail/OxXmlNames.h"
#include "oxbase/doc/detail/OxXmlRecords.h"
#include "oxbase/doc/detail/OxXmlStore.h"

#include <cstring>
#include <new>
#include <typeinfo>

using namespace oxbase::detail;

namespace {
/// A trimmed copy of `text`: null for null or empty input.
char* trimmedCopy(char const* text) {
    return OxString::stripWhite(OxString::dup(text));
}

bool sameText(char const* a, char const* b) {
    return a != nullptr && b != nullptr && std::strcmp(a, b) == 0;
}

/// The blocks of every OxXmlElement.
OxSlabPool elementPool(sizeof(OxXmlElement));

/// The blocks of the attribute and child lists of every element (lists of
/// pointers, which all have one size).
static_assert(sizeof(OxGList<OxXmlAttribute*>) == sizeof(OxGList<OxXmlElement*>),
              "one pool serves both kinds of list");
OxSlabPool listPool(sizeof(OxGList<OxXmlElement*>));

/// A list of `capacity` slots in a block of listPool.
template <class T> OxGList<T>* newList(unsigned int capacity) {
    void* memory = listPool.allocate();
    if (memory == nullptr) {
        throw std::bad_alloc();
    }
    try {
        return new (memory) OxGList<T>(capacity);
    } catch (const std::bad_alloc&) {
        listPool.release(memory); // no array for the list: its block goes back
        throw;
    }
}

/// Destroys a list made by newList (null is ignored).
template <class T> void deleteList(OxGList<T>* list) {
    if (list != nullptr) {
        list->~OxGList<T>();
        listPool.release(list);
    }
}

} // namespace

OxXmlElement::OxXmlElement(char const* elementName)
    : type(XML_TYPE_ELEMENT), name(OxXmlNames::acquire(elementName)) {}

OxXmlElement::OxXmlElement(XML_ELEMENT_TYPE elementType, char const* elementName)
    : type(elementType), name(OxXmlNames::acquire(elementName)) {}

void* OxXmlElement::operator new(std::size_t size) {
    return elementPool.allocateObject(size);
}

void* OxXmlElement::operator new(std::size_t size, std::nothrow_t const& tag) noexcept {
    return elementPool.allocateObject(size, tag);
}

void OxXmlElement::operator delete(void* memory, std::size_t size) {
    elementPool.releaseObject(memory, size);
}

void OxXmlElement::operator delete(void* memory, std::nothrow_t const&) noexcept {
    elementPool.releaseObject(memory);
}

OxXmlElement::~OxXmlElement() {
    delete[] xsiType;
    if ((storage & kHeldName) == 0) {
        OxXmlNames::release(name);
    }
    if ((storage & kStoredValue) == 0) {
        delete[] value;
    }
    // Pending attributes and children are records of the store and go with it.
    if ((storage & kPendingAttributes) == 0 && attributes != nullptr) {
        for (unsigned int i = 0; i < attributes->length; i++) {
            OxXmlAttribute::release(attributes->data[i]);
        }
        deleteList(attributes);
    }
    if ((storage & kPendingChildren) != 0 || children == nullptr) {
        return;
    }
    // The subtree goes without recursion, depth first over the child lists
    // with a stack of levels of its own: the next element is always read
    // from a list, so that the memory of many elements is fetched at once
    // (a chain through the elements would wait for each in turn). A subtree
    // deeper than the levels waits in a chain through its root's `parent`
    // field, which nobody reads any more, and is taken up when the levels
    // are done. An element is destroyed childless, after its children.
    struct Level {
        OxXmlElement* owner;
        OxGList<OxXmlElement*>* list;
        unsigned int next;
    };
    constexpr unsigned int kLevels = 32;
    Level levels[kLevels];
    unsigned int depth = 0;
    OxXmlElement* waiting = nullptr;
    auto open = [&levels, &depth](OxXmlElement* owner) {
        levels[depth++] = Level{owner, owner->children, 0};
        owner->children = nullptr;
    };
    open(this);
    for (;;) {
        while (depth > 0) {
            Level& top = levels[depth - 1];
            if (top.next == top.list->length) {
                if ((top.owner->storage & kStoredChildren) == 0) {
                    deleteList(top.list); // a stored list goes with the store
                }
                if (top.owner != this) {
                    release(top.owner);
                }
                depth--;
                continue;
            }
            OxXmlElement* child = top.list->data[top.next++];
            if (child == nullptr) {
                continue;
            }
            if ((child->storage & kPendingChildren) != 0 || child->children == nullptr) {
                release(child);
            } else if (depth == kLevels) {
                child->parent = waiting;
                waiting = child;
            } else {
                open(child);
            }
        }
        if (waiting == nullptr) {
            return;
        }
        OxXmlElement* next = waiting;
        waiting = next->parent;
        open(next);
    }
}

void OxXmlElement::release(OxXmlElement* element) {
    if (element == nullptr) {
        return;
    }
    if ((element->storage & kStoredNode) != 0) {
        element->~OxXmlElement(); // the memory goes with the store
    } else {
        delete element;
    }
}

OxXmlElement* OxXmlElement::fromRecord(OxXmlRecord* record, bool topLevel) {
    if (record->shape->kind == OxXmlShape::kNode) {
        auto* node = static_cast<OxXmlNodeRecord*>(record);
        OxXmlElement* taken = node->node;
        node->node = nullptr;
        return taken;
    }
    OxXmlElement* element = record->shape->store->newElement();
    element->name = record->shape->name;
    element->storage |= kHeldName | kStoredValue;
    if (record->shape->kind == OxXmlShape::kCsv) {
        if (static_cast<OxXmlCsvRecord*>(record)->count > 0) {
            element->pending = record;
            element->storage |= kPendingAttributes;
        }
        return element;
    }
    element->value = record->value();
    if (record->shape->count > 0) {
        element->pending = record;
        element->storage |= kPendingAttributes;
    }
    bool start = record->shape->kind == OxXmlShape::kTag;
    if (start && (topLevel || record->firstChild() != nullptr)) {
        element->childRecords = record;
        element->storage |= kPendingChildren;
    }
    return element;
}

OxXmlRecord* OxXmlElement::pendingTag() const {
    if ((storage & kPendingAttributes) == 0 || !pending->shape->isTag()) {
        return nullptr;
    }
    return pending;
}

void OxXmlElement::buildPendingAttributes() const {
    // Every allocation comes first: a failure leaves the attributes pending
    // and the record untouched (the CSV form is read only once).
    unsigned int count = getNbAttributes();
    OxGList<OxXmlAttribute*>* list = newList<OxXmlAttribute*>(count);
    unsigned int made = 0;
    try {
        for (; made < count; made++) {
            list->data[made] = new OxXmlAttribute(static_cast<char const*>(nullptr));
        }
    } catch (const std::bad_alloc&) {
        for (unsigned int i = 0; i < made; i++) {
            delete list->data[i];
        }
        deleteList(list);
        throw;
    }
    unsigned int next = 0;
    auto take = [list, &next](char const* attributeName, char* attributeValue) {
        OxXmlAttribute* attribute = list->data[next++];
        attribute->name = OxXmlNames::share(attributeName);
        attribute->value = attributeValue; // a text of the store
        attribute->storage = OxXmlAttribute::kStoredValue;
    };
    if (pending->shape->isTag()) {
        pending->forEachTagAttribute(take);
    } else {
        static_cast<OxXmlCsvRecord*>(pending)->forEachAttribute(take);
    }
    list->length = count;
    // The element is no const object (see the header): its list is made here.
    auto* self = const_cast<OxXmlElement*>(this);
    self->attributes = list;
    self->storage &= static_cast<std::uint8_t>(~kPendingAttributes);
}

void OxXmlElement::buildPendingChildren() const {
    // The new elements first, places left for the nodes of kNode records: a
    // failure leaves the children pending and takes nothing from the store
    // (what was made there stays there, unused).
    OxXmlRecord* first = childRecords->firstChild();
    unsigned int count = getNbChildElements();
    OxGList<OxXmlElement*>* list = nullptr;
    if (count > 0) {
        OxXmlStore* store = childRecords->shape->store;
        list = store->newChildList(count);
        try {
            for (OxXmlRecord* record = first; record != nullptr; record = record->next) {
                if (record->shape->kind == OxXmlShape::kCsv) {
                    // A block: one record and element per line.
                    auto* block = static_cast<OxXmlCsvBlock*>(record);
                    char* line = block->text();
                    for (std::uint32_t i = 0; i < block->lines; i++) {
                        std::size_t length = std::strlen(line);
                        unsigned int fields = 0;
                        unsigned int covered = 0;
                        countCsvFields(line, length, block->shape->columns->separator, fields,
                                       covered);
                        OxXmlRecord* one = store->newCsvRecord(block->shape, fields, line);
                        OxXmlElement* made = fromRecord(one, false);
                        list->data[list->length++] = made;
                        line += length + 1;
                    }
                    continue;
                }
                bool node = record->shape->kind == OxXmlShape::kNode;
                OxXmlElement* made = node ? nullptr : fromRecord(record, false);
                list->data[list->length++] = made;
            }
        } catch (const std::bad_alloc&) {
            for (unsigned int i = 0; i < list->length; i++) {
                release(list->data[i]);
            }
            throw;
        }
        unsigned int index = 0;
        for (OxXmlRecord* record = first; record != nullptr; record = record->next) {
            if (record->shape->kind == OxXmlShape::kCsv) {
                index += static_cast<OxXmlCsvBlock*>(record)->lines;
                continue;
            }
            if (record->shape->kind == OxXmlShape::kNode) {
                list->data[index] = fromRecord(record, false);
            }
            index++;
        }
        auto* self = const_cast<OxXmlElement*>(this);
        for (unsigned int i = 0; i < list->length; i++) {
            if (list->data[i] != nullptr) {
                list->data[i]->parent = self;
            }
        }
    }
    // The element is no const object (see the header): its list is made here.
    auto* self = const_cast<OxXmlElement*>(this);
    self->children = list;
    self->storage &= static_cast<std::uint8_t>(~kPendingChildren);
    if (list != nullptr) {
        self->storage |= kStoredChildren;
    }
}

void OxXmlElement::addAttribute(OxXmlAttribute* attribute) {
    if (attributeList() == nullptr) {
        // Most elements carry one or two attributes: start with one slot.
        attributes = newList<OxXmlAttribute*>(1);
    }
    attributes->append(attribute);
}

void OxXmlElement::reserveAttributes(unsigned int count) {
    if (attributeList() == nullptr) {
        attributes = newList<OxXmlAttribute*>(count);
    } else {
        attributes->reserve(count);
    }
}

void OxXmlElement::addChild(OxXmlElement* child) {
    if (childList() == nullptr) {
        children = newList<OxXmlElement*>(4);
    } else if ((storage & kStoredChildren) != 0) {
        // A stored list is exact: the list moves to the heap with room to grow.
        OxGList<OxXmlElement*>* list = newList<OxXmlElement*>(children->length * 2 + 1);
        try {
            for (unsigned int i = 0; i < children->length; i++) {
                list->append(children->data[i]); // within the capacity
            }
        } catch (const std::bad_alloc&) {
            deleteList(list);
            throw;
        }
        children = list;
        storage &= static_cast<std::uint8_t>(~kStoredChildren);
    }
    children->append(child);
}

OxBool OxXmlElement::deleteChild(unsigned int index) {
    if (childList() == nullptr) {
        return OxTrue;
    }
    if (index >= children->length) {
        return OxFalse;
    }
    OxXmlElement* child = children->data[index];
    if (child != nullptr) {
        release(child);
        children->data[index] = nullptr;
    }
    return OxTrue;
}

OxBool OxXmlElement::deleteChildren(char const* childName) {
    if (childName == nullptr || childList() == nullptr) {
        return OxTrue;
    }
    for (unsigned int i = 0; i < children->length; i++) {
        OxXmlElement* child = children->data[i];
        if (child != nullptr && sameText(child->name, childName)) {
            release(child);
            children->data[i] = nullptr;
        }
    }
    children->removeNulls();
    return OxTrue;
}

unsigned int OxXmlElement::getNbAttributes() const {
    if ((storage & kPendingAttributes) != 0) {
        return pending->shape->isTag() ? pending->shape->count
                                       : static_cast<OxXmlCsvRecord*>(pending)->count;
    }
    return attributes != nullptr ? attributes->length : 0;
}

unsigned int OxXmlElement::getNbChildElements() const {
    if ((storage & kPendingChildren) != 0) {
        unsigned int count = 0;
        for (OxXmlRecord* record = childRecords->firstChild(); record != nullptr;
             record = record->next) {
            count += record->shape->kind == OxXmlShape::kCsv
                         ? static_cast<OxXmlCsvBlock*>(record)->lines
                         : 1;
        }
        return count;
    }
    return children != nullptr ? children->length : 0;
}

OxXmlAttribute* OxXmlElement::getAttribute(unsigned int index) const {
    OxGList<OxXmlAttribute*>* list = attributeList();
    if (list == nullptr || index >= list->length) {
        return nullptr;
    }
    return list->data[index];
}

OxXmlElement* OxXmlElement::getChild(unsigned int index) const {
    OxGList<OxXmlElement*>* list = childList();
    if (list == nullptr || index >= list->length) {
        return nullptr;
    }
    return list->data[index];
}

OxXmlAttribute* OxXmlElement::getAttributeByName(char const* attributeName) const {
    if (attributeName == nullptr) {
        return nullptr;
    }
    OxGList<OxXmlAttribute*>* list = attributeList();
    if (list == nullptr) {
        return nullptr;
    }
    for (unsigned int i = 0; i < list->length; i++) {
        OxXmlAttribute* attribute = list->data[i];
        if (attribute != nullptr && sameText(attribute->getName(), attributeName)) {
            return attribute;
        }
    }
    return nullptr;
}

char const* OxXmlElement::getAttributeValue(char const* attributeName) const {
    OxXmlAttribute* attribute = getAttributeByName(attributeName);
    return attribute != nullptr ? attribute->getValue() : nullptr;
}

OxXmlElement* OxXmlElement::getChildByName(char const* childName) const {
    if (childName == nullptr || childList() == nullptr) {
        return nullptr;
    }
    for (unsigned int i = 0; i < children->length; i++) {
        OxXmlElement* child = children->data[i];
        if (child != nullptr && sameText(child->name, childName)) {
            return child;
        }
    }
    return nullptr;
}

OxGList<OxXmlElement const*> OxXmlElement::getChildrenByName(char const* childName) const {
    OxGList<OxXmlElement const*> found;
    if (childName == nullptr || childList() == nullptr) {
        return found;
    }
    for (unsigned int i = 0; i < children->length; i++) {
        OxXmlElement* child = children->data[i];
        if (child != nullptr && sameText(child->name, childName)) {
            found.append(child);
        }
    }
    return found;
}

OxBool OxXmlElement::isNamed(char const* otherName) const {
    return OxToBool(sameText(name, otherName));
}

OxBool OxXmlElement::isYes(char const* attributeName) const {
    return OxToBool(sameText(getAttributeValue(attributeName), OxXmlFile::OX_XML_LITERAL_YES));
}

void OxXmlElement::setName(char const* newName) {
    char const* old = name;
    name = OxXmlNames::acquire(newName);
    if ((storage & kHeldName) == 0) {
        OxXmlNames::release(old);
    }
    storage &= static_cast<std::uint8_t>(~kHeldName);
}

void OxXmlElement::setValue(char const* newValue) {
    char* copy = trimmedCopy(newValue); // first: without memory the value stays
    if ((storage & kStoredValue) == 0) {
        delete[] value;
    }
    value = copy;
    storage &= static_cast<std::uint8_t>(~kStoredValue);
}

void OxXmlElement::adoptValue(char* newValue) {
    if ((storage & kStoredValue) == 0) {
        delete[] value;
    }
    value = nullptr;
    storage &= static_cast<std::uint8_t>(~kStoredValue);
    if (newValue == nullptr || *newValue == '\0') {
        delete[] newValue; // an empty text is no text, as with setValue
        return;
    }
    value = OxString::stripWhite(newValue);
}

void OxXmlElement::setXsiType(char const* newType) {
    char* copy = trimmedCopy(newType);
    delete[] xsiType;
    xsiType = copy;
}

void OxXmlElement::dumpNode(std::ostrstream& stream) const {
    // Pending attributes are built before anything is written: without
    // memory the stream gets no part of the node.
    OxGList<OxXmlAttribute*>* list = attributeList();
    if (name != nullptr) {
        oxIndent(stream) << "XML Element: \"" << name << "\"";
        if (value != nullptr) {
            stream << "=\"" << value << "\"";
        }
        stream << "\n";
    } else if (value != nullptr) {
        stream << value << "\n";
    }
    if (xsiType != nullptr) {
        oxIndent(stream) << "xsi:type : " << xsiType << "\n";
    }
    if (list != nullptr) {
        OxPrt::adjustIndent(2);
        for (unsigned int i = 0; i < list->length; i++) {
            OxXmlAttribute* attribute = list->data[i];
            if (attribute != nullptr) {
                oxIndent(stream) << "attribute[" << i << "]:\n";
                attribute->dump(&stream);
            }
        }
        OxPrt::adjustIndent(-2);
    }
}

std::ostrstream* OxXmlElement::dump(std::ostrstream* stream) const {
    if (stream == nullptr) {
        return stream;
    }
    // Depth-first with an explicit stack of (element, next child slot), in the
    // order and with the indentation steps of the natural recursion: each
    // element's children are listed between adjustIndent(2) and
    // adjustIndent(-2). Elements of a derived class dump themselves.
    struct Frame {
        OxXmlElement const* element;
        unsigned int next;
    };
    OxGList<Frame> stack;
    auto enter = [&stack, stream](OxXmlElement const* element) {
        element->dumpNode(*stream);
        if (element->childList() != nullptr) {
            OxPrt::adjustIndent(2);
            stack.append(Frame{element, 0});
        }
    };
    enter(this);
    while (stack.length > 0) {
        Frame& top = stack.data[stack.length - 1];
        OxGList<OxXmlElement*>* list = top.element->children;
        while (top.next < list->length && list->data[top.next] == nullptr) {
            top.next++;
        }
        if (top.next >= list->length) {
            OxPrt::adjustIndent(-2);
            stack.length--;
            continue;
        }
        unsigned int index = top.next++;
        OxXmlElement const* child = list->data[index];
        oxIndent(*stream) << "child[" << index << "]:\n";
        if (typeid(*child) == typeid(OxXmlElement)) {
            enter(child);
        } else {
            child->dump(stream);
        }
    }
    return stream;
}
