/// @file
/// Which instruction set the searches and conversions use on this processor.

#pragma once

#include "BasicTypes.h"

namespace mirel {

/// The name of the instruction set that this processor's searches and conversions use: "AVX2", "SSE4" or
/// "NEON"; "none" where they use none of these, or where the library was built without them. Results don't
/// depend on it.
MIREL_API const char* KernelName();

} // namespace mirel
