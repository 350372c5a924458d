// Every input of four bytes, and every pair of UTF-16 units.
#include "../Oracle.h"

#include <atomic>
#include <cstdio>
#include <thread>
#include <vector>

namespace {

/// Calls check(i) for i from 0 to 0xFFFF, on all processors, and shows the progress.
template <class F> void ForAll(const char* what, const F& check) {
  std::atomic<unsigned> next{0};
  const auto work = [&] {
    for (unsigned i; !testing::Test::HasFailure() && (i = next++) <= 0xFFFF;) {
      check(static_cast<char16>(i));
      if (i % 0x290 == 0)
        std::fprintf(stderr, "\r%s: %u %% ", what, (i * 100 + 0x8000) >> 16);
    }
  };
  std::vector<std::thread> threads;
  for (unsigned n = std::thread::hardware_concurrency(); n > 1; --n)
    threads.emplace_back(work);
  work();
  for (std::thread& thread : threads)
    thread.join();
  std::fprintf(stderr, "\n");
}

TEST(Exhaustive, EveryFourBytesConvertAsByTheOracle) {
  ForAll("four bytes", [](char16 high) {
    char8 text[] = {static_cast<char8>(high >> 8), static_cast<char8>(high), 0, 0};
    for (unsigned low = 0; low <= 0xFFFF; ++low) {
      text[2] = static_cast<char8>(low >> 8);
      text[3] = static_cast<char8>(low);
      oracle::CheckAmongSequences(oracle::View<char8>(text, 4));
    }
  });
}

TEST(Exhaustive, EveryTwoUnitsConvertAsByTheOracle) {
  ForAll("two units", [](char16 first) {
    char16 units[] = {first, 0};
    for (unsigned second = 0; second <= 0xFFFF; ++second) {
      units[1] = static_cast<char16>(second);
      oracle::CheckAmongSequences(oracle::View<char16>(units, 2));
    }
  });
}

} // namespace
