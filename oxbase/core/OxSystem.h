// OxSystem.h: checked wrappers over the runtime library.
//
// Every member is static. Each wrapper uses the checked form of its runtime
// call, tolerates null arguments and answers null (or 0) on any failure. Time
// and error texts live in static buffers of the class, one per wrapper: the
// result of one wrapper survives a call of another, and the next call of the
// same wrapper overwrites it. Nothing here is safe for two threads at once.
//
//   char path[256];
//   if (OxSystem::strcpy(path, sizeof path, dir) == nullptr) { /* too long */ }
//   char * home = OxSystem::getenv("HOME"); ... delete[] home;
#ifndef OXBASE_CORE_OXSYSTEM_H
#define OXBASE_CORE_OXSYSTEM_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/core/OxTypes.h"
#include "oxbase/platform/OxCompiler.h"

#include <cstddef>
#include <ctime>

class OXBASE_API OxSystem {
public:
    /// The platform a process runs on, as getOS reports it.
    enum OxOperatingSystem : std::int32_t { OxOSUnknown = 0, OxOSWindows = 7, OxOSLinux = 8 };

    /// The next token of `text`, or of the scan going on when `text` is null.
    /// Null for null `delimiters` (the scan is left as it was) and when no
    /// token is left. The token lies in the caller's text, which the scan changes.
    static char* OxStrtok(char* text, const char* delimiters);

    /// The fixed-form text of `time` ("Wed Nov 18 23:05:09 2026\n") in the
    /// static buffer of asctime; null for a null or invalid time.
    static char* asctime(const tm* time);
    /// The local-time text of the 64-bit `time`, in the static buffer of ctime.
    static char* ctime(const long long* time);
    /// The broken-down UTC time of `time`, in the static structure of gmtime.
    static tm* gmtime(const long long* time);
    /// The broken-down local time of `time`, in the static structure of localtime.
    static tm* localtime(const long long* time);
    /// The text of error `number`, in the static buffer of strerror.
    static char* strerror(int number);

    /// The value of variable `name` as a new array (release with delete[]);
    /// null when `name` is null or the variable is not set.
    static char* getenv(const char* name);
    /// OxTrue when variable `name` is set.
    static OxBool isEnvVarSet(const char* name);

    /// printf into `buffer` of `size` bytes: the number of characters written,
    /// 0 for a null `buffer` or `format` or a `size` of 0 (`buffer` untouched),
    /// -1 when the text does not fit (then `buffer` is empty).
    static int sprintf(char* buffer, size_t size, const char* format, ...) OX_PRINTF_FORMAT(3, 4);
    /// Appends `text` to `target` of `size` bytes; `target`, or null when an
    /// argument is null (target untouched) or the result does not fit (target empty).
    static char* strcat(char* target, size_t size, const char* text);
    /// Copies `text` to `target` of `size` bytes, with the failures of strcat.
    static char* strcpy(char* target, size_t size, const char* text);
    /// Copies at most `count` characters of `text` to `target` of `size`
    /// bytes after clearing its first `count` bytes (at most `size`), and
    /// terminates it; the failures of strcat.
    static char* strncpy(char* target, size_t size, const char* text, size_t count);

    /// OxOSLinux on Linux, OxOSWindows on Windows.
    static OxOperatingSystem getOS();
    /// A new array: the computer's name, a blank, the system's name and a
    /// trailing blank ("build01 Linux "); null when the name is not available.
    static char* getOSName();
    /// Whether the file descriptor `descriptor` (0 standard input, 1 standard
    /// output, 2 standard error) is a terminal: OxFalse for a file, a pipe,
    /// a closed or an invalid descriptor.
    static OxBool isTerminal(int descriptor);

private:
    static char asctime_buffer[49];
    static char ctime_buffer[27];
    static char strerror_buffer[513];
    static tm gmtime_buffer;
    static tm localtime_buffer;
    static char* strtok_position;
};

#endif
