// OxRangeList.cpp: range text parser, compaction, walk, merge and complement.
#include "oxbase/ranges/OxRangeList.h"

#include "oxbase/core/OxString.h"
#include "oxbase/core/detail/OxNoMemory.h"
#include "oxbase/diag/OxMsg.h"
#include "oxbase/diag/OxMsgNumbers.h"

#include <algorithm>
#include <cctype>
#include <memory>
#include <new>
#include <string>
#include <vector>

using namespace oxbase::detail;

namespace {

char const* const recordTypeName = "OxRangeListRecord";

enum class ParseState { RangeStart, FirstNumber, LastStart, LastNumber, RangeDone };

bool isDigit(char c) {
    return c >= '0' && c <= '9';
}

unsigned int digitValue(char c) {
    return static_cast<unsigned int>(c - '0');
}

/// "a" or "a-b" behind `text`, with a "," in front unless `text` is empty.
void appendRange(std::string& text, unsigned int first, unsigned int last) {
    if (!text.empty()) {
        text += ',';
    }
    text += std::to_string(first);
    if (last != first) {
        text += '-';
        text += std::to_string(last);
    }
}

} // namespace

OxRangeList::OxRangeList() = default;

OxRangeList::OxRangeList(char const* text, char const* typeName) {
    build(text, typeName);
}

OxRangeList::OxRangeList(OxGList<unsigned int>& numbers, char const* typeName) {
    numbers.sort();
    numbers.removeDuplicates();
    std::string text;
    unsigned int count = numbers.getLength();
    bool spelled = withMemory([&] {
        unsigned int i = 0;
        while (i < count) {
            unsigned int first = numbers[i];
            unsigned int last = first;
            // Sorted and unique: a run goes on while each is one above the last.
            while (i + 1 < count && last != ~0u && numbers[i + 1] == last + 1) {
                last = numbers[++i];
            }
            appendRange(text, first, last);
            i++;
        }
    });
    if (!spelled) {
        OxMsg::Log(OxMsgNoMemory, recordTypeName);
        valid = OxFalse;
        return;
    }
    if (text.empty()) {
        valid = OxTrue; // no numbers: a valid set with no members
        return;
    }
    build(text.c_str(), typeName);
}

OxRangeList::~OxRangeList() {
    releaseRecords();
    releaseTree();
}

void OxRangeList::releaseRecords() {
    for (unsigned int i = 0; i < length; i++) {
        delete data[i];
    }
    makeEmpty();
    forgetWalk();
}

void OxRangeList::releaseTree() {
    if (tree != nullptr) {
        tree->makeEmpty();
        delete tree;
        tree = nullptr;
    }
}

OxBool OxRangeList::insert(OxRangeListRecord* record) {
    append(record);
    compacted = OxFalse;
    forgetWalk();
    return OxTrue;
}

OxBool OxRangeList::build(char const* text, char const* typeName) {
    OxBool result = OxFalse;
    if (!withMemory([&] { result = parse(text, typeName); })) {
        // No memory for a record, the list or the working copy: no list at
        // all rather than part of one.
        OxMsg::Log(OxMsgNoMemory, recordTypeName);
        releaseRecords();
        releaseTree();
        valid = OxFalse;
        compacted = OxFalse;
        return OxFalse;
    }
    return result;
}

