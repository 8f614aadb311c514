// OxKeepErrno.h: errno kept across a block that may change it.
//
// A report on standard error, a close or a free between a failing call and
// the caller that reads errno must not change what the caller reads.
//
//   {
//       OxKeepErrno keep;            // errno as the failed call left it
//       std::cerr << "opendir failed\n";
//   }                                // ... and so again here
#ifndef OXBASE_CORE_DETAIL_OXKEEPERRNO_H
#define OXBASE_CORE_DETAIL_OXKEEPERRNO_H

#include <cerrno>

namespace oxbase {
namespace detail {

class OxKeepErrno {
public:
    OxKeepErrno() : saved(errno) {}
    ~OxKeepErrno() { errno = saved; }
    OxKeepErrno(const OxKeepErrno&) = delete;
    OxKeepErrno& operator=(const OxKeepErrno&) = delete;

    /// The errno value kept.
    int value() const { return saved; }

private:
    int saved;
};

} // namespace detail
} // namespace oxbase

#endif
