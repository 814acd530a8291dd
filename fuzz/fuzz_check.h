#pragma once
// What every fuzz target uses to state a property: when it fails, say which one and what the
// values were, then stop, so that libFuzzer keeps the input as a crash.
#include <cstdio>
#include <cstdlib>
#include <string_view>

#include "keltext/host/errors.h"

namespace kel::fuzz {

[[noreturn]] inline void failed(const char* what, const char* file, int line) {
    std::fprintf(stderr, "%s:%d: property failed: %s\n", file, line, what);
    std::abort();
}

// The only errors a caller of the library may see are the host's numbered run-time errors.
inline bool known_error(const RuntimeError& e) {
    switch (e.number()) {
        case kInvalidProcedureCall:
        case kOverflow:
        case kTypeMismatch:
        case kInvalidPropertyValue:
        case kInvalidPropertyIndex:
        case kNoSuchMember:
        case 383:  // a write to a member a widget only lets be read
            return true;
        default:
            return false;
    }
}

}  // namespace kel::fuzz

#define KEL_FUZZ_CHECK(cond)                                          \
    do {                                                              \
        if (!(cond)) ::kel::fuzz::failed(#cond, __FILE__, __LINE__); \
    } while (0)
