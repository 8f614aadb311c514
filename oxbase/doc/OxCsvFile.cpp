#include "oxbase/doc/OxCsvFile.h"

#include "oxbase/core/OxString.h"
#include "oxbase/core/detail/OxNoMemory.h"
#include "oxbase/diag/OxMsg.h"
#include "oxbase/diag/OxMsgNumbers.h"
#include "oxbase/diag/OxPrt.h"
#include "oxbase/doc/OxXmlAttribute.h"
#include "oxbase/doc/OxXmlElement.h"
#include "oxbase/doc/detail/OxCsvRecords.h"
#include "oxbase/doc/detail/OxLineSource.h"
#include "oxbase/doc/detail/OxXmlNames.h"
#include "oxbase/doc/detail/OxXmlStore.h"
#include "oxbase/io/OxInput.h"
#include "oxbase/io/OxOutput.h"

#include <cstdio>
#include <cstring>
#include <iostream>
#include <memory>
#include <new>
#include <string>

using namespace oxbase::detail;

char const OxCsvFile::OX_CSV_COMMENT_START = '#';

namespace {

char const* nameOf(OxFile const* file) {
    char const* name = file != nullptr ? file->getFilename() : nullptr;
    return name != nullptr ? name : "";
}

} // namespace

OxCsvFile::OxCsvFile(char const* filename, OxFile::OxIOType type) : separator(',') {
    open(filename, type);
}

OxCsvFile::OxCsvFile(char const* filename, OxFile::OxIOType type, char fieldSeparator)
    : separator(fieldSeparator) {
    open(filename, type);
}

OxCsvFile::~OxCsvFile() {
    delete input;
    delete output;
    OxXmlElement::release(root);
    delete store; // behind the nodes built there
    for (unsigned int i = 0; i < columnNames.getLength(); i++) {
        delete[] columnNames[i];
    }
}

int OxCsvFile::open(char const* filename, OxFile::OxIOType type) {
    // The streams require a name; a missing one gives a stream that is not
    // good rather than none, so that isGood and the result tell the caller.
    char const* name = filename != nullptr ? filename : "";
    if (type == OxFile::OxIOInput) {
        delete input;
        input = nullptr; // closed first, so that nothing holds the file
        input = new OxInput(name, OxFile::FILE_MODE_TEXT);
        return input->isGood() == OxTrue ? 0 : -1;
    }
    if (type == OxFile::OxIOOutput) {
        delete output;
        output = nullptr; // closed first: the new output may replace the file
        output = new OxOutput(name, OxFile::FILE_MODE_TEXT);
        return output->isGood() == OxTrue ? 0 : -1;
    }
    return 0;
}

OxBool OxCsvFile::isGood(OxFile::OxIOType type) const {
    if (type == OxFile::OxIOInput) {
        return OxToBool(input != nullptr && input->isGood() == OxTrue);
    }
    if (type == OxFile::OxIOOutput) {
        return OxToBool(output != nullptr && output->isGood() == OxTrue);
    }
    return OxFalse;
}

void OxCsvFile::setColumnNames(OxGList<char*>& names) {
    for (unsigned int i = 0; i < names.getLength(); i++) {
        if (names[i] != nullptr) {
            columnNames.append(OxString::dup(names[i]));
        }
    }
}

void OxCsvFile::setRoot(OxXmlElement* newRoot) {
    if (newRoot == root) {
        return;
    }
    OxXmlElement::release(root);
    root = newRoot;
}

OxBool OxCsvFile::isComment(char const* line) {
    return OxToBool(line != nullptr && line[0] == OX_CSV_COMMENT_START);
}

// ---------------------------------------------------------------------------
// Reading

