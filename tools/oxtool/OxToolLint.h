// OxToolLint.h: what the library will not give back as it read it.
//
// The document classes are lossy by design, and stay so; these checks tell
// a user before it bites. Each finding names its cause, the element or
// record, and the line of the source. Two kinds of evidence are used:
// - the tree as read, against a shadow of the reader's line-by-line state
//   machine over the source bytes (which node came from which line, what
//   stood behind a comment's end or a declaration on their lines);
// - a round trip: the document is written, read and written again, and the
//   two writes are compared. A document whose second write differs from the
//   first always draws a warning: a named cause where one explains the
//   change, else a generic one naming the first line that changed.
//
//   std::vector<OxToolFinding> findings;
//   OxXmlFile doc(path, OxFile::OxIOInput);
//   if (doc.readFile()) oxtoolLintXml(source, doc, scratch, findings);
#ifndef OXTOOL_OXTOOLLINT_H
#define OXTOOL_OXTOOLLINT_H

#include "OxToolFiles.h"

#include "oxbase/core/OxTypes.h"

#include <string>
#include <vector>

class OxXmlFile;
class OxCsvFile;

/// One finding of a check: a library message or a lint warning.
struct OxToolFinding {
    OxErrorCode severity = OxErrorWarning;
    unsigned int line = 0; ///< line of the source, 0 when there is none
    std::string text;
    std::string tag; ///< "lint:CAUSE" for a lint warning, "msg N" for a message
};

/// The lint causes, as they appear in the tags (see docs/ for each).
namespace oxlint {
constexpr const char* kValueHidesAttributes = "value-hides-attributes";
constexpr const char* kValueHidesChildren = "value-hides-children";
constexpr const char* kMarkupInValue = "markup-in-value";
constexpr const char* kQuoteInAttribute = "quote-in-attribute";
constexpr const char* kEmptyAttribute = "empty-attribute";
constexpr const char* kRawSharesLine = "raw-shares-line";
constexpr const char* kTextBehindRawEnd = "text-behind-raw-end";
constexpr const char* kCdataLinesTrimmed = "cdata-lines-trimmed";
constexpr const char* kDeclarationTrailingMarkup = "declaration-trailing-markup";
constexpr const char* kDeclarationUnterminated = "declaration-unterminated";
constexpr const char* kTextBeforeDeclaration = "text-before-declaration";
constexpr const char* kDoctypeTrailingMarkup = "doctype-trailing-markup";
constexpr const char* kDoctypeSubset = "doctype-subset";
constexpr const char* kRangeWraps = "range-wraps";
constexpr const char* kRoundTrip = "round-trip";
constexpr const char* kCsvHole = "csv-hole";
constexpr const char* kCsvQuoteSplit = "csv-quote-split";
constexpr const char* kCsvCommentsDropped = "csv-comments-dropped";
constexpr const char* kWalkLoop = "walk-loop";
constexpr const char* kWalkUnlisted = "walk-unlisted";
} // namespace oxlint

/// Lint of an XML document that the library read without error: `source`
/// is the file's bytes, `document` the object that read it (it is written to
/// scratch files for the round trip). Findings are appended in line order.
void oxtoolLintXml(const std::string& source, OxXmlFile& document, const OxToolTempDir& scratch,
                   std::vector<OxToolFinding>& findings);

/// Lint of a CSV table read with `separator`, as for XML.
void oxtoolLintCsv(const std::string& source, OxCsvFile& table, char separator,
                   const OxToolTempDir& scratch, std::vector<OxToolFinding>& findings);

/// A number of a range text that does not fit in 32 bits.
struct OxToolRangeWrap {
    unsigned int position = 0; ///< one-based place of its first digit
    std::string digits;
    unsigned int wrapped = 0; ///< what the library's 32-bit arithmetic makes of it
};

/// The numbers of `text` above 4294967295, when `text` has the shape of range
/// text (digits, '-', ',' and white space only); empty otherwise.
std::vector<OxToolRangeWrap> oxtoolRangeWraps(const std::string& text);

/// What the library's tree walk wrote to standard error (`walkErrors`),
/// turned into findings naming the path: a directory that could not be
/// listed and was walked as empty, a looping symbolic link or another path
/// where the walk ended early. `unreadable` lists the directories the walk
/// reported as unreadable (permission), which are not treated as empty.
std::vector<OxToolFinding> oxtoolWalkFindings(const std::string& walkErrors,
                                              const std::vector<std::string>& unreadable);

/// Whether a walk ended early by the findings above.
bool oxtoolWalkEndedEarly(const std::vector<OxToolFinding>& findings);

#endif
