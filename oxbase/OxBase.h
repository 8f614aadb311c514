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
