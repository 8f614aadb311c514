#include "oxbase/platform/detail/OxPlatformSystem.h"

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <limits>

#ifdef _WIN32
#include <io.h>
#include <windows.h>
#else
#include <string.h>
#include <sys/utsname.h>
#include <time.h>
#include <unistd.h>
#endif

namespace oxbase {
namespace detail {

int OxPlatformOperatingSystem() {
#if defined(_WIN32)
    return 7;
#elif defined(__linux__)
    return 8;
#else
    return 0;
#endif
}

// ---------------------------------------------------------------------------
// Checked copies: the failure rule of strcpy_s and its kin, on every platform.
// Every argument that the Windows runtime would hand to its invalid-parameter
// handler (a null pointer, a text that does not fit) is refused here first,
// with the result the runtime gives, because the Microsoft runtime's default
// handler ends the process. What passes is copied by the runtime's `_s` call
// on Windows and by memmove elsewhere.

namespace {
// The length of `text`, looking at no more than `limit` bytes.
size_t boundedLength(const char* text, size_t limit) {
    size_t length = 0;
    while (length < limit && text[length] != '\0') {
        length++;
    }
    return length;
}
} // namespace

int OxPlatformStrcpy(char* target, size_t size, const char* text) {
    if (target == nullptr || size == 0) {
        return EINVAL;
    }
    if (text == nullptr) {
        target[0] = '\0';
        return EINVAL;
    }
    size_t length = std::strlen(text);
    if (length >= size) {
        target[0] = '\0';
        return ERANGE;
    }
#ifdef _WIN32
    return strcpy_s(target, size, text);
#else
    std::memmove(target, text, length + 1);
    return 0;
#endif
}

int OxPlatformStrcat(char* target, size_t size, const char* text) {
    if (target == nullptr || size == 0) {
        return EINVAL;
    }
    if (text == nullptr) {
        target[0] = '\0';
        return EINVAL;
    }
    size_t used = boundedLength(target, size);
    if (used == size) { // the target is not terminated within its size
        target[0] = '\0';
        return EINVAL;
    }
    size_t length = std::strlen(text);
    if (length >= size - used) {
        target[0] = '\0';
        return ERANGE;
    }
#ifdef _WIN32
    return strcat_s(target, size, text);
#else
    std::memmove(target + used, text, length + 1);
    return 0;
#endif
}

int OxPlatformStrncpy(char* target, size_t size, const char* text, size_t count) {
    if (target == nullptr || size == 0) {
        return EINVAL;
    }
    if (text == nullptr) {
        target[0] = '\0';
        return EINVAL;
    }
    size_t length = boundedLength(text, count);
    if (length >= size) {
        target[0] = '\0';
        return ERANGE;
    }
#ifdef _WIN32
    return strncpy_s(target, size, text, length);
#else
    std::memmove(target, text, length);
    target[length] = '\0';
    return 0;
#endif
}

// A text that does not fit is a failure, as in vsprintf_s. On Windows the
// runtime's _vscprintf measures the text first (on a copy of the arguments,
// in the runtime's own dialect of printf), so that vsprintf_s only ever gets
// a text that fits; elsewhere C99's vsnprintf does both at once.
int OxPlatformVsprintf(char* buffer, size_t size, const char* format, va_list arguments) {
    if (buffer == nullptr || size == 0) {
        return -1;
    }
    if (format == nullptr) {
        buffer[0] = '\0';
        return -1;
    }
#ifdef _WIN32
    va_list measure;
    va_copy(measure, arguments);
    int needed = _vscprintf(format, measure);
    va_end(measure);
    if (needed < 0 || static_cast<size_t>(needed) >= size) {
        buffer[0] = '\0';
        return -1;
    }
    int written = vsprintf_s(buffer, size, format, arguments);
#else
    int written = std::vsnprintf(buffer, size, format, arguments);
#endif
    if (written < 0 || static_cast<size_t>(written) >= size) {
        buffer[0] = '\0';
        return -1;
    }
    return written;
}

// ---------------------------------------------------------------------------
// Tokens, time and error texts

char* OxPlatformStrtok(char* text, const char* delimiters, char** position) {
#ifdef _WIN32
    return strtok_s(text, delimiters, position);
#else
    return strtok_r(text, delimiters, position);
#endif
}

namespace {
const char* const kDays[7] = {"Sun", "Mon", "Tue", "Wed", "Thu", "Fri", "Sat"};
const char* const kMonths[12] = {"Jan", "Feb", "Mar", "Apr", "May", "Jun",
                                 "Jul", "Aug", "Sep", "Oct", "Nov", "Dec"};

bool inRange(int value, int low, int high) {
    return value >= low && value <= high;
}

#ifdef _WIN32
// The room that asctime_s and ctime_s want: 24 characters, "\n" and NUL.
constexpr size_t kAsctimeSize = 26;

// The times that the runtime's 64-bit time calls take: from 1970-01-01
// 00:00:00 to 3000-12-31 23:59:59 UTC (_MAX__TIME64_T); a time outside would
// reach the invalid-parameter handler.
bool inTime64Range(long long time) {
    return time >= 0 && time <= 32535215999LL;
}
#else
// The time_t of a 64-bit count of seconds, when it has one.
bool toTimeT(long long time, time_t* result) {
    if (static_cast<long double>(time) >
            static_cast<long double>(std::numeric_limits<time_t>::max()) ||
        static_cast<long double>(time) <
            static_cast<long double>(std::numeric_limits<time_t>::min())) {
        return false;
    }
    *result = static_cast<time_t>(time);
    return true;
}

// strerror_r comes in two forms: the XSI one answers an error number, the GNU
// one a text that need not be in the buffer. Overloading takes either.
[[maybe_unused]] int strerrorResult(int result, char*, size_t) {
    return result;
}

[[maybe_unused]] int strerrorResult(char* result, char* buffer, size_t size) {
    if (result == nullptr) {
        buffer[0] = '\0';
        return EINVAL;
    }
    if (result != buffer) {
        std::strncpy(buffer, result, size - 1);
        buffer[size - 1] = '\0';
    }
    return 0;
}
#endif
} // namespace

int OxPlatformAsctime(char* buffer, size_t size, const tm* time) {
    if (buffer == nullptr || size == 0) {
        return EINVAL;
    }
    buffer[0] = '\0';
    if (time == nullptr || !inRange(time->tm_mon, 0, 11) || !inRange(time->tm_wday, 0, 6) ||
        !inRange(time->tm_mday, 1, 31) || !inRange(time->tm_hour, 0, 23) ||
        !inRange(time->tm_min, 0, 59) || !inRange(time->tm_sec, 0, 60)) {
        return EINVAL;
    }
#ifdef _WIN32
    // asctime_s takes the years 1900 to 9999 and no leap second; anything
    // else would reach the runtime's invalid-parameter handler.
    if (!inRange(time->tm_year, 0, 8099) || time->tm_sec > 59) {
        return EINVAL;
    }
    if (size < kAsctimeSize) {
        return ERANGE;
    }
    return asctime_s(buffer, size, time);
#else
    long long year = static_cast<long long>(time->tm_year) + 1900;
    int written = std::snprintf(buffer, size, "%.3s %.3s%3d %.2d:%.2d:%.2d %lld\n",
                                kDays[time->tm_wday], kMonths[time->tm_mon], time->tm_mday,
                                time->tm_hour, time->tm_min, time->tm_sec, year);
    if (written < 0 || static_cast<size_t>(written) >= size) {
        buffer[0] = '\0';
        return ERANGE;
    }
    return 0;
#endif
}

int OxPlatformGmtime(tm* result, long long time) {
    if (result == nullptr) {
        return EINVAL;
    }
#ifdef _WIN32
    if (!inTime64Range(time)) {
        return EINVAL;
    }
    __time64_t value = time;
    return _gmtime64_s(result, &value);
#else
    time_t value;
    if (!toTimeT(time, &value) || gmtime_r(&value, result) == nullptr) {
        return EINVAL;
    }
    return 0;
#endif
}

int OxPlatformLocaltime(tm* result, long long time) {
    if (result == nullptr) {
        return EINVAL;
    }
#ifdef _WIN32
    if (!inTime64Range(time)) {
        return EINVAL;
    }
    __time64_t value = time;
    return _localtime64_s(result, &value);
#else
    time_t value;
    if (!toTimeT(time, &value) || localtime_r(&value, result) == nullptr) {
        return EINVAL;
    }
    return 0;
#endif
}

int OxPlatformCtime(char* buffer, size_t size, long long time) {
    if (buffer == nullptr || size == 0) {
        return EINVAL;
    }
#ifdef _WIN32
    buffer[0] = '\0';
    if (!inTime64Range(time)) {
        return EINVAL;
    }
    if (size < kAsctimeSize) {
        return ERANGE;
    }
    __time64_t value = time;
    return _ctime64_s(buffer, size, &value);
#else
    tm local;
    int result = OxPlatformLocaltime(&local, time);
    if (result != 0) {
        buffer[0] = '\0';
        return result;
    }
    return OxPlatformAsctime(buffer, size, &local);
#endif
}

int OxPlatformStrerror(char* buffer, size_t size, int number) {
    if (buffer == nullptr || size == 0) {
        return EINVAL;
    }
#ifdef _WIN32
    return strerror_s(buffer, size, number);
#else
    buffer[0] = '\0';
    return strerrorResult(strerror_r(number, buffer, size), buffer, size);
#endif
}

int OxPlatformGetenv(size_t* required, char* buffer, size_t size, const char* name) {
    if (required == nullptr || name == nullptr || (buffer == nullptr && size != 0)) {
        return EINVAL;
    }
#ifdef _WIN32
    // getenv_s of Microsoft's runtime answers 0 with a required size of 0 for
    // a variable that is not set, and 0 with the size for a query without a
    // buffer. Other builds of msvcrt.dll (Wine's) answer EINVAL and ERANGE
    // there: with the size taken from *required both come out the same.
    int result = getenv_s(required, buffer, size, name);
    if (*required == 0) {
        return 0; // not set
    }
    if (buffer == nullptr && result == ERANGE) {
        return 0; // the size alone was asked for
    }
    return result;
#else
    *required = 0;
    if (buffer != nullptr) {
        buffer[0] = '\0';
    }
    const char* value = std::getenv(name);
    if (value == nullptr) {
        return 0;
    }
    size_t length = std::strlen(value);
    *required = length + 1;
    if (buffer == nullptr) {
        return 0;
    }
    if (length >= size) {
        return ERANGE;
    }
    std::memcpy(buffer, value, length + 1);
    return 0;
#endif
}

// ---------------------------------------------------------------------------
// Names of the computer and the system

int OxPlatformHostName(char* buffer, size_t size) {
    if (buffer == nullptr || size == 0) {
        return EINVAL;
    }
    buffer[0] = '\0';
#ifdef _WIN32
    wchar_t wide[16];
    DWORD length = 16;
    if (!GetComputerNameW(wide, &length) || length == 0) {
        return EINVAL;
    }
    // Computer names are plain ASCII in practice; anything else becomes '?'.
    size_t i = 0;
    for (; i < length && i + 1 < size; i++) {
        buffer[i] = wide[i] < 0x80 ? static_cast<char>(wide[i]) : '?';
    }
    buffer[i] = '\0';
    return 0;
#else
    if (gethostname(buffer, size) != 0) {
        buffer[0] = '\0';
        return errno != 0 ? errno : EINVAL;
    }
    buffer[size - 1] = '\0'; // a truncated name need not be terminated
    return buffer[0] == '\0' ? EINVAL : 0;
#endif
}

int OxPlatformSystemName(char* buffer, size_t size) {
    if (buffer == nullptr || size == 0) {
        return EINVAL;
    }
#ifdef _WIN32
    return OxPlatformStrcpy(buffer, size, "Microsoft Windows");
#else
    struct utsname names;
    if (uname(&names) != 0) {
        buffer[0] = '\0';
        return EINVAL;
    }
    return OxPlatformStrcpy(buffer, size, names.sysname);
#endif
}

bool OxPlatformIsTerminal(int descriptor) {
#ifdef _WIN32
    return _isatty(descriptor) != 0;
#else
    return isatty(descriptor) != 0;
#endif
}

} // namespace detail
} // namespace oxbase
