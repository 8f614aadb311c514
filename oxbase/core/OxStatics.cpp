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
#include "oxbase/core/OxName.h"
#include "oxbase/core/OxString.h"
#include "oxbase/diag/OxMsg.h"
#include "oxbase/diag/OxPrt.h"
#include "oxbase/doc/OxXmlAttribute.h"
#include "oxbase/geom/OxRot.h"

// 1. The identity matrix.
const OxRot OX_IDENTITY_3X3_MATRIX = OxRot::identity();

// 2. The message list, capacity 4.
OxGList<OxMsgRecord_s*> OxMsg::msgList;

// 3. The trace print object.
OxPrt OxPrt::tracePrt;

// 4. The print object of the number and time conversions.
OxPrt OxString::conversionPrt;

// 5. The table of names.
// The table is constant-initialised (no slots); the guard below gives it its
// 13 slots once, whatever number of guards run, and the table's destructor,
// registered with its definition, releases it at unload after the guard.
HashTable OxName::table;

namespace {
std::uint16_t oxNameTableUseCount = 0;
} // namespace

class OxNameTableGuard {
public:
    OxNameTableGuard() {
        if (oxNameTableUseCount++ == 0 && OxName::table.getTableSize() == 0) {
            OxName::table.init();
        }
    }
    ~OxNameTableGuard() { --oxNameTableUseCount; }
    OxNameTableGuard(const OxNameTableGuard&) = delete;
    OxNameTableGuard& operator=(const OxNameTableGuard&) = delete;
};

static OxNameTableGuard oxNameTableGuard;

// 6. The print object of the attribute value conversions.
OxPrt OxXmlAttribute::conversionPrt;
