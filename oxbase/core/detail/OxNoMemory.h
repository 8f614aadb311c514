// OxNoMemory.h: how the library meets exhausted memory (the rule stands at
// the top of oxbase/OxBase.h).
//
// Memory comes from plain `new`; std::bad_alloc is the one signal. An
// operation with a described failure road runs its allocations through
// `withMemory` and takes that road when it answers false; a boundary
// operation (a reader, the start of the messages, a walk) does the same
// around its whole work and then writes the fatal line.
//
//   char * grown = nullptr;
//   if (!withMemory([&] { grown = new char[size]; })) { return failure; }
#ifndef OXBASE_CORE_DETAIL_OXNOMEMORY_H
#define OXBASE_CORE_DETAIL_OXNOMEMORY_H

#include <new>

namespace oxbase {
namespace detail {

/// Runs `work`; true when it ran through, false when it ran out of memory
/// (std::bad_alloc). Whatever `work` built before the failure is the
/// caller's to release.
template <class Work> bool withMemory(Work&& work) noexcept {
    try {
        work();
        return true;
    } catch (const std::bad_alloc&) {
        return false;
    }
}

/// Writes "FATAL: Dynamic storage allocation failure." and a line end on
/// standard error, flushed: the report of a boundary operation.
void reportNoMemory() noexcept;

} // namespace detail
} // namespace oxbase

#endif
