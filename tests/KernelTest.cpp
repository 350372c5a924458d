// Which kernels the library chooses. UtfTest.cpp, TextTest.cpp and RangeAlgorithmsTest.cpp test each of them.
#include "Support.h"

#include <cstdio>
#include <cstdlib>

#include <utils/Kernels.h>

#include "../utils/src/KernelTable.h"

namespace {

/// Converted before main() begins.
const mirel::string16 kBeforeMain = [] {
  mirel::string16 wide;
  mirel::Utf16FromUtf8(wide, "Gr\u00FC\u00DFe, \u4E16\u754C, before anything is initialised");
  return wide;
}();

TEST(Kernels, AreChosenBeforeMain) {
  ASSERT_EQ(kBeforeMain.size(), 41);
  EXPECT_EQ(kBeforeMain[2], 0xFC);
  EXPECT_EQ(kBeforeMain[7], 0x4E16);
  EXPECT_EQ(kBeforeMain.find(u'z'), kNpos);
}

/// When the tests run under emulation, MIREL_EXPECTED_KERNELS may name the kernels that must be chosen.
TEST(Kernels, AreThoseOfTheProcessor) {
  std::printf("kernels: %s\n", mirel::KernelName());
  if (const char* const expected = std::getenv("MIREL_EXPECTED_KERNELS")) {
    EXPECT_STREQ(mirel::KernelName(), expected);
  }
#ifndef MIREL_SHARED // a shared library hides the function
  const auto* const best = mirel::detail::KernelsAt(0);
  EXPECT_STREQ(mirel::KernelName(), best != nullptr ? best->name : "none");
#endif
#if defined(__AVX2__) && defined(MIREL_KERNELS)
  EXPECT_STREQ(mirel::KernelName(), "AVX2");
#elif defined(__aarch64__) && defined(MIREL_KERNELS)
  EXPECT_STREQ(mirel::KernelName(), "NEON");
#endif
}

} // namespace
