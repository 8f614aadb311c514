// OxFuzzSupport.h: what the libFuzzer targets share.
//
// A target checks properties, not only the absence of a crash: a property
// that does not hold stops the run through OXFUZZ_CHECK, which prints the
// condition and what differed, then aborts, so that libFuzzer keeps the input
// as a crash reproducer. Files go to one scratch directory per process
// (made by mkdtemp under $TMPDIR or /tmp, removed at a normal exit), never to
// the working directory. The message subsystem is started on a message file
// made here: every number the library logs, with the type letter of the
// bundled data/oxbase.msg and a text "[number]" followed by one conversion
// for each argument the library passes, so that a target can tell which
// numbers were logged.
//
//   oxfuzz::startMessages();
//   std::string path = oxfuzz::scratchFile("in.xml");
//   OXFUZZ_CHECK(first == second, "second write: %zu bytes", second.size());
#ifndef OXBASE_FUZZ_OXFUZZSUPPORT_H
#define OXBASE_FUZZ_OXFUZZSUPPORT_H

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

namespace oxfuzz {

/// Prints "property violated", the condition, its place and the printf
/// `details` to standard error (past -close_fd_mask: libFuzzer's own copy
/// of it), then aborts.
[[noreturn]] void fail(const char* condition, const char* file, int line, const char* details, ...);

/// The scratch directory of this process, made at the first call.
const std::string& scratchDir();
/// Whether OXFUZZ_TRACE is set in the environment: then the targets print
/// their steps, and the scratch directory is kept (its path printed) for a
/// look at the files of a reproducer.
bool tracing();

/// `scratchDir()` + "/" + `name`.
std::string scratchFile(const char* name);

/// Replaces the file at `path` by `size` bytes of `data`.
void writeFile(const std::string& path, const std::uint8_t* data, std::size_t size);
void writeFile(const std::string& path, const std::string& bytes);
/// The whole file as bytes; empty when it cannot be read.
std::string readFile(const std::string& path);

/// Starts the message subsystem once per process on the message file above,
/// with no log file (texts go to standard error, which -close_fd_mask=2
/// silences), and records the number of every message logged.
void startMessages();
/// The numbers logged since the last call of forgetLogged, in order.
const std::vector<unsigned int>& loggedNumbers();
/// Whether `number` was logged since the last call of forgetLogged.
bool wasLogged(unsigned int number);
/// Forgets the numbers logged so far and resets the error code.
void forgetLogged();

/// An input split into a program of steps and the bytes it works on: the
/// first byte is the number of steps (at most what follows), the steps come
/// next, the rest are the bytes. A step may take the step behind it as its
/// operand (0 behind the last step).
struct Program {
    Program(const std::uint8_t* data, std::size_t size);

    const std::uint8_t* steps = nullptr;
    std::size_t length = 0;
    const std::uint8_t* bytes = nullptr;
    std::size_t size = 0;

    std::uint8_t operand(std::size_t step) const { return step + 1 < length ? steps[step + 1] : 0; }
};

/// The value of type T whose bytes stand at `bytes` most significant first,
/// decoded here by shifts (independently of the library's byte order code).
template <class T> T bigEndian(const std::uint8_t* bytes) {
    std::uint64_t bits = 0;
    for (std::size_t i = 0; i < sizeof(T); i++) {
        bits = (bits << 8) | bytes[i];
    }
    T value;
    if constexpr (sizeof(T) == 8) {
        std::memcpy(&value, &bits, 8);
    } else if constexpr (sizeof(T) == 4) {
        auto narrow = static_cast<std::uint32_t>(bits);
        std::memcpy(&value, &narrow, 4);
    } else if constexpr (sizeof(T) == 2) {
        auto narrow = static_cast<std::uint16_t>(bits);
        std::memcpy(&value, &narrow, 2);
    } else {
        auto narrow = static_cast<std::uint8_t>(bits);
        std::memcpy(&value, &narrow, 1);
    }
    return value;
}

/// Whether two values have the same bytes (NaN payloads included).
template <class T> bool sameBits(const T& a, const T& b) {
    return std::memcmp(&a, &b, sizeof(T)) == 0;
}

/// Escapes a text for a report: printable ASCII as it is, the rest as \xNN,
/// cut at `limit` bytes.
std::string shown(const std::string& text, std::size_t limit = 200);

} // namespace oxfuzz

#define OXFUZZ_CHECK(condition, ...)                                                               \
    do {                                                                                           \
        if (!(condition)) {                                                                        \
            ::oxfuzz::fail(#condition, __FILE__, __LINE__, __VA_ARGS__);                           \
        }                                                                                          \
    } while (false)

#endif
