#include "oxbase/core/detail/OxNoMemory.h"

#include <cstdio>

namespace oxbase {
namespace detail {

void reportNoMemory() noexcept {
    // stdio, not a stream object: nothing here may need memory.
    std::fputs("FATAL: Dynamic storage allocation failure.\n", stderr);
    std::fflush(stderr);
}

} // namespace detail
} // namespace oxbase
