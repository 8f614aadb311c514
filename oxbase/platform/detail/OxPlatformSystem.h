// OxPlatformSystem.h: the runtime and operating-system services behind OxSystem.
//
// Each function here is the checked form of one runtime call: the `_s` or
// 64-bit call of the runtime on Windows (strcpy_s, strcat_s, strncpy_s,
// vsprintf_s, getenv_s, strerror_s, asctime_s, strtok_s, _ctime64_s,
// _gmtime64_s, _localtime64_s), the reentrant call on POSIX, with the same
// failure rule. Functions that answer an int return 0 on success and an
// errno value (EINVAL, ERANGE, ...) on failure; a failed copy leaves its
// target NUL-terminated and empty, as the checked runtime calls do.
//
// Windows: whatever would reach the runtime's invalid-parameter handler (a
// null pointer, a text that does not fit, a time before 1970 or after the
// year 3000, a year beyond 9999 for asctime_s) is refused here first with
// the runtime's result, since the handler of Microsoft's runtime ends the
// process by default. MinGW-w64 has every call: the ones msvcrt.dll lacks
// on older systems (vsprintf_s, strerror_s, asctime_s and the 64-bit time
// calls) come from its import library, which calls msvcrt.dll's own when it
// is there. getenv_s of Wine's msvcrt.dll answers EINVAL for a variable that
// is not set and ERANGE for a size query; both are read as Microsoft's
// runtime answers them (0, with the size in `*required`). The computer name
// comes from GetComputerNameW and is narrowed plainly: ASCII as it is, any
// other character as '?'.
//
//   char name[64];
//   if (OxPlatformStrcpy(name, sizeof name, text) != 0) { /* did not fit */ }
//   char * token = OxPlatformStrtok(line, " ,", &position);
#ifndef OXBASE_PLATFORM_DETAIL_OXPLATFORMSYSTEM_H
#define OXBASE_PLATFORM_DETAIL_OXPLATFORMSYSTEM_H

#include <cstdarg>
#include <cstddef>
#include <ctime>

namespace oxbase {
namespace detail {

/// Code of the running platform: 7 on Windows, 8 on Linux, 0 elsewhere.
int OxPlatformOperatingSystem();

/// The next token of `text` (or of the scan kept in `*position` for a null
/// `text`); null when no token is left. `position` must not be null, and a
/// null `text` needs a scan started before.
char* OxPlatformStrtok(char* text, const char* delimiters, char** position);

/// The fixed-form text of `time` ("Wed Nov 18 23:05:09 2026\n") into `buffer`.
/// EINVAL for a field out of range, ERANGE when the text does not fit.
int OxPlatformAsctime(char* buffer, size_t size, const tm* time);
/// The broken-down UTC time of `time` (seconds since 1970). EINVAL when it
/// cannot be represented.
int OxPlatformGmtime(tm* result, long long time);
/// The broken-down local time of `time`. EINVAL when it cannot be represented.
int OxPlatformLocaltime(tm* result, long long time);
/// The local-time text of `time`, as OxPlatformAsctime.
int OxPlatformCtime(char* buffer, size_t size, long long time);
/// The text of error `number` into `buffer`.
int OxPlatformStrerror(char* buffer, size_t size, int number);

/// Environment lookup in the manner of getenv_s: `*required` becomes the size
/// the value needs with its NUL, 0 when `name` is not set. With a null
/// `buffer` only the size is asked for; a buffer too small gives ERANGE.
int OxPlatformGetenv(size_t* required, char* buffer, size_t size, const char* name);

/// Formats into `buffer`; the number of characters written, or -1 when the
/// text does not fit or an argument is invalid (then `buffer` is empty).
int OxPlatformVsprintf(char* buffer, size_t size, const char* format, va_list arguments);
/// Copies `text` into `target` of `size` bytes.
int OxPlatformStrcpy(char* target, size_t size, const char* text);
/// Appends `text` to the NUL-terminated `target` of `size` bytes.
int OxPlatformStrcat(char* target, size_t size, const char* text);
/// Copies at most `count` characters of `text` into `target` and terminates it.
int OxPlatformStrncpy(char* target, size_t size, const char* text, size_t count);

/// The network name of this computer into `buffer`. Non-zero on failure.
int OxPlatformHostName(char* buffer, size_t size);
/// The name of the operating system (uname's system name, "Microsoft Windows"
/// on Windows) into `buffer`. Non-zero on failure.
int OxPlatformSystemName(char* buffer, size_t size);
/// Whether the file descriptor `descriptor` (0 standard input, 1 standard
/// output, 2 standard error) is a terminal (`isatty`, `_isatty` on Windows).
/// False for a file, a pipe, a closed or invalid descriptor.
bool OxPlatformIsTerminal(int descriptor);

} // namespace detail
} // namespace oxbase

#endif
