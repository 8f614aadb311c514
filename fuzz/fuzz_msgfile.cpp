// Message files: starts the message subsystem on the input as its message
// file (with a log file and a callback that reads every text), then logs
// every number the library logs with the arguments the library passes
// (OxMsgLibraryArguments: texts and unsigned numbers), by Log, LogError and
// LogForce, and formats each with LogToString. A text of such a number that
// does not fit its arguments is replaced at load, so none of this may read
// an argument that was not passed: the property is that ASan and UBSan stay
// quiet and every text handed out is terminated within its buffer.
//
// Texts whose conversions ask for more than ten million characters in all
// (widths and precisions, summed over the whole input) are loaded but not
// logged: the buffer then grows, by design, up to the int range (1.6 GB),
// and every log of such a text costs seconds and writes that much to the log
// file. That such a text is cut to the largest buffer is a unit test.
//
// The second property is that a %n never writes. The load rewrites every %n
// of every text; to see that it did, the numbers the input defines that the
// library does not log are formatted with sixteen pointers to a guarded
// block as arguments, twice with different guard bytes (a %hhn could write
// the guard byte itself), and the block must come out unchanged. Such texts
// are foreign to the library, so they are formatted only when every
// conversion that could start at any "%" of the whole input (the reader
// takes delimiters out of a line, so "%%" may lose its first "%") reads an
// argument the sixteen pointers can serve (d i o u x X c p s n with integer lengths, at most
// sixteen in all, widths and precisions of at most four digits): a text of other conversions is the
// caller's to match with arguments, not the library's.
#include "OxFuzzSupport.h"

#include "oxbase/diag/OxMsg.h"
#include "oxbase/diag/OxMsgNumbers.h"

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <sstream>
#include <string>
#include <vector>

