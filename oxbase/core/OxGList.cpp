#include "oxbase/core/OxGList.h"

#include <iostream>

namespace oxbase {
namespace detail {
void reportListRange(unsigned int index, unsigned int length) {
    std::cout << "Ooops, trying to access element " << index << " in OxList of length " << length
              << "\n"
              << std::flush;
}
} // namespace detail
} // namespace oxbase
