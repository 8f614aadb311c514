// OxCompiler.h: compiler-specific annotations, in one place.
//
//   static int sprintf(char* buffer, size_t size, const char* format, ...)
//       OX_PRINTF_FORMAT(3, 4);
#ifndef OXBASE_PLATFORM_OXCOMPILER_H
#define OXBASE_PLATFORM_OXCOMPILER_H

/// Lets the compiler check the arguments of a printf-style function: the
/// format is argument `formatIndex`, the values start at `firstIndex`
/// (counting `this` as 1 for a non-static member).
#if defined(__GNUC__)
#define OX_PRINTF_FORMAT(formatIndex, firstIndex)                                                  \
    __attribute__((format(printf, formatIndex, firstIndex)))
#else
#define OX_PRINTF_FORMAT(formatIndex, firstIndex)
#endif

/// Marks memory that the library's own pools hold but nobody may touch
/// (OX_POISON) and gives it back (OX_UNPOISON). Under AddressSanitizer a
/// read or write of poisoned memory is reported like a use after free;
/// elsewhere both do nothing.
#if defined(__has_feature)
#if __has_feature(address_sanitizer)
#define OX_ADDRESS_SANITIZER 1
#endif
#endif
#if defined(__SANITIZE_ADDRESS__)
#define OX_ADDRESS_SANITIZER 1
#endif
#if defined(OX_ADDRESS_SANITIZER)
#include <sanitizer/asan_interface.h>
#define OX_POISON(address, size) ASAN_POISON_MEMORY_REGION((address), (size))
#define OX_UNPOISON(address, size) ASAN_UNPOISON_MEMORY_REGION((address), (size))
#else
#define OX_POISON(address, size) ((void)(address), (void)(size))
#define OX_UNPOISON(address, size) ((void)(address), (void)(size))
#endif

#endif
