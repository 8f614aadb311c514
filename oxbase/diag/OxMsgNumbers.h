// OxMsgNumbers.h: the number of every message the library logs.
//
// A message file supplies the texts; the library names its messages by these
// numbers only. Each constant says which arguments the library passes, in
// order: a text that consumes more, or other kinds, is replaced at load by a
// safe text (see OxMsg), so that logging never reads an argument that was not
// passed. OxMsgLibraryArguments gives the same list in a form a program can
// check: "s" for a text (`%s`), "u" for an unsigned number (`%u`, `%d`, `%x`).
//
//   OxMsg::Log(OxMsgFileOpen, "part.xml");
//   const char * kinds = OxMsgLibraryArguments(OxMsgXmlErrorPlace);   // "suus"
#ifndef OXBASE_DIAG_OXMSGNUMBERS_H
#define OXBASE_DIAG_OXMSGNUMBERS_H

#include "oxbase/platform/OxExport.h"

enum OxMsgNumber : unsigned int {
    OxMsgFileOpen = 1,            ///< file name: the file cannot be opened
    OxMsgFileRead = 2,            ///< file name: a read fails
    OxMsgFileShortRead = 3,       ///< file name: a read is short or a seek fails
    OxMsgStreamEnd = 18,          ///< none: the stream state has its end-of-file flag
    OxMsgStreamFailed = 19,       ///< none: the stream state has its failure flag
    OxMsgStreamBad = 20,          ///< none: the stream state has its bad flag
    OxMsgMemoryPastEnd = 147,     ///< none: a memory read past the end of the buffer
    OxMsgMemoryBeforeStart = 152, ///< none: a memory seek before the start
    OxMsgMemoryBeyondEnd = 153,   ///< none: a memory seek past the end
    OxMsgMatrixSingular = 169,    ///< none: OxRot::invert of a singular matrix
    OxMsgFileWrite = 179,         ///< file name: a write fails
    /// directory; OxOutput passes the system error text as a second argument,
    /// OxFile::mkdir does not, so a text may consume the first only.
    OxMsgDirectoryCreate = 180,
    OxMsgNotADirectory = 181,       ///< path: it exists and is no directory
    OxMsgFileRemoveExisting = 182,  ///< file name: an existing output file cannot be removed
    OxMsgFileClose = 183,           ///< file name: the final close of an output failed
    OxMsgNoMemory = 228,            ///< type name: no memory for a record
    OxMsgRangeSyntax = 293,         ///< type word, position (u), text: syntax error in a range text
    OxMsgRangeBackwards = 294,      ///< type word, first (u), last (u): a range runs backwards
    OxMsgFileRemove = 344,          ///< path, system error text: a file cannot be removed
    OxMsgCwdUnreadable = 484,       ///< system error text: the working directory cannot be read
    OxMsgXmlNoQuote = 560,          ///< none: an attribute value does not begin with a quote
    OxMsgXmlNoDeclaration = 561,    ///< none: the document does not begin with a declaration
    OxMsgXmlInnerDeclaration = 562, ///< none: a declaration inside the document
    OxMsgXmlBadTagEnd = 564,        ///< none: a bad '/' in a tag, or a value not followed by '</'
    /// file name, line (u), offset (u), text of the line: the place of a
    /// syntax error, logged before the error's own number.
    OxMsgXmlErrorPlace = 566,
    /// file name, line (u), offset (u), end tag name, open element name.
    OxMsgXmlEndTagMismatch = 567,
    /// file name, line (u), offset (u), element name: a second top-level element.
    OxMsgXmlSecondTopLevel = 568,
    /// file name, line (u), count (u): NUL bytes read as blanks.
    OxMsgXmlNulBytes = 569,
    OxMsgCsvWritten = 578, ///< file name: the end of the write of a CSV file (forced)
    OxMsgXmlWritten = 579  ///< file name: the end of the write of an XML file
};

/// The numbers the library logs, ascending: index 0, 1, ... gives each in
/// turn, and 0 once the index is past the last.
OXBASE_API unsigned int OxMsgLibraryNumber(unsigned int index);

/// The kinds of the arguments the library passes with `number`, in order
/// ("s" text, "u" unsigned number, "" none), or null for a number the
/// library does not log. Where call sites differ (180), the shortest list.
OXBASE_API const char* OxMsgLibraryArguments(unsigned int number);

#endif