namespace {

constexpr int kPointers = 16;

/// Calls `call` with one argument per letter of `kinds`: `text` for 's',
/// `number` for 'u'. At most six arguments.
template <class Call, class... Arguments>
void withArguments(const Call& call, const char* kinds, const char* text, unsigned int number,
                   Arguments... arguments) {
    if constexpr (sizeof...(Arguments) < 6) {
        if (*kinds == 's') {
            withArguments(call, kinds + 1, text, number, arguments..., text);
            return;
        }
        if (*kinds == 'u') {
            withArguments(call, kinds + 1, text, number, arguments..., number);
            return;
        }
    }
    OXFUZZ_CHECK(*kinds == '\0', "argument kinds beyond six or unknown: %s", kinds);
    call(arguments...);
}

void readText(const char* text, void* /*userData*/) {
    OXFUZZ_CHECK(text != nullptr, "the callback got a null text");
    (void)std::strlen(text);
}

/// Whether every conversion of `input` can be served by kPointers pointers
/// to a block that holds a short text.
bool onlyPointerConversions(const std::string& input) {
    int arguments = 0;
    // Every "%" is taken as the start of a conversion, also the second of
    // "%%": the reader may have taken the first as a delimiter.
    for (size_t at = input.find('%'); at != std::string::npos; at = input.find('%', at + 1)) {
        size_t p = at + 1;
        p = input.find_first_not_of("-+ #0", p);
        for (int part = 0; part < 2 && p != std::string::npos; part++) {
            size_t digits = input.find_first_not_of("0123456789", p);
            if (digits == std::string::npos || digits - p > 4) {
                return false;
            }
            p = digits;
            if (part == 0 && input[p] == '.') {
                p++;
            } else {
                break;
            }
        }
        if (p == std::string::npos) {
            return false;
        }
        size_t length = input.find_first_not_of("hlzjt", p);
        if (length == std::string::npos || length - p > 2) {
            return false;
        }
        char letter = input[length];
        bool integer = std::strchr("diouxXn", letter) != nullptr && letter != '\0';
        bool plain = std::strchr("cps%", letter) != nullptr && letter != '\0' && length == p;
        if (!integer && !plain) {
            return false;
        }
        arguments += letter == '%' ? 0 : 1;
    }
    return arguments <= kPointers;
}

/// The sum of the numbers that follow a "%" or a "." in `input`, each
/// behind the flags that may stand there: an upper bound of the characters
/// that widths and precisions ask for.
unsigned long long requestedWidths(const std::string& input) {
    unsigned long long total = 0;
    for (size_t at = input.find_first_of("%."); at != std::string::npos;
         at = input.find_first_of("%.", at + 1)) {
        size_t digits = input.find_first_not_of("-+ #0'I", at + 1);
        unsigned long long number = 0;
        while (digits < input.size() && input[digits] >= '0' && input[digits] <= '9') {
            number = std::min(number * 10 + static_cast<unsigned>(input[digits] - '0'), 1ULL << 40);
            digits++;
        }
        total = std::min(total + number, 1ULL << 40);
    }
    return total;
}

/// The numbers at the starts of the input's lines that the library does not
/// log, at most 64.
std::vector<unsigned int> foreignNumbers(const std::string& input) {
    std::vector<unsigned int> numbers;
    std::istringstream lines(input);
    std::string line;
    while (std::getline(lines, line) && numbers.size() < 64) {
        std::istringstream in(line);
        unsigned int number = 0;
        if (in >> number && number != 0 && OxMsgLibraryArguments(number) == nullptr) {
            numbers.push_back(number);
        }
    }
    return numbers;
}

void checkNoWrite(unsigned int number) {
    for (unsigned char guard : {0xEE, 0x11}) {
        alignas(16) unsigned char block[kPointers * 8];
        std::memset(block, guard, sizeof block);
        block[3] = '\0'; // %s reads three guard bytes
        unsigned char before[sizeof block];
        std::memcpy(before, block, sizeof block);
        void* p = block;
        OxMsg::LogToString(number, p, p, p, p, p, p, p, p, p, p, p, p, p, p, p, p);
        OxMsg::Log(number, p, p, p, p, p, p, p, p, p, p, p, p, p, p, p, p);
        OXFUZZ_CHECK(std::memcmp(before, block, sizeof block) == 0,
                     "message %u wrote through an argument: a %%n was not disarmed", number);
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, size_t size) {
    static const std::string path = oxfuzz::scratchFile("fuzz.msg");
    static const std::string logName = "fuzz.log";
    oxfuzz::writeFile(path, data, size);
    std::string input(reinterpret_cast<const char*>(data), size);

    OxMsg msg(path.c_str(), nullptr, logName.c_str(), oxfuzz::scratchDir().c_str());
    if (requestedWidths(input) > 10000000) {
        return 0;
    }
    OxMsg::setMessageThreshold(1);
    OxMsg::setMsgCallback(readText);
    std::string text = input.substr(0, 40);
    for (unsigned int i = 0; OxMsgLibraryNumber(i) != 0; i++) {
        unsigned int number = OxMsgLibraryNumber(i);
        const char* kinds = OxMsgLibraryArguments(number);
        withArguments([number](auto... arguments) { OxMsg::Log(number, arguments...); }, kinds,
                      text.c_str(), 4294967295U);
        withArguments([number](auto... arguments) { OxMsg::LogError(number, arguments...); }, kinds,
                      "part.xml", 7U);
        withArguments([number](auto... arguments) { OxMsg::LogForce(number, arguments...); }, kinds,
                      "", 0U);
        const char* formatted = nullptr;
        withArguments(
            [number, &formatted](auto... arguments) {
                formatted = OxMsg::LogToString(number, arguments...);
            },
            kinds, text.c_str(), 12345U);
        if (formatted != nullptr) {
            (void)std::strlen(formatted);
        }
    }
    OxMsg::Log(input.c_str());
    OxMsg::LogForce(input.c_str());
    if (onlyPointerConversions(input)) {
        for (unsigned int number : foreignNumbers(input)) {
            checkNoWrite(number);
        }
    }
    return 0;
}
