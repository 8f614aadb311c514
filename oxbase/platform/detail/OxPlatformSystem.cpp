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
// They are written out rather than calling the Windows runtime's `_s` forms,
// whose default handler of an invalid parameter ends the process.

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
    std::memmove(target, text, length + 1);
    return 0;
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
    std::memmove(target + used, text, length + 1);
    return 0;
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
    std::memmove(target, text, length);
    target[length] = '\0';
    return 0;
}

// vsnprintf is the C99 form on both platforms; a truncated text counts as a failure.
int OxPlatformVsprintf(char* buffer, size_t size, const char* format, va_list arguments) {
    if (buffer == nullptr || size == 0) {
        return -1;
    }
    if (format == nullptr) {
        buffer[0] = '\0';
        return -1;
    }
    int written = std::vsnprintf(buffer, size, format, arguments);
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

#ifndef _WIN32
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
    long long year = static_cast<long long>(time->tm_year) + 1900;
    int written = std::snprintf(buffer, size, "%.3s %.3s%3d %.2d:%.2d:%.2d %lld\n",
                                kDays[time->tm_wday], kMonths[time->tm_mon], time->tm_mday,
                                time->tm_hour, time->tm_min, time->tm_sec, year);
    if (written < 0 || static_cast<size_t>(written) >= size) {
        buffer[0] = '\0';
        return ERANGE;
    }
    return 0;
}

int OxPlatformGmtime(tm* result, long long time) {
    if (result == nullptr) {
        return EINVAL;
    }
#ifdef _WIN32
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
    return getenv_s(required, buffer, size, name);
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
