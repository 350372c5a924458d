// The choice of the kernels at run time. Highway's foreach_target.h compiles this file, and the kernels that
// it includes, once for each instruction set, each time into a namespace of its own: N_AVX2 for example.

#include "KernelTable.h"

#include <utils/Kernels.h>
#include <utils/RangeAlgorithms.h>

// The kernels assume little-endian byte order.
#if defined(MIREL_KERNELS) && __BYTE_ORDER__ == __ORDER_LITTLE_ENDIAN__

// The kernels use neither AES nor conversions of floating-point numbers, so no processor has to have them.
// The targets disabled here aren't worth their code: none was found to be a third faster than the best of
// those that are left.
#define HWY_DISABLE_PCLMUL_AES
#define HWY_DISABLE_F16C
#define HWY_DISABLED_TARGETS                                                                                 \
  (HWY_SSSE3 | HWY_AVX3 | HWY_AVX3_DL | HWY_SVE | HWY_SVE2 | HWY_SVE_256 | HWY_SVE2_128)
#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "utils/src/Kernels.cpp"
#include <hwy/foreach_target.h>
#include <hwy/highway.h>

#if HWY_TARGET == HWY_AVX2 || HWY_TARGET == HWY_SSE4 || (HWY_TARGET == HWY_NEON && HWY_ARCH_ARM_A64)

#include "SearchKernels-inl.h"
#include "Utf16Kernels-inl.h"
#include "Utf8Kernels-inl.h"
#include "ValidationKernels-inl.h"
#undef MIREL_CONVERSION_BLOCKS
#undef MIREL_UTF16_KERNELS
#undef MIREL_UTF8_KERNELS

namespace mirel::detail::HWY_NAMESPACE {
namespace {

constexpr Kernels kKernels = {
    {Utf16FromUtf8, ReplaceByBlocks<WideUtf8Block>, SkipUtf8, MeasureUtf8, kSearchKernels<char8>},
    {Utf8FromUtf16, ReplaceByBlocks<Utf16Block<Wide>>, SkipUtf16, MeasureUtf16, kSearchKernels<char16>},
    &HWY_STR(HWY_NAMESPACE)[2], // without "N_"
    Utf16FromAscii,
};

} // namespace
} // namespace mirel::detail::HWY_NAMESPACE

#endif

#else
#define HWY_ONCE 1
#define HWY_TARGETS 0
#endif

#if HWY_ONCE

// As 0 or 1, so that & combines the answers without branches.
#define HAS(feature) static_cast<unsigned>(__builtin_cpu_supports(feature) != 0)

namespace mirel {

const detail::Kernels* detail::KernelsAt([[maybe_unused]] int k) {
#if HWY_TARGETS & HWY_NEON && HWY_ARCH_ARM_A64
  if (k-- == 0)
    return &N_NEON::kKernels;
#endif
#if HWY_TARGETS & HWY_AVX2 // in 64-bit programs: Highway doesn't compile it for 32 bits
  if (HAS("avx2") & HAS("bmi") & HAS("bmi2") & HAS("fma") & HAS("popcnt") && k-- == 0)
    return &N_AVX2::kKernels;
#endif
#if HWY_TARGETS & HWY_SSE4
  if (HAS("sse4.2") & HAS("popcnt") && k-- == 0)
    return &N_SSE4::kKernels;
#endif
  return nullptr;
}

const char* KernelName() {
  const detail::Kernels* const kernels = detail::BestKernels();
  return kernels != nullptr ? kernels->name : "none";
}

template <class T> static const detail::SearchKernels<T>& Searches() {
  const detail::UnitKernels<T>* const kernels = detail::BestKernels();
  return kernels != nullptr ? kernels->searches : detail::ScalarSearches<T>();
}
const detail::SearchKernels<char8>& detail::BestSearches(const char8*) { return Searches<char8>(); }
const detail::SearchKernels<char16>& detail::BestSearches(const char16*) { return Searches<char16>(); }

} // namespace mirel

#endif
