// OxPrt.h: print objects, the process-wide trace stream and the dump indentation.
//
// An OxPrt owns a std::ostrstream into which diagnostic text is written, most
// often by `dump`. The text leaves in one piece: `flushPrt` hands it to the
// message subsystem (OxMsg::LogForce) and the object's callback, while
// `flushToString` returns it as a new array. Every flush replaces the stream,
// so a pointer from `getStr` is valid only until the next flush.
//
//   OxPrt prt;
//   element.dump(prt.getStr());
//   prt.flushPrt();
#ifndef OXBASE_DIAG_OXPRT_H
#define OXBASE_DIAG_OXPRT_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/core/OxTypes.h"
#include "oxbase/platform/OxStrstream.h"

#include <cstddef>

class OXBASE_API OxPrt {
public:
    using Callback = void (*)(const char* text, void* userData);

    static char const* const sep_major_top;
    static char const* const sep_major_bot;
    static char const* const sep_minor;
    /// Blanks up to the current indentation, NUL-terminated at `curpos`.
    static char indent[41];
    /// Current dump indentation, 0 to 40.
    static short curpos;

    /// A print object whose first stream is set to fixed, dec, right and showpoint.
    /// Resets the process-wide indentation to 0.
    OxPrt();
    OxPrt(const OxPrt&) = delete;
    OxPrt& operator=(const OxPrt&) = delete;
    /// Flushes what is left (flushPrt), then resets the indentation to 0.
    virtual ~OxPrt();

    /// The current stream; valid until the next flush of this object.
    std::ostrstream* getStr() { return str; }
    /// Hands the text to OxMsg::LogForce and the callback; the stream is replaced.
    void flushPrt();
    /// The text as a new array (null when empty); the stream is replaced.
    char* flushToString();
    /// OxTrue when the stream holds more than 2,000,000 characters.
    OxBool isFull() const;
    void setPrtCallback(Callback function) { callback = function; }
    void setUserData(void* data) { userData = data; }
    /// Sets fixed, dec, right and showpoint on the current stream.
    void setDefaultFormat();
    /// Clears floatfield, basefield, adjustfield and showpoint on the current stream.
    void resetFormat();

    /// The trace stream; valid until the next flushTrace.
    static std::ostrstream& trace();
    static void flushTrace();
    static unsigned int getTraceThreshold() { return trace_threshold; }
    static void setTraceThreshold(unsigned int value) { trace_threshold = value; }

    static short getIndent() { return curpos; }
    /// Moves the indentation to `value`; values outside 0..40 change nothing.
    static void setIndent(short value);
    /// Moves the indentation by `delta`; a result outside 0..40 changes nothing.
    static void adjustIndent(short delta);

    /// Hexadecimal table of `count` bytes, 16 to a row, positions counted from `offset`.
    static void printHex(std::ostrstream* stream, const unsigned char* bytes, size_t count,
                         size_t offset);
    static void printHex(std::ostrstream* stream, const unsigned char* bytes, size_t count);

private:
    friend struct OxStatics;
    static unsigned int trace_threshold;
    static OxPrt tracePrt; // defined in oxbase/core/OxStatics.cpp

    void newStream();
    void renewStream();
    static void moveIndent(short to);

    int bufferSize = 2010000;
    std::ostrstream* str = nullptr;
    Callback callback = nullptr;
    void* userData = nullptr;
};

/// Does nothing: the statics of OxPrt are set up when the library is loaded.
OXBASE_API void OxPrtInit();

/// Writes the indentation of a dump line: curpos + 1 blanks.
OXBASE_API std::ostrstream& oxIndent(std::ostrstream& stream);

#endif
