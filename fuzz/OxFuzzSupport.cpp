// The fuzz targets build with clang's libFuzzer on POSIX systems only, so
// this file may use mkdtemp directly.
#include "OxFuzzSupport.h"

#include "oxbase/diag/OxMsg.h"
#include "oxbase/diag/OxMsgNumbers.h"

#include <algorithm>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <map>
#include <memory>
#include <sstream>
#include <vector>

// Prints "SUMMARY: " and the text to the sanitizers' report file, when a
// sanitizer is linked.
extern "C" __attribute__((weak)) void __sanitizer_report_error_summary(const char* text);

namespace oxfuzz {

namespace {

std::vector<unsigned int>& logged() {
    static std::vector<unsigned int> numbers;
    return numbers;
}

/// Takes the number out of a text "[number] ...".
void recordNumber(const char* text, void* /*userData*/) {
    unsigned int number = 0;
    if (text != nullptr && std::sscanf(text, "[%u]", &number) == 1) {
        logged().push_back(number);
    }
}

/// The type letter of each number in the bundled message file.
std::map<unsigned int, char> bundledTypes() {
    std::map<unsigned int, char> types;
    std::ifstream in(OXBASE_FUZZ_MESSAGE_FILE);
    std::string line;
    while (std::getline(in, line)) {
        unsigned int number = 0;
        char type = ' ';
        if (std::sscanf(line.c_str(), "%u,%c,", &number, &type) == 2 && number != 0) {
            types.emplace(number, type);
        }
    }
    return types;
}

void removeScratch() {
    std::error_code error;
    std::filesystem::remove_all(scratchDir(), error);
}

} // namespace

void fail(const char* condition, const char* file, int line, const char* details, ...) {
    char what[4096];
    va_list arguments;
    va_start(arguments, details);
    std::vsnprintf(what, sizeof what, details, arguments);
    va_end(arguments);
    char report[8192];
    std::snprintf(report, sizeof report, "property violated: %s\n  at %s:%d\n  %s", condition, file,
                  line, what);
    // Under -close_fd_mask=2 standard error is closed, and the sanitizer's
    // report file is the way to the terminal.
    if (__sanitizer_report_error_summary != nullptr) {
        __sanitizer_report_error_summary(report);
    } else {
        std::fprintf(stderr, "\n%s\n", report);
        std::fflush(stderr);
    }
    std::abort();
}

const std::string& scratchDir() {
    static const std::string dir = [] {
        const char* base = std::getenv("TMPDIR");
        std::string pattern =
            std::string(base != nullptr && *base != '\0' ? base : "/tmp") + "/oxbase-fuzz-XXXXXX";
        std::vector<char> name(pattern.begin(), pattern.end());
        name.push_back('\0');
        if (mkdtemp(name.data()) == nullptr) {
            std::perror("mkdtemp");
            std::abort();
        }
        return std::string(name.data());
    }();
    static const bool registered = [] {
        if (tracing()) {
            std::fprintf(stderr, "scratch directory kept: %s\n", dir.c_str());
            return false;
        }
        return std::atexit(removeScratch) == 0;
    }();
    (void)registered;
    return dir;
}

bool tracing() {
    static const bool on = std::getenv("OXFUZZ_TRACE") != nullptr;
    return on;
}

std::string scratchFile(const char* name) {
    return scratchDir() + "/" + name;
}

void writeFile(const std::string& path, const std::uint8_t* data, std::size_t size) {
    std::ofstream out(path, std::ios::binary | std::ios::trunc);
    out.write(reinterpret_cast<const char*>(data), static_cast<std::streamsize>(size));
    out.close();
    OXFUZZ_CHECK(out.good(), "cannot write the scratch file %s", path.c_str());
}

void writeFile(const std::string& path, const std::string& bytes) {
    writeFile(path, reinterpret_cast<const std::uint8_t*>(bytes.data()), bytes.size());
}

std::string readFile(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    std::ostringstream bytes;
    bytes << in.rdbuf();
    return bytes.str();
}

void startMessages() {
    static std::unique_ptr<OxMsg> msg;
    if (msg != nullptr) {
        return;
    }
    std::map<unsigned int, char> types = bundledTypes();
    std::string lines;
    for (unsigned int i = 0; OxMsgLibraryNumber(i) != 0; i++) {
        unsigned int number = OxMsgLibraryNumber(i);
        auto type = types.find(number);
        OXFUZZ_CHECK(type != types.end(), "%s has no message %u", OXBASE_FUZZ_MESSAGE_FILE, number);
        lines += std::to_string(number) + "," + type->second + ",0[" + std::to_string(number) + "]";
        for (const char* kind = OxMsgLibraryArguments(number); *kind != '\0'; kind++) {
            lines += *kind == 's' ? " %s" : " %u";
        }
        lines += "\n";
    }
    std::string path = scratchFile("fuzz.msg");
    writeFile(path, lines);
    msg = std::make_unique<OxMsg>(path.c_str(), nullptr, nullptr, nullptr);
    OXFUZZ_CHECK(OxMsg::isValid(), "cannot start messages on %s", path.c_str());
    OxMsg::setMsgCallback(recordNumber);
}

const std::vector<unsigned int>& loggedNumbers() {
    return logged();
}

bool wasLogged(unsigned int number) {
    return std::find(logged().begin(), logged().end(), number) != logged().end();
}

void forgetLogged() {
    logged().clear();
    OxMsg::resetErrorCode();
}

Program::Program(const std::uint8_t* data, std::size_t size) {
    if (size == 0) {
        return;
    }
    length = data[0] < size - 1 ? data[0] : size - 1;
    steps = data + 1;
    bytes = data + 1 + length;
    this->size = size - 1 - length;
}

std::string shown(const std::string& text, std::size_t limit) {
    std::string out;
    for (std::size_t i = 0; i < text.size() && i < limit; i++) {
        auto c = static_cast<unsigned char>(text[i]);
        if (c >= 0x20 && c < 0x7f && c != '\\') {
            out += static_cast<char>(c);
        } else {
            char escaped[8];
            std::snprintf(escaped, sizeof escaped, "\\x%02x", c);
            out += escaped;
        }
    }
    if (text.size() > limit) {
        out += "...";
    }
    return out;
}

} // namespace oxfuzz
