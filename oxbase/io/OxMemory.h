// OxMemory.h: typed big-endian reading from a byte buffer held elsewhere.
//
// OxMemory reads the same value layout as OxInput, out of memory. It never
// owns the buffer. A read of n bytes goes ahead only while the offset plus n
// stays strictly below the length, so the last byte is never handed out:
// give a length one more than the record you want to read.
//
//   unsigned char bytes[9] = {0x3f, 0xf0, 0, 0, 0, 0, 0, 0, 0};
//   OxMemory memory(bytes, sizeof bytes);
//   double x = 0.0; memory.read(x);   // x == 1.0, returns 8
//
// Failures are logged by number: 147 (read beyond the bound), 152 and 153
// (a seek clamped at the start or at the last byte).
#ifndef OXBASE_IO_OXMEMORY_H
#define OXBASE_IO_OXMEMORY_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/core/OxTypes.h"

#include <cstddef>

class OXBASE_API OxMemory {
public:
    /// The reference point of a seek.
    enum DIR { DIR_CURRENT = 0, DIR_BEGIN = 1 };

    /// Reads from `buffer` of `length` bytes, which must outlive the object.
    OxMemory(unsigned char* buffer, unsigned int length);
    virtual ~OxMemory();

    /// One value in file order; returns its size, or 0 with 147 and nothing
    /// changed when the read would reach the last byte or beyond.
    int read(char& value);
    int read(unsigned char& value);
    int read(short& value);
    int read(unsigned short& value);
    int read(int& value);
    int read(unsigned int& value);
    int read(float& value);
    int read(double& value);
    /// Copies `count` bytes; returns `count`, or 0 with 147.
    int read(char* target, unsigned int count);
    int read(unsigned char* target, unsigned int count);

    /// Moves the read position. DIR_CURRENT adds `offset` in unsigned 64-bit
    /// arithmetic (a two's-complement value moves back): before the start
    /// clamps to the start (152), at or past the length clamps to the last
    /// byte (153). DIR_BEGIN accepts 0 to the length; beyond clamps to the
    /// last byte (153). OxFalse when clamped.
    OxBool seek(size_t offset, OxMemory::DIR direction);
    /// The number of bytes of the buffer.
    size_t getLength() const { return length; }
    /// Where the next read starts, from the start of the buffer.
    long long getCurOffset() const { return static_cast<long long>(current - buffer); }
    /// Writes nothing; returns `stream`.
    std::ostrstream* dump(std::ostrstream* stream) const;

private:
    bool fits(size_t size) const;
    /// One big-endian value of type T under the bounds rule of read.
    template <class T> int readNumber(T& value);

    unsigned char* buffer;
    size_t length;
    unsigned char* current;
};

#endif
