// OxType.h: a tag of two numbers, a CAD identifier and a type number.
//
// OxType carries no behaviour of its own: a translator derives from it or
// holds one to remember which CAD system an object came from and of what
// type it is there. The library passes the values through unchanged.
//
//   OxType tag(OxType::OxCADIDNone, 42);
//   if (tag.getType() == 42) { ... }
#ifndef OXBASE_CORE_OXTYPE_H
#define OXBASE_CORE_OXTYPE_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/core/OxTypes.h"

#include <cstdint>

class OXBASE_API OxType {
public:
    /// Identifier of the CAD system of an object. Stored as a signed 32-bit
    /// number; applications may use values of their own beyond these.
    enum OxCADID : std::int32_t { OxCADIDNone = 0, OxCADIDUnknown = -1 };

    /// Both fields 0.
    OxType() = default;
    OxType(OxCADID id, int type) : cadID(id), type(static_cast<unsigned int>(type)) {}
    virtual ~OxType() = default;

    int getCADID() const { return cadID; }
    void setCADID(OxCADID id) { cadID = id; }
    unsigned int getType() const { return type; }
    void setType(unsigned int value) { type = value; }

    /// Writes nothing: the tag has no readable form. Returns `stream`.
    virtual std::ostrstream* dump(std::ostrstream* stream) const;

private:
    OxCADID cadID = OxCADIDNone;
    unsigned int type = 0;
};

#endif
