// OxCompiler.h: compiler-specific annotations of the public interface.
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

#endif
