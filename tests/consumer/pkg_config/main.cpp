// A consumer built with pkg-config: starts the messages on the message file
// of the pkg-config datadir, parses ranges and turns a vector.
//
//   consumer    0 when all went as it should
#include "oxbase/OxBase.h"

#include <cmath>
#include <cstdio>
#include <string>

int main() {
    OxMsg msg("oxbase.msg", CONSUMER_DATA_DIR, nullptr, nullptr);
    if (OxMsg::isValid() != OxTrue) {
        std::fprintf(stderr, "no message file in %s\n", CONSUMER_DATA_DIR);
        return 1;
    }
    OxRangeList pages("9,1-3,2-4", "page");
    pages.compact();
    char* text = pages.convertToString();
    bool rangesOk = text != nullptr && std::string(text) == "1-4,9";
    delete[] text;
    OxRangeList broken("1 , 2", "page"); // message 293: an error
    OxRot turn(OxVec3d(0, 0, 1), std::acos(-1.0) / 2);
    OxVec3d v(1, 0, 0);
    v *= turn; // rows from the left: (0, -1, 0)
    bool turnOk = std::fabs(v[0]) < 1e-12 && std::fabs(v[1] + 1) < 1e-12;
    std::printf("ranges %s, vector (%g, %g, %g), error code %d\n", rangesOk ? "ok" : "wrong", v[0],
                v[1], v[2], static_cast<int>(OxMsg::getErrorCode()));
    return rangesOk && turnOk && OxMsg::getErrorCode() == OxErrorError ? 0 : 1;
}
