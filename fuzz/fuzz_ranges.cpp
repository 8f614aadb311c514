// Feeds arbitrary text to the range-list parser and runs every operation on
// what it accepted. Run with -close_fd_mask=3 to keep the reports off the
// terminal.
#include "oxbase/ranges/OxRangeList.h"

#include <cstdint>
#include <string>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, size_t size) {
    std::string text(reinterpret_cast<const char*>(data), size);
    OxRangeList list(text.c_str(), "fuzz");
    OxRangeList other(text.c_str() + text.size() / 2, nullptr);
    delete[] list.convertToString();
    list.isInRange(7);
    list.merge(other);
    unsigned int number = 0;
    if (list.getFirstEntry(number) == OxTrue) {
        // A bounded walk: a list may hold four billion members.
        for (int step = 0; step < 1000 && number != 0; step++) {
            number = list.getNextEntry(number);
        }
    }
    other.negate(3, 4000000000U);
    delete[] other.convertToString();
    std::ostrstream dumped;
    list.dump(&dumped);
    dumped.freeze(false);
    return 0;
}
