/// @file
/// Scalar types of fixed width that every other header uses, and the marks of what the library exports and of
/// what a debugger knows.

#pragma once

#include <cstdint>

/// Marks a class or function that a program may use from the shared library; everything else stays hidden.
#define MIREL_API __attribute__((visibility("default")))

/// Marks a class that a program describes in its own debug information. Clang leaves out a class whose code
/// is in the library, and a debugger then has nothing to show where the library has no debug information.
#if __has_cpp_attribute(clang::standalone_debug)
#define MIREL_DESCRIBED [[clang::standalone_debug]]
#else
#define MIREL_DESCRIBED
#endif

/// All that the library offers, but for the macros.
namespace mirel {

/// Signed size, count or index. What it counts (elements, bytes, code units) is said where it is used.
typedef intptr_t ssize_t;

typedef uint8_t uint8;   ///< A byte.
typedef uint16_t uint16; ///< The storage of a UTF-16 code unit.
typedef int64_t int64;   ///< What streams count in.

} // namespace mirel
