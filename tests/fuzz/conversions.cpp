// Fuzzes all that reads UTF-8 and UTF-16: the first byte is how much ASCII stands before the text, the others
// are the text.
#include "../TextChecks.h"

namespace {

/// Checks text whole, cut at every place where that can make a difference, and in two pieces.
template <class T> void CheckCuts(std::size_t before, const oracle::Text<T>& text) {
  const oracle::Text<T> all = oracle::Text<T>(before, 'a') + text;
  for (std::size_t size = before; size <= all.size(); ++size) {
    oracle::CheckText(all.substr(0, size));
    oracle::CheckPieces(all, {size, all.size()});
  }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const unsigned char* data, std::size_t size) {
  GTEST_FLAG_SET(throw_on_failure, true);
  if (size == 0 || size > 128)
    return 0;
  // As much ASCII as leads into each way of converting it: single units, words, blocks and the end of one,
  // and seldom, since that takes long, the end of a chunk.
  static constexpr std::size_t kBefore[] = {0, 0, 0, 0, 0, 0, 1, 2, 5, 20, 31, 34, 1000};
  const std::size_t before = kBefore[data[0] % std::size(kBefore)];
  ++data, --size;
  CheckCuts<char8>(before, oracle::Text<char8>(reinterpret_cast<const char8*>(data), size));
  oracle::Text<char16> units(size / 2, 0);
  for (std::size_t i = 0; i < units.size(); ++i)
    units[i] = static_cast<char16>(data[2 * i] | data[2 * i + 1] << 8);
  CheckCuts<char16>(before, units);
  return 0;
}
