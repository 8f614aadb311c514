// OxExport.h: the mark of the exported interface.
//
// OXBASE_API stands on every public class and free function of OxBase (a
// class's mark covers its members, static data included). In the Windows
// DLL it is __declspec(dllexport) while the library is built and
// __declspec(dllimport) for its callers; in an ELF shared library, which is
// built with -fvisibility=hidden, it gives default visibility. Whatever does
// not carry it (the helpers of namespace oxbase::detail) stays inside the
// library on both platforms.
//
//   class OXBASE_API OxVec3d { ... };
//   OXBASE_API OxVec3d operator+(const OxVec3d& a, const OxVec3d& b);
//
// The build defines OXBASE_BUILDING for the shared library itself and
// OXBASE_STATIC (for the library and every caller) when the library is built
// static; a caller of the shared library defines neither.
#ifndef OXBASE_PLATFORM_OXEXPORT_H
#define OXBASE_PLATFORM_OXEXPORT_H

#if defined(OXBASE_STATIC)
#define OXBASE_API
#elif defined(_WIN32) || defined(__CYGWIN__)
#if defined(OXBASE_BUILDING)
#define OXBASE_API __declspec(dllexport)
#else
#define OXBASE_API __declspec(dllimport)
#endif
#elif defined(__GNUC__)
#define OXBASE_API __attribute__((visibility("default")))
#else
#define OXBASE_API
#endif

#endif
