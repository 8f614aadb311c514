// The default message file must give every number the library logs a text
// whose conversions consume exactly the arguments the library passes.
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
    } logged[] = {{1, "s"},      {2, "s"},     {3, "s"},    {18, ""},      {19, ""},
                  {20, ""},      {147, ""},    {152, ""},   {153, ""},     {169, ""},
                  {179, "s"},    {180, "s"},   {181, "s"},  {182, "s"},    {228, "s"},
                  {293, "sus"},  {294, "suu"}, {344, "ss"}, {484, "s"},    {560, ""},
                  {561, ""},     {562, ""},    {564, ""},   {566, "suus"}, {567, "suuss"},
                  {568, "suus"}, {569, "suu"}, {578, "s"},  {579, "s"}};
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
