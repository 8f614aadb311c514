// OxOutput.h: typed big-endian writing and line writing to a file.
//
// OxOutput writes a file through a buffered output file stream, in the same
// layout that OxInput reads. Opening prepares the place first: a missing
// directory level of the name is created, an existing file is removed. Every
// failure is logged by number (1, 179, 180, 181, 182 and the state messages
// 18, 19, 20) and told by the result; a stream that has failed stays failed.
//
//   OxOutput out("out\\part.bin", OxFile::FILE_MODE_BINARY);
//   if (out.isGood()) { out.write(1.5); out.write(42); }
//
//   OxOutput text("out\\part.xml", OxFile::FILE_MODE_TEXT);
//   text.putline("<part/>");   // written and flushed
#ifndef OXBASE_IO_OXOUTPUT_H
#define OXBASE_IO_OXOUTPUT_H

#include "oxbase/io/OxFile.h"

#include <fstream>
#include <ios>

class OxOutput : public OxFile {
public:
    /// Prepares the directory of `name` and opens it for output with
    /// truncation (binary mode for FILE_MODE_BINARY, text mode otherwise).
    /// isGood() tells whether it worked. `name` must not be null or empty.
    OxOutput(const char* name, OxFile::FILE_MODE mode);
    ~OxOutput() override;

    /// One value in file order (big-endian). OxFalse and 179 when the state
    /// is not clean before or after.
    OxBool write(char value);
    OxBool write(unsigned char value);
    OxBool write(short value);
    OxBool write(unsigned short value);
    OxBool write(int value);
    OxBool write(unsigned int value);
    OxBool write(float value);
    OxBool write(double value);
    /// `length` bytes as they are in memory.
    OxBool write(char* buffer, long long length);
    OxBool write(unsigned char* buffer, long long length);
    /// Convenience for constant blocks; the same as the forms above.
    OxBool write(const char* buffer, long long length);
    OxBool write(const unsigned char* buffer, long long length);

    /// The text, a newline, and a flush. A null text writes nothing (OxTrue).
    OxBool putline(const char* text);
    OxBool putline(const unsigned char* text);

    /// Whether the stream exists and its state is clean.
    OxBool isGood() const;
    /// The write position.
    std::fpos<int> getFilePosition() const;
    /// Moves the position (0 beginning, 1 current, 2 end) without touching the
    /// state flags; OxFalse when the new position is invalid.
    OxBool seek(int offset, unsigned int direction) override;
    /// Writes "OxOutput (Binary File):" and a newline; returns `stream`.
    std::ostrstream* dump(std::ostrstream* stream) const;

protected:
    /// Logs 18, 19, 20 for the end-of-file, failure and bad flags that are set.
    void readState() const;

private:
    OxBool writeValueBytes(const unsigned char* bytes, unsigned int size);
    /// One value of type T in big-endian order, with the state rule of write.
    template <class T> OxBool writeNumber(T value);
    OxBool writeBlock(const char* buffer, long long length);

    std::ofstream* stream;
};

#endif
