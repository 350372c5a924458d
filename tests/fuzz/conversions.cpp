// Fuzzes the functions that read UTF-8 and UTF-16. The first byte chooses how much ASCII precedes the text,
// the other bytes are the text.
#include "../TextChecks.h"

namespace {

/// Checks the text, every prefix of it, and every division in two pieces.
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
  // Enough ASCII to reach each path of a conversion: single units, SWAR, blocks, the end of a block and,
  // seldom because it takes long, a text of many blocks.
  static constexpr std::size_t kBefore[] = {0, 0, 0, 0, 0, 0, 1, 2, 5, 20, 31, 34, 1000};
  const std::size_t before = kBefore[data[0] % std::size(kBefore)];
  ++data;
  --size;
  CheckCuts<char8>(before, oracle::Text<char8>(reinterpret_cast<const char8*>(data), size));
  oracle::Text<char16> units(size / 2, 0);
  for (std::size_t i = 0; i < units.size(); ++i)
    units[i] = static_cast<char16>(data[2 * i] | data[2 * i + 1] << 8);
  CheckCuts<char16>(before, units);
  return 0;
}
