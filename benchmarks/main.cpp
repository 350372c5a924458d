#include "Cases.h"
#include "Simdutf.h"

#include <utils/Kernels.h>

int main(int argc, char** argv) {
  RegisterSearches();
  RegisterEdits();
  RegisterStandard();
  RegisterConversions();
  RegisterTexts();
  benchmark::AddCustomContext("kernels", mirel::KernelName());
#ifdef HAVE_SIMDUTF
  for (const auto& [contender, kernels] : Simdutf())
    benchmark::AddCustomContext(contender,
                                std::string(kernels->name()) + ", " + std::string(kernels->description()));
#endif
#ifdef HAVE_BEFORE
  benchmark::AddCustomContext("earlier version", HAVE_BEFORE);
#endif
  benchmark::Initialize(&argc, argv);
  benchmark::RunSpecifiedBenchmarks();
}
