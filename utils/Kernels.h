/// @file
/// Which instruction set the searches and conversions use on this processor.

#pragma once

#include "BasicTypes.h"

namespace mirel {

/// Returns the name of the instruction set that searches and conversions use on this processor: "AVX2",
/// "SSE4" or "NEON", or "none" if the library has no SIMD code for the processor or was built without it. No
/// result depends on it.
MIREL_API const char* KernelName();

} // namespace mirel
