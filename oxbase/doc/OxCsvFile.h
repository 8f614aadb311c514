// OxCsvFile.h: separated-values files read into and written from the
// document model.
//
// A CSV file is one header line of column names and one record per line, with
// "#" comment lines and a separator chosen per file ("," by default). Reading
// builds an element "root" with one child "record" per data line; each
// non-empty field becomes an OxXmlAttribute named after its column. Writing
// sends the attribute values of each record back, one line per record.
//
//   OxCsvFile in("parts.csv", OxFile::OxIOInput);
//   if (in.readFile() == OxTrue) {
//       unsigned int at = 0;
//       OxXmlElement const * part = in.find("material", "steel", at);
//   }
//
// The format as read: each line is trimmed; blank lines and lines whose first
// character is "#" are skipped. Fields are what stands between two
// separators; there is no quoting on input (a double quote is data, and a
// separator inside quotes still separates). An empty field makes no attribute
// but keeps its position, so later fields keep their columns.
//
// Lines of any length are read, and so is a last line without a line end. A
// field behind the last column name is named "column<N>", N being its
// zero-based position in the line. Text is NUL-terminated throughout the
// library, so a NUL byte ends the text of its line. Any separator value is
// safe; the separator NUL makes each line one field, and a table written
// with it keeps only the first field of each record, as a line is a text.
#ifndef OXBASE_DOC_OXCSVFILE_H
#define OXBASE_DOC_OXCSVFILE_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/core/OxGList.h"
#include "oxbase/core/OxTypes.h"
#include "oxbase/io/OxFile.h"
#include "oxbase/platform/OxStrstream.h"

#include <cstddef>

class OxInput;
class OxOutput;
class OxXmlAttribute;
class OxXmlElement;
namespace oxbase {
namespace detail {
class OxCsvRecords;
class OxXmlStore;
} // namespace detail
} // namespace oxbase

class OXBASE_API OxCsvFile {
public:
    /// The first character of a comment line: "#".
    static char const OX_CSV_COMMENT_START;

    /// An empty table with the separator ",", then open(filename, type); its
    /// result is ignored (isGood tells).
    OxCsvFile(char const* filename, OxFile::OxIOType type);
    /// The same with a chosen separator.
    OxCsvFile(char const* filename, OxFile::OxIOType type, char separator);
    OxCsvFile(const OxCsvFile&) = delete;
    OxCsvFile& operator=(const OxCsvFile&) = delete;
    /// Deletes the streams and the tree, and frees the column names.
    virtual ~OxCsvFile();

    /// Opens a text-mode OxInput (OxIOInput) or OxOutput (OxIOOutput) on
    /// `filename`, replacing a stream of the same direction. 0 when the new
    /// stream is good, -1 when it is not; any other type: 0 and nothing done.
    int open(char const* filename, OxFile::OxIOType type);
    /// Whether the stream of that direction exists and is good.
    OxBool isGood(OxFile::OxIOType type) const;
    /// The input; only for an object opened for reading.
    OxInput& getInput() { return *input; }
    char getSeparator() const { return separator; }

    /// Appends a copy of each non-null entry of `names` to the column names
    /// (names already there stay). Before readFile, the first line of the file
    /// is then a record, not a header.
    void setColumnNames(OxGList<char*>& names);
    /// The column names in order; an entry is null for an empty header field.
    OxGList<char*> const& getColumnNames() const { return columnNames; }

    /// Reads the whole input from its start into a new tree (replacing the
    /// present one). OxFalse with no input or one that is not good, message 3
    /// when the rewind fails, message 2 when the input fails before its end.
    /// The input is left at its end, so a second call answers OxFalse.
    /// Without memory: the fatal line on standard error, OxFalse, no root
    /// and none of the column names this read found (no part of a table).
    OxBool readFile();
    /// Writes the header and one line per record from the start of the
    /// output, and logs message 578 (forced) with the file name. Values go
    /// out unchanged (see convertToCsv). A record with fewer fields than the
    /// width (the number of columns, or else the field count of the first
    /// record) is padded with separators at its end. Without a root only the
    /// header is written. OxFalse with no output or one that is not good,
    /// message 3 when the rewind fails, and OxFalse too when the output failed
    /// on the way (message 179) or memory ran out (the fatal line): the
    /// output is flushed at the end, so a table that did not reach the file
    /// whole is never answered OxTrue.
    OxBool writeFile();

    /// The tree or null; the object keeps it.
    OxXmlElement const* getRoot() const { return root; }
    OxXmlElement* getRootForUpdate() const { return root; }
    /// Deletes the present tree and takes ownership of `newRoot` (may be null).
    void setRoot(OxXmlElement* newRoot);

    /// The first record at a position from `index` upward that has the
    /// attribute `attributeName` and, when `value` is not null, exactly that
    /// value. On a hit `index` is set to its position (search on from
    /// index + 1); otherwise null and `index` stays.
    OxXmlElement const* find(char const* attributeName, char const* value,
                             unsigned int& index) const;

    /// Prepares an attribute value for writing; the value is trimmed first.
    /// Without `quote`, blanks become the separator (runs squeezed by
    /// OxString::tr), so "1.0 2.0 3.0" becomes three fields. With `quote`, a
    /// value holding a double quote is quoted with its quotes doubled
    /// (say "hi" -> "say ""hi"""), one holding the separator is quoted, any
    /// other stays. A null attribute or one without a value is left alone.
    void convertToCsv(OxXmlAttribute* attribute, OxBool quote);

    /// Appends a trimmed copy of each non-empty field of `text` split at
    /// `separator` to `fields` (empty fields are dropped, positions are not
    /// kept). The copies are the caller's (delete[]). OxFalse for a null text.
    static OxBool parseCSVString(char const* text, char separator, OxGList<char*>& fields);

    /// The readable form: calls dumpCSV. Returns `stream`.
    virtual std::ostrstream* dump(std::ostrstream* stream) const;
    /// "OxCsvFile :", the file names of the streams and the tree, by the dump
    /// convention. Returns `stream`.
    std::ostrstream* dumpCSV(std::ostrstream* stream) const;

private:
    /// Whether `line` begins with OX_CSV_COMMENT_START (OxFalse for null).
    OxBool isComment(char const* line);
    /// Trims the `length` characters of `line` (NUL-terminated) and files
    /// them unless they are blank or a comment: header fields while the
    /// header is open, otherwise a record under `root`.
    void takeLine(char* line, size_t length, bool& headerDone,
                  oxbase::detail::OxCsvRecords& records);
    /// Appends the fields of a header line to the column names; returns
    /// whether the header is complete (the line does not end in the separator).
    bool takeHeader(char* line);
    /// The lines of writeFile; std::bad_alloc reaches writeFile.
    void writeLines();

    OxInput* input = nullptr;
    OxOutput* output = nullptr;
    char separator;
    OxGList<char*> columnNames;
    OxXmlElement* root = nullptr;
    /// Where the reader builds the records (doc/detail/OxXmlStore): made by
    /// the first read, freed behind the tree.
    oxbase::detail::OxXmlStore* store = nullptr;
};

#endif
