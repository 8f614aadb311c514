// OxTypes.h: the vocabulary every OxBase class rests on.
//
// OxBool is the library's truth value (exactly 0 or 1), OxErrorCode the
// ladder of severities the message subsystem keeps the worst of. Both are
// 32-bit enumerations so that they can be stored in binary records as is.
//
//   OxBool ok = input.isGood();
//   if (OxMsg::getErrorCode() >= OxErrorError) { ... }
//
// The dump convention: every class with a readable form has
// `std::ostrstream * dump(std::ostrstream * stream) const`, which writes to the
// caller's stream and returns it. An indented line starts with OxPrt::curpos + 1
// blanks (see oxIndent below); nested objects are dumped between
// OxPrt::adjustIndent(2) and OxPrt::adjustIndent(-2).
#ifndef OXBASE_CORE_OXTYPES_H
#define OXBASE_CORE_OXTYPES_H

#include "oxbase/platform/OxStrstream.h"

#include <cstdint>

/// Boolean of the library: operations that return it return exactly these two values.
enum OxBool : std::int32_t { OxFalse = 0, OxTrue = 1 };

/// Severity ladder in steps of four; a greater value is always a worse state.
enum OxErrorCode : std::int32_t {
    OxErrorNone = 0,
    OxErrorWarning = 4,
    OxErrorError = 8,
    OxErrorSevere = 12,
    OxErrorFatal = 16
};

/// Turns any truth value into an OxBool.
inline OxBool OxToBool(bool value) {
    return value ? OxTrue : OxFalse;
}

#endif
