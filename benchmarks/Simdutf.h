// The two sets of simdutf's kernels that take part.

#pragma once

#ifdef HAVE_SIMDUTF
#include <string>
#include <utility>
#include <vector>

#include <simdutf.h>
#include <utils/Kernels.h>

using SimdutfContender = std::pair<std::string, const simdutf::implementation*>;

/// Returns simdutf's kernels for the instructions that ours use, if it has such, and its best ones for this
/// processor.
inline const std::vector<SimdutfContender>& Simdutf() {
  static const auto kContenders = [] {
    const std::string ours = mirel::KernelName();
    const char* const same = ours == "AVX2"   ? "haswell"
                             : ours == "SSE4" ? "westmere"
                             : ours == "NEON" ? "arm64"
                                              : "fallback";
    const auto& all = simdutf::get_available_implementations();
    std::vector<SimdutfContender> contenders;
    if (const auto* const kernels = all[same]; kernels && kernels->supported_by_runtime_system())
      contenders.emplace_back("simdutf, same level", kernels);
    contenders.emplace_back("simdutf, best", all.detect_best_supported());
    return contenders;
  }();
  return kContenders;
}
#endif
