// OxBase.h: the whole library in one include.
//
// OxBase is the foundation library of a CAD data translator: numbered
// messages and print streams, big-endian binary files, an XML and CSV
// document model, file lists and tree walks, geometry values with
// process-wide tolerances, and strings, names, lists and range lists.
//
//   #include "oxbase/OxBase.h"
//   OxMsg msg("oxbase.msg", dataDir, "run.log", nullptr);
//   OxLimits::initTolerances();
//
// Failures are told by OxBool, a null pointer or a count, and the words for
// a human go through OxMsg by message number (OxMsgNumbers.h names them).
//
// Memory, one rule. The library allocates with plain `new` and the standard
// containers, so exhausted memory is one signal, std::bad_alloc; it never
// uses `new (std::nothrow)` and throws nothing of its own.
//  - An operation that describes what it does without memory catches the
//    signal where it arises and does that: the message buffer of OxMsg, the
//    records of OxRangeList (message 228), the directory streams (errno 12),
//    the buffers of OxFileTreeWalk (its debug text and -1), the pictures of
//    OxHeapInfo (no entries, or no diff).
//  - The operations that take outside input or build large structures catch
//    it at their boundary: OxXmlFile::readFile and writeFile, OxCsvFile::
//    readFile and writeFile, the OxMsg constructor (the subsystem then does
//    not start), OxFileList::readListFiles and OxFileTreeWalk::run. They
//    write "FATAL: Dynamic storage allocation failure." on standard error,
//    leave their object whole (an XML or CSV reader then holds no document
//    at all, never part of one; a list keeps the names read before, each
//    whole) and answer their failure result.
//  - Every other operation is exception-neutral: std::bad_alloc reaches its
//    caller, as from the standard containers, and the object it worked on is
//    as it was before the call. No object is ever left half-built.
#ifndef OXBASE_OXBASE_H
#define OXBASE_OXBASE_H

// Core types and text
#include "oxbase/core/HashTable.h"
#include "oxbase/core/OxGBinaryTree.h"
#include "oxbase/core/OxGList.h"
#include "oxbase/core/OxName.h"
#include "oxbase/core/OxString.h"
#include "oxbase/core/OxSystem.h"
#include "oxbase/core/OxType.h"
#include "oxbase/core/OxTypes.h"

// Diagnostics
#include "oxbase/diag/OxCounters.h"
#include "oxbase/diag/OxFlavor.h"
#include "oxbase/diag/OxHeapInfo.h"
#include "oxbase/diag/OxMsg.h"
#include "oxbase/diag/OxMsgNumbers.h"
#include "oxbase/diag/OxPrt.h"

// Files and streams
#include "oxbase/io/OxFile.h"
#include "oxbase/io/OxFileList.h"
#include "oxbase/io/OxFileTreeWalk.h"
#include "oxbase/io/OxInodeTable.h"
#include "oxbase/io/OxInput.h"
#include "oxbase/io/OxMemory.h"
#include "oxbase/io/OxOutput.h"

// Structured documents
#include "oxbase/doc/OxCsvFile.h"
#include "oxbase/doc/OxXmlAttribute.h"
#include "oxbase/doc/OxXmlElement.h"
#include "oxbase/doc/OxXmlFile.h"
#include "oxbase/doc/OxXmlFileList.h"

// Geometry
#include "oxbase/geom/OxBBox.h"
#include "oxbase/geom/OxBSphere.h"
#include "oxbase/geom/OxColor.h"
#include "oxbase/geom/OxLimits.h"
#include "oxbase/geom/OxLine.h"
#include "oxbase/geom/OxMatrix.h"
#include "oxbase/geom/OxPlane.h"
#include "oxbase/geom/OxRot.h"
#include "oxbase/geom/OxVec.h"

// Ranges
#include "oxbase/ranges/OxRangeList.h"

// Platform types of the interface: the file status record, heap walks,
// compiler annotations and the string streams of the print objects
#include "oxbase/platform/OxCompiler.h"
#include "oxbase/platform/OxHeapWalk.h"
#include "oxbase/platform/OxStat.h"
#include "oxbase/platform/OxStrstream.h"

#endif
