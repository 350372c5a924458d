/// @file
/// Which instruction set the searches and conversions use on this processor.

#pragma once

#include "BasicTypes.h"

namespace mirel {

/// Returns the name of the instruction set that searches and conversions use on this processor: "AVX2",
/// "SSE4" or "NEON", or "none" where the processor has none of these or the library was built without
/// kernels. No result depends on it.
MIREL_API const char* KernelName();

} // namespace mirel
