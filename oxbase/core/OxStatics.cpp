// OxStatics.cpp: every static object of the library whose construction order
// matters, in one translation unit so that the order below holds at load.
// Destruction runs in the reverse order at unload; the trace print object
// flushes what is left when it goes.
//
//   1. the identity matrix             OX_IDENTITY_3X3_MATRIX
//   2. the message list                OxMsg::msgList
//   3. the trace print object          OxPrt::tracePrt
//   4. the number conversion printer   OxString::conversionPrt
//   5. the table of names (13 slots)   OxName::table
//   6. the attribute print object      OxXmlAttribute's conversion printer
#include "oxbase/core/OxString.h"
#include "oxbase/diag/OxMsg.h"
#include "oxbase/diag/OxPrt.h"
#include "oxbase/doc/OxXmlAttribute.h"
// @@STATICS-INCLUDES@@

// 1. The identity matrix.
// @@STATIC-1-IDENTITY@@

// 2. The message list, capacity 4.
OxGList<OxMsgRecord_s*> OxMsg::msgList;

// 3. The trace print object.
OxPrt OxPrt::tracePrt;

// 4. The print object of the number and time conversions.
OxPrt OxString::conversionPrt;

// 5./6. The table of names and its tear-down.
// @@STATIC-5-NAMES@@

// 7. The print object of the attribute value conversions.
OxPrt OxXmlAttribute::conversionPrt;
