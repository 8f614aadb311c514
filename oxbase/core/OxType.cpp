#include "oxbase/core/OxType.h"

std::ostrstream* OxType::dump(std::ostrstream* stream) const {
    return stream;
}
