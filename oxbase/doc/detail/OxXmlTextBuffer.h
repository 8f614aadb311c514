// OxXmlTextBuffer.h: a growable text for the XML reader and writer.
//
// Texts gathered over many lines (comments, multi-line attribute values) and
// the lines of the writer are built here: appending is amortised constant
// per character, and a long text jumps to its known bound instead of being
// copied at every doubling.
//
//   OxXmlTextBuffer text;
//   text.append("<!-- a", 6);  text.append('\n');
//   use(text.text());
#ifndef OXBASE_DOC_DETAIL_OXXMLTEXTBUFFER_H
#define OXBASE_DOC_DETAIL_OXXMLTEXTBUFFER_H

#include <cstddef>
#include <cstring>

namespace oxbase {
namespace detail {

/// A growable text: appending is amortised constant per character, so
/// texts gathered over many lines cost linear time.
class OxXmlTextBuffer {
public:
    OxXmlTextBuffer() = default;
    OxXmlTextBuffer(const OxXmlTextBuffer&) = delete;
    OxXmlTextBuffer& operator=(const OxXmlTextBuffer&) = delete;
    ~OxXmlTextBuffer() { delete[] data; }

    void clear() {
        length = 0;
        if (data != nullptr) {
            data[0] = '\0';
        }
    }
    /// Without memory std::bad_alloc, and the text is unchanged.
    void append(char const* text, size_t count) {
        reserve(length + count + 1);
        std::memcpy(data + length, text, count);
        length += count;
        data[length] = '\0';
    }
    void append(char c) { append(&c, 1); }
    /// The text, NUL-terminated; "" while nothing was appended.
    char const* text() const { return data != nullptr ? data : ""; }
    /// Characters in the text.
    size_t size() const { return length; }
    /// Makes room for `count` characters in all; without memory std::bad_alloc
    /// and the text is unchanged.
    void reserveFor(size_t count) { reserve(count + 1); }
    /// Tells the buffer that its text will not grow beyond `maxLength`
    /// characters (what is left of the input bounds a gathered text).
    void expectAtMost(size_t maxLength) { ceiling = maxLength + 1; }
    /// Hands the text over as a new[] array when that saves a copy of a long
    /// text (it fills at least half of its array); null otherwise, and the
    /// caller copies text().
    char* releaseLong() {
        if (data == nullptr || length < kLongText || length < capacity / 2) {
            return nullptr;
        }
        char* text = data;
        data = nullptr;
        length = 0;
        capacity = 0;
        return text;
    }

private:
    void reserve(size_t needed) {
        if (needed <= capacity) {
            return;
        }
        size_t grown = capacity < 64 ? 64 : capacity;
        while (grown < needed) {
            grown *= 2;
        }
        // A long text jumps to the most it can still become, so that it is
        // neither copied at every doubling nor given twice the room it needs.
        if (grown > kLongText && ceiling >= needed) {
            grown = ceiling;
        }
        char* bigger = new char[grown];
        if (length > 0) {
            std::memcpy(bigger, data, length);
        }
        delete[] data;
        data = bigger;
        capacity = grown;
    }

    static constexpr size_t kLongText = 1u << 20;
    char* data = nullptr;
    size_t length = 0;
    size_t capacity = 0;
    size_t ceiling = 0;
};

} // namespace detail
} // namespace oxbase

#endif