OxBool OxRangeList::parse(char const* text, char const* typeName) {
    compacted = OxFalse;
    forgetWalk();
    if (typeName == nullptr) {
        typeName = "integer";
    }
    // A working copy, null for a null or empty text.
    std::unique_ptr<char[]> owned(OxString::dup(text));
    char* copy = owned.get();
    if (copy == nullptr) {
        valid = OxFalse;
        return OxFalse;
    }
    OxString::stripCRLF(copy);
    OxString::stripWhite(copy);

    ParseState state = ParseState::RangeStart;
    unsigned int first = 0;
    unsigned int last = 0;
    unsigned int position = 0; // index of the character under consideration
    bool failed = false;

    auto syntaxError = [&](unsigned int at) {
        OxMsg::Log(OxMsgRangeSyntax, typeName, at + 1, copy);
        failed = true;
    };
    // Stores first..last; false (after the message) when it runs backwards.
    auto store = [&]() {
        if (last < first) {
            OxMsg::Log(OxMsgRangeBackwards, typeName, first, last);
            return false;
        }
        reserve(length + 1); // the room first: the insert cannot fail then
        insert(new OxRangeListRecord{first, last});
        return true;
    };

    while (!failed && copy[position] != '\0') {
        char c = copy[position];
        switch (state) {
        case ParseState::RangeStart:
            if (std::isspace(static_cast<unsigned char>(c)) != 0) {
                position++;
            } else if (isDigit(c)) {
                first = digitValue(c);
                state = ParseState::FirstNumber;
                position++;
            } else {
                syntaxError(position);
            }
            break;
        case ParseState::FirstNumber:
            if (isDigit(c)) {
                first = first * 10 + digitValue(c);
                position++;
            } else if (c == ',' || c == ' ') {
                last = first;
                state = ParseState::RangeDone;
                position++;
            } else if (c == '-') {
                state = ParseState::LastStart;
                position++;
            } else {
                syntaxError(position);
            }
            break;
        case ParseState::LastStart:
            if (isDigit(c)) {
                last = digitValue(c);
                state = ParseState::LastNumber;
                position++;
            } else {
                syntaxError(position);
            }
            break;
        case ParseState::LastNumber:
            if (isDigit(c)) {
                last = last * 10 + digitValue(c);
                position++;
            } else if (c == ',' || c == ' ') {
                state = ParseState::RangeDone;
                position++;
            } else {
                syntaxError(position);
            }
            break;
        case ParseState::RangeDone:
            // Reads no character: stores the range and starts the next one.
            failed = !store();
            first = 0;
            last = 0;
            state = ParseState::RangeStart;
            break;
        }
    }

    if (!failed) {
        switch (state) {
        case ParseState::FirstNumber:
            last = first;
            failed = !store();
            break;
        case ParseState::LastNumber:
            failed = !store();
            break;
        case ParseState::LastStart:
            syntaxError(position); // one behind the end
            break;
        case ParseState::RangeStart:
        case ParseState::RangeDone: // a trailing separator: see the header
            break;
        }
    }
    if (failed) {
        releaseRecords();
        releaseTree();
        valid = OxFalse;
        compacted = OxFalse;
        return OxFalse;
    }
    compacted = OxFalse;
    valid = OxTrue;
    return OxTrue;
}

void OxRangeList::sort() {
    // A stable sort by `first` gives exactly the order of an insertion sort
    // (records with equal `first` keep their order), without its quadratic
    // cost on long unordered lists.
    if (length > 1) {
        std::stable_sort(data, data + length,
                         [](const OxRangeListRecord* a, const OxRangeListRecord* b) {
                             return a->first < b->first;
                         });
    }
    compacted = OxFalse;
    forgetWalk();
}

void OxRangeList::compact() {
    forgetWalk();
    if (length < 2) {
        compacted = OxTrue;
        return;
    }
    sort();
    unsigned int runs = 0; // index of the current run
    for (unsigned int i = 1; i < length; i++) {
        OxRangeListRecord* run = data[runs];
        OxRangeListRecord* record = data[i];
        if (record->first > run->last) {
            data[++runs] = record;
        } else {
            run->last = std::max(run->last, record->last);
            delete record;
        }
    }
    length = runs + 1;
    compacted = OxTrue;
}

void OxRangeList::merge(OxRangeList& other) {
    unsigned int count = other.getLength(); // fixed before appending (self-merge)
    bool copied = withMemory([&] {
        reserve(length + count); // the room first: no insert can fail then
        for (unsigned int i = 0; i < count; i++) {
            const OxRangeListRecord* source = other.data[i];
            insert(new OxRangeListRecord{source->first, source->last});
        }
    });
    if (!copied) {
        OxMsg::Log(OxMsgNoMemory, recordTypeName); // the ranges merged so far stay
    }
    compact();
}

