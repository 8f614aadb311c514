// OxXmlNames.h: the shared texts of element and attribute names.
//
// A document repeats a few names many times: a model of a million points
// holds "point" and "vec3d" a million times each. Element and attribute
// names are therefore kept once each, with a count of the nodes that use
// them, instead of a heap copy per node. A name is trimmed as every text of
// the document model is; it is read-only for everyone.
//
//   char const* name = OxXmlNames::acquire("  point ");  // "point", shared
//   OxXmlNames::release(name);                           // one user less
//
// The table lives in static storage that needs no construction or
// destruction, so names may be taken and released at any time, also by the
// destructors of other statics. No lock: one thread at a time.
#ifndef OXBASE_DOC_DETAIL_OXXMLNAMES_H
#define OXBASE_DOC_DETAIL_OXXMLNAMES_H

#include <cctype>
#include <cstddef>

namespace oxbase {
namespace detail {

class OxXmlNames {
public:
    /// The shared, trimmed text of `text`: null for a null or empty text, an
    /// empty text for one of white space alone. Each call counts one user.
    static char const* acquire(char const* text);
    /// The same for the `length` characters at `text` (no terminator needed).
    static char const* acquire(char const* text, std::size_t length);
    /// One user more of a text returned by acquire (null is ignored); returns
    /// it. For a caller that names many nodes alike.
    static char const* share(char const* name);
    /// One user less of a text returned by acquire (null is ignored); the
    /// text is freed with its last user.
    static void release(char const* name);
    /// Distinct texts in use (for tests and statistics).
    static std::size_t count();
    /// Whether OxString::stripWhite trims `c` (std::isspace), without the
    /// library call for the ASCII characters, whose class no locale changes.
    static bool isWhite(char c) {
        auto code = static_cast<unsigned char>(c);
        if (code < 0x80) {
            return code == ' ' || (code >= '\t' && code <= '\r');
        }
        return std::isspace(code) != 0;
    }
    /// Narrows [begin, end) to its text without white space (isWhite) at
    /// either end, as OxString::stripWhite trims, without moving anything.
    template <class Char> static void trim(Char*& begin, Char*& end) {
        while (begin < end && isWhite(*begin)) {
            begin++;
        }
        while (end > begin && isWhite(end[-1])) {
            end--;
        }
    }
};

} // namespace detail
} // namespace oxbase

#endif
