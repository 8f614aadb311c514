// OxSanitizer.h: what the library's own pools tell AddressSanitizer.
//
//   OX_POISON(block, size);     // freed: a touch is reported as a use after free
//   OX_UNPOISON(block, size);   // handed out again
#ifndef OXBASE_PLATFORM_DETAIL_OXSANITIZER_H
#define OXBASE_PLATFORM_DETAIL_OXSANITIZER_H

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
