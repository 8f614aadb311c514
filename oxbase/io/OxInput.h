// OxInput.h: typed big-endian reading and line reading from a file.
//
// OxInput reads a file through a buffered input file stream. Binary clients
// read typed values in the library's fixed layout (most significant byte
// first, no framing); text clients open in text mode and read lines. Every
// failure is logged by number (1, 2, 3 and the state messages 18, 19, 20) and
// told by the result; a stream that has failed stays failed.
//
//   OxInput in("part.bin", OxFile::FILE_MODE_BINARY);
//   double x = 0.0;
//   if (in.isGood() && in.read(x) == 8) { ... }
//
// Binary layout: char 1 byte; short 2; int 4; float 4 (IEEE single); double
// 8 (IEEE double); all big-endian. read(long long &) reads an unsigned
// 32-bit value and widens it without sign extension.
#ifndef OXBASE_IO_OXINPUT_H
#define OXBASE_IO_OXINPUT_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/io/OxFile.h"

#include <fstream>

/// `value` with its 8 bytes in reverse order (a bit-pattern operation).
OXBASE_API double swapd(double value);
/// `value` with its 4 bytes in reverse order (a bit-pattern operation).
OXBASE_API float swapf(float value);

class OXBASE_API OxInput : public OxFile {
public:
    /// Opens `name` for input (binary mode for FILE_MODE_BINARY, text mode
    /// otherwise) and measures its length. On failure logs 1 and the state;
    /// isGood() tells. `name` must not be null or empty.
    OxInput(const char* name, OxFile::FILE_MODE mode);
    ~OxInput() override;

    /// One value in file order. Returns its size on success. In a failed
    /// state: 0 (and 2 with the state logged); a read that fails part-way
    /// returns the bytes the stream delivered. The variable is changed only
    /// on success.
    long long read(char& value);
    long long read(unsigned char& value);
    long long read(short& value);
    long long read(unsigned short& value);
    long long read(int& value);
    long long read(unsigned int& value);
    /// Reads 4 bytes (unsigned 32-bit), widened with zero bits.
    long long read(long long& value);
    long long read(float& value);
    long long read(double& value);
    /// `length` bytes as they are in the file. Returns `length`, the count
    /// delivered on a short read in a clean state (3), or 0 when the state
    /// fails (2 and the state; bytes that arrived stay in `buffer`).
    long long read(char* buffer, unsigned int length);
    long long read(unsigned char* buffer, unsigned int length);
    /// Up to `length` characters as the stream delivers them, for readers of
    /// text that read in blocks: in text mode on Windows each CR LF of the
    /// file arrives as one "\n", so a text file gives fewer characters than
    /// its length. Fewer than `length` only at the end of the file, which
    /// sets the end-of-file flag and is no failure: the count is returned,
    /// nothing is logged. A state that is not clean before the call, a read
    /// error or a null `buffer` give 0 with 2 and the state logged.
    long long readText(char* buffer, unsigned int length);

    /// Reads `count` 16-bit units and stores the low 7 bits of each second
    /// byte; `stored` counts the characters. Returns 2 * count. No terminator.
    long long readUStoC(char* buffer, unsigned int count, unsigned int& stored);
    /// Reads (count + 1) / 2 units of two characters (7 bits each); `buffer`
    /// needs count + 1 bytes for an odd count. Returns the number of units.
    long long readDECUStoC(char* buffer, unsigned int count, unsigned int& stored);

    /// One line of at most size - 1 characters, up to `delimiter` (removed)
    /// or the end of the file, always terminated. OxTrue when the state is
    /// still clean afterwards.
    OxBool getline(char* buffer, unsigned int size, char delimiter = '\n');

    /// Whether the end-of-file flag is set.
    OxBool eof() const;
    /// Whether the stream exists and its state is clean.
    OxBool isGood() const;
    /// The byte length measured at open (0 when unknown).
    long long getFileLength() const { return fileLength; }
    /// The read position; -1 once the failure or bad flag is set.
    long long getFilePosition() const;
    /// Moves the position (0 beginning, 1 current, 2 end) without touching the
    /// state flags; OxFalse when the new position is invalid.
    OxBool seek(int offset, unsigned int direction) override;

    /// Writes "OxInput (Binary File):" and the whole file in hexadecimal
    /// lines (OxPrt::printHex). OxFalse for an empty file. Leaves the read
    /// position at the end.
    OxBool hexDump(std::ostrstream* stream);
    /// Writes "OxInput (Binary File):" and a newline; returns `stream`.
    std::ostrstream* dump(std::ostrstream* stream) const;

protected:
    /// Logs 18, 19, 20 for the end-of-file, failure and bad flags that are set.
    void readState() const;

private:
    /// Reads `size` bytes for one value into `bytes` by the protocol of the
    /// typed reads; true when the value may be stored. `result` is the count.
    bool readValueBytes(unsigned char* bytes, unsigned int size, long long& result);
    /// One big-endian value of type T, with the failure protocol of read.
    template <class T> long long readNumber(T& value);
    /// Reads one 16-bit unit for the character records.
    bool readUnit(unsigned char* unit, long long& result);

    std::ifstream* stream;
    long long fileLength;
};

#endif
