// OxStrstream.h: the one place that includes <strstream>.
//
// The print objects of OxBase hand text around in std::ostrstream, whose
// str()/freeze()/pcount() give direct access to the buffer without a copy.
// The header is deprecated in C++ and its compilers warn about that at the
// include; the warning is silenced here and nowhere else.
//
//   std::ostrstream * s = prt.getStr();
//   *s << "value " << 42 << "\n";
//   prt.flushPrt();
#ifndef OXBASE_PLATFORM_OXSTRSTREAM_H
#define OXBASE_PLATFORM_OXSTRSTREAM_H

#if defined(__clang__)
#pragma clang diagnostic push
#pragma clang diagnostic ignored "-W#warnings"
#pragma clang diagnostic ignored "-Wdeprecated"
#include <strstream>
#pragma clang diagnostic pop
#elif defined(__GNUC__)
// libstdc++ warns from backward_warning.h only while __DEPRECATED is defined.
#pragma push_macro("__DEPRECATED")
#undef __DEPRECATED
#include <strstream>
#pragma pop_macro("__DEPRECATED")
#elif defined(_MSC_VER)
#pragma warning(push)
#pragma warning(disable : 4996)
#include <strstream>
#pragma warning(pop)
#else
#include <strstream>
#endif

#endif
