// The default message file must give every number the library logs a text
// whose conversions consume exactly the arguments the library passes.
#include "oxbase/diag/OxMsgNumbers.h"
#include "support/OxTestSupport.h"

#include <gtest/gtest.h>

#include <cctype>
#include <string>

namespace {
/// The conversion letters of a printf format, in order ("%s %u" gives "su").
std::string conversions(const std::string& format) {
    std::string letters;
    for (size_t i = 0; i < format.size(); i++) {
        if (format[i] != '%') {
            continue;
        }
        i++;
        while (i < format.size() &&
               std::string("-+ #0123456789.lhzjt").find(format[i]) != std::string::npos) {
            i++;
        }
        if (i < format.size() && format[i] != '%') {
            letters += format[i];
        }
    }
    return letters;
}
} // namespace

TEST(OxDefaultMessages, EveryLoggedNumberHasAMatchingText) {
    // number -> the arguments the library passes: s text, u unsigned, d int.
    const struct {
        unsigned int number;
        const char* arguments;
    } logged[] = {
        // clang-format off
        {OxMsgFileOpen, "s"}, {OxMsgFileRead, "s"}, {OxMsgFileShortRead, "s"},
        {OxMsgStreamEnd, ""}, {OxMsgStreamFailed, ""}, {OxMsgStreamBad, ""},
        {OxMsgMemoryPastEnd, ""}, {OxMsgMemoryBeforeStart, ""}, {OxMsgMemoryBeyondEnd, ""},
        {OxMsgMatrixSingular, ""}, {OxMsgFileWrite, "s"}, {OxMsgDirectoryCreate, "s"},
        {OxMsgNotADirectory, "s"}, {OxMsgFileRemoveExisting, "s"}, {OxMsgFileClose, "s"},
        {OxMsgNoMemory, "s"}, {OxMsgRangeSyntax, "sus"}, {OxMsgRangeBackwards, "suu"},
        {OxMsgFileRemove, "ss"}, {OxMsgCwdUnreadable, "s"}, {OxMsgXmlNoQuote, ""},
        {OxMsgXmlNoDeclaration, ""}, {OxMsgXmlInnerDeclaration, ""}, {OxMsgXmlBadTagEnd, ""},
        {OxMsgXmlErrorPlace, "suus"}, {OxMsgXmlEndTagMismatch, "suuss"},
        {OxMsgXmlSecondTopLevel, "suus"}, {OxMsgXmlNulBytes, "suu"}, {OxMsgCsvWritten, "s"},
        {OxMsgXmlWritten, "s"},
        // clang-format on
    };
    // The library checks loaded texts against its own list: it must agree.
    for (const auto& entry : logged) {
        ASSERT_NE(OxMsgLibraryArguments(entry.number), nullptr) << entry.number;
        EXPECT_STREQ(OxMsgLibraryArguments(entry.number), entry.arguments) << entry.number;
    }
    EXPECT_EQ(OxMsgLibraryArguments(4), nullptr);
    unsigned int count = 0;
    for (unsigned int previous = 0; OxMsgLibraryNumber(count) != 0; count++) {
        EXPECT_GT(OxMsgLibraryNumber(count), previous); // ascending, each once
        previous = OxMsgLibraryNumber(count);
    }
    EXPECT_EQ(count, sizeof logged / sizeof logged[0]);
    // The texts as they stand in the file, continuation lines included.
    std::string file = oxtest::readFile(oxtest::dataFile("oxbase.msg"));
    for (const auto& entry : logged) {
        std::string key = "\n" + std::to_string(entry.number) + ",";
        size_t at = file.find(key);
        ASSERT_NE(at, std::string::npos) << entry.number;
        std::string text;
        // The message and any continuation lines with the same number.
        for (size_t line = at + 1; line != std::string::npos && line < file.size();) {
            size_t end = file.find('\n', line);
            std::string content = file.substr(line, end == std::string::npos ? end : end - line);
            std::string number = std::to_string(entry.number);
            if (content.compare(0, number.size(), number) != 0 ||
                (content.size() > number.size() &&
                 std::isdigit(static_cast<unsigned char>(content[number.size()])))) {
                break;
            }
            text += content;
            line = end == std::string::npos ? end : end + 1;
        }
        EXPECT_EQ(conversions(text), entry.arguments) << "message " << entry.number << ": " << text;
    }
}
