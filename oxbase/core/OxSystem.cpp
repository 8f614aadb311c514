#include "oxbase/core/OxSystem.h"

#include "oxbase/diag/OxPrt.h"
#include "oxbase/platform/detail/OxPlatformSystem.h"

#include <algorithm>
#include <cstdarg>
#include <cstring>

using namespace oxbase::detail;

char OxSystem::asctime_buffer[49] = {};
char OxSystem::ctime_buffer[27] = {};
char OxSystem::strerror_buffer[513] = {};
tm OxSystem::gmtime_buffer = {};
tm OxSystem::localtime_buffer = {};
char* OxSystem::strtok_position = nullptr;

char* OxSystem::OxStrtok(char* text, const char* delimiters) {
    if (delimiters == nullptr) {
        return nullptr;
    }
    if (text == nullptr && strtok_position == nullptr) {
        return nullptr; // nothing to go on with: no scan was ever started
    }
    return OxPlatformStrtok(text, delimiters, &strtok_position);
}

char* OxSystem::asctime(const tm* time) {
    if (time == nullptr || OxPlatformAsctime(asctime_buffer, sizeof asctime_buffer, time) != 0) {
        return nullptr;
    }
    return asctime_buffer;
}

char* OxSystem::ctime(const long long* time) {
    if (time == nullptr || OxPlatformCtime(ctime_buffer, sizeof ctime_buffer, *time) != 0) {
        return nullptr;
    }
    return ctime_buffer;
}

tm* OxSystem::gmtime(const long long* time) {
    if (time == nullptr || OxPlatformGmtime(&gmtime_buffer, *time) != 0) {
        return nullptr;
    }
    return &gmtime_buffer;
}

tm* OxSystem::localtime(const long long* time) {
    if (time == nullptr || OxPlatformLocaltime(&localtime_buffer, *time) != 0) {
        return nullptr;
    }
    return &localtime_buffer;
}

char* OxSystem::strerror(int number) {
    if (OxPlatformStrerror(strerror_buffer, sizeof strerror_buffer, number) != 0) {
        return nullptr;
    }
    return strerror_buffer;
}

char* OxSystem::getenv(const char* name) {
    if (name == nullptr) {
        return nullptr;
    }
    size_t required = 0;
    if (OxPlatformGetenv(&required, nullptr, 0, name) != 0 || required == 0) {
        return nullptr;
    }
    char* value = new char[required + 1];
    if (OxPlatformGetenv(&required, value, required + 1, name) != 0) {
        delete[] value; // the variable changed in between and no longer fits
        return nullptr;
    }
    return value;
}

OxBool OxSystem::isEnvVarSet(const char* name) {
    if (name == nullptr) {
        return OxFalse;
    }
    size_t required = 0;
    if (OxPlatformGetenv(&required, nullptr, 0, name) != 0) {
        return OxFalse;
    }
    return OxToBool(required != 0);
}

int OxSystem::sprintf(char* buffer, size_t size, const char* format, ...) {
    if (buffer == nullptr || format == nullptr || size == 0) {
        return 0;
    }
    va_list arguments;
    va_start(arguments, format);
    int result = OxPlatformVsprintf(buffer, size, format, arguments);
    va_end(arguments);
    return result;
}

char* OxSystem::strcat(char* target, size_t size, const char* text) {
    if (target == nullptr || text == nullptr || OxPlatformStrcat(target, size, text) != 0) {
        return nullptr;
    }
    return target;
}

char* OxSystem::strcpy(char* target, size_t size, const char* text) {
    if (target == nullptr || text == nullptr || OxPlatformStrcpy(target, size, text) != 0) {
        return nullptr;
    }
    return target;
}

char* OxSystem::strncpy(char* target, size_t size, const char* text, size_t count) {
    if (target == nullptr || text == nullptr) {
        return nullptr;
    }
    // Clearing and terminating stay inside the target's `size` bytes, even for
    // a `count` beyond it.
    std::memset(target, 0, std::min(count, size));
    if (OxPlatformStrncpy(target, size, text, count) != 0) {
        return nullptr;
    }
    target[std::min(count, size - 1)] = '\0';
    return target;
}

OxBool OxSystem::isTerminal(int descriptor) {
    return OxToBool(OxPlatformIsTerminal(descriptor));
}

OxSystem::OxOperatingSystem OxSystem::getOS() {
    switch (OxPlatformOperatingSystem()) {
    case OxOSWindows:
        return OxOSWindows;
    case OxOSLinux:
        return OxOSLinux;
    default:
        return OxOSUnknown;
    }
}

char* OxSystem::getOSName() {
    char host[256];
    char system[256];
    if (OxPlatformHostName(host, sizeof host) != 0 || host[0] == '\0') {
        return nullptr;
    }
    if (OxPlatformSystemName(system, sizeof system) != 0) {
        return nullptr;
    }
    OxPrt prt;
    *prt.getStr() << host << " " << system << " ";
    return prt.flushToString();
}