OxBool OxCsvFile::readFile() {
    if (input == nullptr || input->isGood() != OxTrue) {
        return OxFalse;
    }
    if (input->seek(0, 0) != OxTrue) {
        OxMsg::Log(OxMsgFileShortRead, nameOf(input));
        return OxFalse;
    }
    unsigned int presetColumns = columnNames.getLength();
    bool read = withMemory([&] {
        if (store == nullptr) {
            store = new OxXmlStore;
        }
        bool headerDone = presetColumns > 0;
        auto* rootRecord = static_cast<OxXmlTagRecord*>(store->newTag(
            store->tagShape(store->holdText("root"), nullptr, 0, OxXmlShape::kTag), nullptr, 0));
        setRoot(OxXmlElement::fromRecord(rootRecord, true));
        OxCsvRecords records(*store, *rootRecord, columnNames, separator);
        // Lines are taken out of large blocks, whole whatever their length;
        // a last line without a line end is a line too.
        OxLineSource source(*input);
        source.start(input->getFileLength());
        char* line = nullptr;
        size_t length = 0;
        while (source.next(line, length) == OxLineSource::Line) {
            if (source.lineMayHoldNul()) {
                // The line ends at its first NUL byte.
                auto* nul = static_cast<char*>(std::memchr(line, '\0', length));
                length = nul != nullptr ? static_cast<size_t>(nul - line) : length;
            }
            takeLine(line, length, headerDone, records);
        }
    });
    if (!read) {
        // No part of a table: the records and the columns of this read go.
        reportNoMemory();
        setRoot(nullptr);
        delete store; // no node is left in it
        store = nullptr;
        while (columnNames.getLength() > presetColumns) {
            delete[] columnNames[--columnNames.length];
        }
        return OxFalse;
    }
    if (input->eof() != OxTrue) {
        OxMsg::Log(OxMsgFileRead, nameOf(input));
        return OxFalse;
    }
    return OxTrue;
}

void OxCsvFile::takeLine(char* line, size_t length, bool& headerDone, OxCsvRecords& records) {
    // Trimmed as OxString::stripWhite trims, without moving the text.
    char* begin = line;
    char* end = line + length;
    OxXmlNames::trim(begin, end);
    *end = '\0';
    if (begin == end || isComment(begin) == OxTrue) {
        return;
    }
    if (!headerDone) {
        headerDone = takeHeader(begin);
    } else {
        records.take(begin, static_cast<size_t>(end - begin));
    }
}

bool OxCsvFile::takeHeader(char* line) {
    bool complete = true;
    splitCsvFields(line, separator, [this, &complete](char* start, size_t length, bool last) {
        if (last && length == 0) {
            // The line ends in the separator: more columns follow on the
            // next line that is not skipped.
            complete = false;
            return;
        }
        columnNames.append(OxString::dup(start, length));
    });
    return complete;
}

// ---------------------------------------------------------------------------
// Writing

OxBool OxCsvFile::writeFile() {
    if (output == nullptr || output->isGood() != OxTrue) {
        return OxFalse;
    }
    if (output->seek(0, 0) != OxTrue) {
        OxMsg::Log(OxMsgFileShortRead, nameOf(output));
        return OxFalse;
    }
    bool written = withMemory([this] { writeLines(); });
    if (!written) {
        reportNoMemory(); // the lines sent so far stay in the file
    }
    // Every line went out through putline, whose results the format leaves
    // unread; the stream stays failed after a failed line, so one flush at
    // the end tells whether the whole table reached the file.
    OxBool flushed = output->flush();
    OxMsg::LogForce(OxMsgCsvWritten, nameOf(output));
    return OxToBool(written && flushed == OxTrue);
}