OxBool OxRangeList::negate(unsigned int from, unsigned int to) {
    if (from > to) {
        return OxFalse;
    }
    compact();

    // Every new record is made, and room for them in the list, before the
    // list is touched, so a failure leaves it as it was.
    std::vector<std::unique_ptr<OxRangeListRecord>> pieces;
    auto add = [&](unsigned int first, unsigned int last) {
        pieces.push_back(std::make_unique<OxRangeListRecord>(OxRangeListRecord{first, last}));
    };
    bool made = withMemory([&] {
        if (length == 0) {
            add(from, to);
        } else {
            unsigned int lowest = data[0]->first;
            unsigned int highest = data[length - 1]->last;
            if (from < lowest) {
                add(from, lowest - 1);
            }
            // Touching records ("1-3,4-6") stay apart in a compact list and
            // have no gap between them.
            for (unsigned int i = 0; i + 1 < length; i++) {
                unsigned int gapFirst = data[i]->last + 1;
                unsigned int gapLast = data[i + 1]->first - 1;
                if (gapFirst <= gapLast) {
                    add(gapFirst, gapLast);
                }
            }
            if (highest < to) {
                add(highest + 1, to);
            }
        }
        reserve(static_cast<unsigned int>(pieces.size()));
    });
    if (!made) {
        OxMsg::Log(OxMsgNoMemory, recordTypeName); // the pieces go with the vector
        return OxFalse;
    }

    // The old records go, the array stays: it has room for the pieces.
    for (unsigned int i = 0; i < length; i++) {
        delete data[i];
    }
    length = 0;
    forgetWalk();
    releaseTree();
    for (auto& record : pieces) {
        append(record.release());
    }
    compacted = OxTrue;
    return OxTrue;
}

OxBool OxRangeList::isInRange(unsigned int number) const {
    for (unsigned int i = 0; i < length; i++) {
        if (data[i]->first <= number && number <= data[i]->last) {
            return OxTrue;
        }
    }
    return OxFalse;
}

OxBool OxRangeList::getFirstEntry(unsigned int& number) {
    number = 0;
    if (!compacted) {
        compact();
    }
    if (length == 0) {
        forgetWalk();
        return OxFalse;
    }
    number = data[0]->first;
    walkIndex = 0;
    walkAnswer = number;
    return OxTrue;
}

unsigned int OxRangeList::getNextEntry(unsigned int number) {
    if (!compacted) {
        compact();
    }
    // In a compact list at most one record holds a number, so the record of
    // the last answer is the one a search from the front would find.
    unsigned int index = noWalk;
    if (walkIndex < length && number == walkAnswer && data[walkIndex]->first <= number &&
        number <= data[walkIndex]->last) {
        index = walkIndex;
    } else {
        for (unsigned int i = 0; i < length; i++) {
            if (data[i]->first <= number && number <= data[i]->last) {
                index = i;
                break;
            }
        }
    }
    if (index == noWalk) {
        forgetWalk();
        return 0;
    }
    unsigned int next = 0;
    if (number < data[index]->last) {
        next = number + 1;
    } else if (index + 1 < length) {
        index++;
        next = data[index]->first;
    } else {
        forgetWalk();
        return 0;
    }
    walkIndex = index;
    walkAnswer = next;
    return next;
}

char* OxRangeList::convertToString() {
    if (length == 0) {
        return nullptr;
    }
    std::string text;
    for (unsigned int i = 0; i < length; i++) {
        appendRange(text, data[i]->first, data[i]->last);
    }
    return OxString::dup(text.c_str());
}

std::ostrstream* OxRangeList::dump(std::ostrstream* stream) const {
    if (stream == nullptr) {
        return stream;
    }
    *stream << "OxRangeList (List of numeric ranges):"
            << "\n";
    *stream << "There are " << length << " range records in the range list."
            << "\n";
    for (unsigned int i = 0; i < length; i++) {
        const OxRangeListRecord* record = data[i];
        *stream << "[" << i << "]: Number";
        if (record->first != record->last) {
            *stream << "s from " << record->first << " through " << record->last;
        } else {
            *stream << " " << record->first;
        }
        *stream << "\n";
    }
    if (tree != nullptr) {
        *stream << "---- OxBinaryTree:"
                << "\n";
        tree->dump(stream, tree->root);
        *stream << "---- End of OxBinaryTree:"
                << "\n";
    }
    return stream;
}
