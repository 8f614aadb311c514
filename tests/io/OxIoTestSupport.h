// Helpers of the file-stream tests: a message subsystem whose texts are the
// bare numbers (so a test can compare the sequence of messages logged), and
// owned-text conversion for the path operations.
#ifndef OXBASE_TESTS_IO_OXIOTESTSUPPORT_H
#define OXBASE_TESTS_IO_OXIOTESTSUPPORT_H

#include "oxbase/diag/OxMsg.h"
#include "support/OxTestSupport.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace oxiotest {

/// Messages of the file streams, type I so that nothing reaches stderr.
inline const char* messageFile() {
    return "1,I,0m1 %s\n2,I,0m2 %s\n3,I,0m3 %s\n18,I,0m18\n19,I,0m19\n20,I,0m20\n"
           "147,I,0m147\n152,I,0m152\n153,I,0m153\n179,I,0m179 %s\n180,I,0m180 %s\n"
           "181,I,0m181 %s\n182,I,0m182 %s\n183,I,0m183 %s\n344,I,0m344 %s %s\n484,I,0m484 %s\n"
           "578,I,0m578 %s\n579,I,0m579 %s\n";
}

/// A scratch directory and a running message subsystem that records every
/// logged text.
class IoTest : public testing::Test {
protected:
    oxtest::MessageLog log{messageFile()};
    const oxtest::TempDir& dir = log.dir;

    void SetUp() override { ASSERT_EQ(OxMsg::isValid(), OxTrue); }

    /// The numbers of the messages so far ("m2 x" gives "2"), then forgets them.
    std::vector<std::string> taken() {
        std::vector<std::string> numbers;
        for (const std::string& text : log.take()) {
            std::string::size_type space = text.find(' ');
            numbers.push_back(text.substr(1, space == std::string::npos ? space : space - 1));
        }
        return numbers;
    }
};

using Numbers = std::vector<std::string>;

/// The text of a new array, which is freed; "<null>" for null.
inline std::string take(char* text) {
    if (text == nullptr) {
        return "<null>";
    }
    std::string copy = text;
    delete[] text;
    return copy;
}

} // namespace oxiotest

#endif
