// OxLineSource.h: the lines of a text-mode input, whole, for the XML and CSV readers.
//
// The length measured at the open is the most that is read; the text may
// end sooner (CR LF read as "\n" on Windows). A line end of CR LF is left to
// the reader's trimming, so CR LF and LF files read the same everywhere.
// Without memory std::bad_alloc reaches the reader's caller (readFile).
//
//   OxLineSource source(input);
//   source.start(input.getFileLength());
//   while (source.next(line, length) == OxLineSource::Line) use(line, length);
#ifndef OXBASE_DOC_DETAIL_OXLINESOURCE_H
#define OXBASE_DOC_DETAIL_OXLINESOURCE_H

#include "oxbase/io/OxInput.h"

#include <cstddef>
#include <cstring>

namespace oxbase {
namespace detail {

/// The lines of a text-mode input, whole, whatever their length. Eight bytes
/// behind the end of each line handed out may be read (not written).
///
/// One buffer serves the whole file: blocks are read into it behind the
/// unfinished line, a finished line is handed out in place, and the buffer
/// only grows when a single line does not fit. Every byte is read, scanned
/// and moved at most once, so the work is linear in the file's size.
class OxLineSource {
public:
    explicit OxLineSource(OxInput& in) : input(in) {}
    OxLineSource(const OxLineSource&) = delete;
    OxLineSource& operator=(const OxLineSource&) = delete;
    ~OxLineSource() { delete[] buffer; }

    enum Result { Line, End, ReadFailure };

    /// Prepares to read `length` bytes from the current position.
    void start(long long length) {
        remaining = length > 0 ? length : 0;
        capacity = kInitialCapacity;
        buffer = newBuffer(capacity);
    }

    /// The next line without its line end, in place: `line` and `length`.
    /// At End the input has been read to its end (eof set, no longer good).
    /// The byte behind the line may be overwritten by the caller.
    Result next(char*& line, size_t& length) {
        for (;;) {
            char* found = static_cast<char*>(std::memchr(buffer + scan, '\n', filled - scan));
            if (found != nullptr) {
                line = buffer + lineStart;
                length = static_cast<size_t>(found - line);
                lineStart = scan = static_cast<size_t>(found - buffer) + 1;
                passNul();
                return Line;
            }
            scan = filled;
            if (remaining == 0) {
                if (lineStart < filled) {
                    // The last line has no line end: it is read all the same.
                    line = buffer + lineStart;
                    length = filled - lineStart;
                    lineStart = scan = filled;
                    passNul();
                    return Line;
                }
                // Leave the input at its end, as a line reader would: it is
                // then no longer good, and a second read stops at once.
                char probe[2];
                input.getline(probe, sizeof probe, '\n');
                return End;
            }
            Result refill = fill();
            if (refill != Line) {
                return refill;
            }
        }
    }

    /// Whether the line last handed out may hold a NUL byte (no line
    /// without one is ever said to).
    bool lineMayHoldNul() const { return lastLineNul; }

private:
    static constexpr size_t kNone = static_cast<size_t>(-1);
    /// Bytes behind the buffer's capacity that may be read (never used for
    /// text), so that a reader may load a whole word at any place of a line.
    static constexpr size_t kSlack = 8;

    static char* newBuffer(size_t size) {
        char* memory = new char[size + kSlack];
        std::memset(memory + size, 0, kSlack);
        return memory;
    }
    static constexpr size_t kInitialCapacity = 64 * 1024;

    /// Notes whether the line that ends before `lineStart` holds the next
    /// NUL byte, and finds the one behind it. Each byte is searched once.
    void passNul() {
        lastLineNul = nulAt < lineStart;
        if (lastLineNul) {
            auto* next =
                static_cast<char*>(std::memchr(buffer + lineStart, '\0', filled - lineStart));
            nulAt = next != nullptr ? static_cast<size_t>(next - buffer) : kNone;
        }
    }
    static constexpr size_t kMinimumRead = 16 * 1024;
    static constexpr size_t kMaximumRead = 1u << 30;

    Result fill() {
        if (lineStart > 0) {
            std::memmove(buffer, buffer + lineStart, filled - lineStart);
            filled -= lineStart;
            scan -= lineStart;
            if (nulAt != kNone) {
                nulAt -= lineStart;
            }
            lineStart = 0;
        }
        if (capacity - 1 - filled < kMinimumRead) {
            char* bigger = newBuffer(capacity * 2);
            std::memcpy(bigger, buffer, filled);
            delete[] buffer;
            buffer = bigger;
            capacity *= 2;
        }
        size_t want = capacity - 1 - filled;
        if (static_cast<long long>(want) > remaining) {
            want = static_cast<size_t>(remaining);
        }
        if (want > kMaximumRead) {
            want = kMaximumRead;
        }
        long long got = input.readText(buffer + filled, static_cast<unsigned int>(want));
        if (got < static_cast<long long>(want)) {
            if (input.eof() != OxTrue) {
                return ReadFailure; // reported by the input (2 and the state)
            }
            // The text ends before the length measured at the open: text
            // mode on Windows reads each CR LF as one character, and a file
            // that shrank meanwhile ends where its bytes end.
            remaining = 0;
        } else {
            remaining -= got;
        }
        if (nulAt == kNone && got > 0) {
            auto* nul =
                static_cast<char*>(std::memchr(buffer + filled, '\0', static_cast<size_t>(got)));
            nulAt = nul != nullptr ? static_cast<size_t>(nul - buffer) : kNone;
        }
        filled += static_cast<size_t>(got);
        return Line;
    }

public:
    /// Bytes not yet handed out as lines: the rest of the buffer and of the file.
    size_t unconsumed() const { return static_cast<size_t>(remaining) + (filled - lineStart); }

private:
    OxInput& input;
    long long remaining = 0;
    char* buffer = nullptr;
    size_t capacity = 0;
    size_t filled = 0;
    size_t lineStart = 0;
    size_t scan = 0;
    size_t nulAt = kNone; ///< the first NUL byte at or behind lineStart, if any
    bool lastLineNul = false;
};

} // namespace detail
} // namespace oxbase

#endif
