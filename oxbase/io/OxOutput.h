// OxOutput.h: typed big-endian writing and line writing to a file.
//
// OxOutput writes a file through a buffered output file stream, in the same
// layout that OxInput reads. Opening prepares the place first: a missing
// directory level of the name is created, and an existing file is removed
// (a symbolic link itself, never its target), except a device, FIFO or
// socket, which is opened as it is and keeps its kind. Every
// failure is logged by number (1, 179, 180, 181, 182 and the state messages
// 18, 19, 20) and told by the result; a stream that has failed stays failed.
// Typed values are buffered: call flush() or close() to learn that they
// reached the file (putline flushes each line by itself).
//
//   OxOutput out("out\\part.bin", OxFile::FILE_MODE_BINARY);
//   if (out.isGood()) { out.write(1.5); out.write(42); }
//
//   OxOutput text("out\\part.xml", OxFile::FILE_MODE_TEXT);
//   text.putline("<part/>");   // written and flushed
#ifndef OXBASE_IO_OXOUTPUT_H
#define OXBASE_IO_OXOUTPUT_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/io/OxFile.h"

#include <fstream>
#include <ios>

class OXBASE_API OxOutput : public OxFile {
public:
    /// Prepares the directory of `name` and opens it for output with
    /// truncation (binary mode for FILE_MODE_BINARY, text mode otherwise).
    /// isGood() tells whether it worked. `name` must not be null or empty.
    OxOutput(const char* name, OxFile::FILE_MODE mode);
    /// Closes the file. When the stream was clean until then and the final
    /// flush or close fails, message 183 (type E) names the file, so that the
    /// loss shows in the log and the error code; a stream that failed before
    /// was reported then and is closed quietly.
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

    /// Hands what the stream buffers to the file. OxFalse, with 179 and the
    /// state logged, when the stream is missing or not clean afterwards:
    /// values that `write` took into the buffer did not all reach the file.
    OxBool flush();
    /// Flushes and closes the file; the object has no stream afterwards, so
    /// later writes fail with 179. OxTrue only when every byte written
    /// reached the file and the close succeeded; otherwise 179 and the state
    /// are logged and the result is OxFalse (also for a second close).
    OxBool close();

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
    /// OxTrue when there is a stream; else 179 is logged.
    OxBool hasStream() const;
    /// OxTrue when the state is clean; else 179 and the state are logged.
    OxBool checkState() const;
    OxBool writeValueBytes(const unsigned char* bytes, unsigned int size);
    /// One value of type T in big-endian order, with the state rule of write.
    template <class T> OxBool writeNumber(T value);
    OxBool writeBlock(const char* buffer, long long length);

    std::ofstream* stream;
};

#endif