void OxCsvFile::writeLines() {
    std::string text;
    unsigned int columns = columnNames.getLength();
    if (columns > 0) {
        for (unsigned int i = 0; i < columns; i++) {
            if (i > 0) {
                text += separator;
            }
            if (columnNames[i] != nullptr) {
                text += columnNames[i];
            }
        }
        output->putline(text.c_str());
    }

    unsigned int width = columns;
    unsigned int records = root != nullptr ? root->getNbChildElements() : 0;
    for (unsigned int r = 0; r < records; r++) {
        OxXmlElement const* record = root->getChild(r);
        if (record == nullptr) {
            continue;
        }
        text.clear();
        unsigned int count = 0;
        bool first = true;
        unsigned int attributes = record->getNbAttributes();
        for (unsigned int a = 0; a < attributes; a++) {
            OxXmlAttribute const* attribute = record->getAttribute(a);
            if (attribute == nullptr) {
                continue;
            }
            if (!first) {
                text += separator;
            }
            first = false;
            char const* value = attribute->getValue();
            if (value == nullptr) {
                continue;
            }
            text += value;
            // A value that is a list of fields (see convertToCsv) counts each
            // of them; a quoted value is one field whatever it holds.
            count++;
            if (value[0] != '"') {
                count += OxString::occurances(value, separator);
            }
        }
        if (width == 0) {
            width = count;
        }
        if (width > count) {
            text.append(width - count, separator);
        }
        output->putline(text.c_str());
    }
}

// ---------------------------------------------------------------------------
// Queries and value preparation

OxXmlElement const* OxCsvFile::find(char const* attributeName, char const* value,
                                    unsigned int& index) const {
    if (root == nullptr || attributeName == nullptr) {
        return nullptr;
    }
    unsigned int records = root->getNbChildElements();
    for (unsigned int r = index; r < records; r++) {
        OxXmlElement const* record = root->getChild(r);
        if (record == nullptr) {
            continue;
        }
        OxXmlAttribute const* attribute = record->getAttributeByName(attributeName);
        if (attribute == nullptr) {
            continue;
        }
        if (value != nullptr &&
            (attribute->getValue() == nullptr || std::strcmp(attribute->getValue(), value) != 0)) {
            continue;
        }
        index = r;
        return record;
    }
    return nullptr;
}

void OxCsvFile::convertToCsv(OxXmlAttribute* attribute, OxBool quote) {
    if (attribute == nullptr || attribute->getValue() == nullptr) {
        return;
    }
    char* value = attribute->getValueForUpdate();
    OxString::stripWhite(value);
    if (quote != OxTrue) {
        OxString::tr(value, ' ', separator, OxTrue);
        return;
    }
    if (std::strchr(value, '"') != nullptr) {
        std::string quoted(1, '"');
        for (char const* p = value; *p != '\0'; p++) {
            quoted += *p;
            if (*p == '"') {
                quoted += '"';
            }
        }
        quoted += '"';
        attribute->setValue(quoted.c_str());
        return;
    }
    if (std::strchr(value, separator) != nullptr) {
        std::string quoted(1, '"');
        quoted += value;
        quoted += '"';
        attribute->setValue(quoted.c_str());
    }
}

OxBool OxCsvFile::parseCSVString(char const* text, char separator, OxGList<char*>& fields) {
    if (text == nullptr) {
        return OxFalse;
    }
    char* copy = OxString::dup(text);
    if (copy == nullptr) {
        return OxTrue; // an empty text has no fields
    }
    OxString::stripWhite(copy);
    splitCsvFields(copy, separator, [&fields](char* start, size_t length, bool) {
        if (length != 0) {
            char* field = OxString::dup(start, length);
            fields.append(OxString::stripWhite(field));
        }
    });
    delete[] copy;
    return OxTrue;
}

// ---------------------------------------------------------------------------
// Dump

std::ostrstream* OxCsvFile::dump(std::ostrstream* stream) const {
    return dumpCSV(stream);
}

std::ostrstream* OxCsvFile::dumpCSV(std::ostrstream* stream) const {
    if (stream == nullptr) {
        return stream;
    }
    oxIndent(*stream) << "OxCsvFile :"
                      << "\n";
    if (input != nullptr) {
        oxIndent(*stream) << "  CSV Input File Name: " << nameOf(input) << "\n";
    }
    if (output != nullptr) {
        oxIndent(*stream) << "  CSV Output File Name: " << nameOf(output) << "\n";
    }
    if (root != nullptr) {
        OxPrt::adjustIndent(2);
        root->dump(stream);
        OxPrt::adjustIndent(-2);
    }
    return stream;
}
