/// @file
/// The scalar types that every other header uses, and the macros for exported names and debug information.

#pragma once

#include <cstdint>

/// Exports a class or function from the shared library; everything else stays hidden.
#define MIREL_API __attribute__((visibility("default")))

/// Makes a program describe a class in its own debug information. Otherwise clang leaves out a class whose
/// code is in the library, and a debugger can't show it unless the library has debug information.
#if __has_cpp_attribute(clang::standalone_debug)
#define MIREL_DESCRIBED [[clang::standalone_debug]]
#else
#define MIREL_DESCRIBED
#endif

/// Everything in the library except the macros.
namespace mirel {

/// A signed size, count or index, in the unit that each use names: elements, bytes or code units.
typedef intptr_t ssize_t;

typedef uint8_t uint8;   ///< A byte.
typedef uint16_t uint16; ///< The storage of a UTF-16 code unit.
typedef int64_t int64;   ///< The offsets and counts of streams.

} // namespace mirel
