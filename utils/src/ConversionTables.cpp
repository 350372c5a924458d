// The tables of the conversion kernels.

#include "KernelTable.h"

namespace mirel::detail {

namespace {

/// Shuffles of positions of kBytes bytes. keeps says of each byte of a position whether it is kept, by the
/// mask shifted so that the position's bit is the lowest.
template <std::size_t kBytes, class F> constexpr Shuffles MakeShuffles(const F& keeps) {
  Shuffles shuffles{};
  for (unsigned mask = 0; mask < 256; ++mask)
    for (std::size_t k = 0, n = 0; k < 16; ++k)
      if (keeps(mask >> k / kBytes, k % kBytes))
        shuffles.rows[mask][n++] = static_cast<uint8_t>(k);
  return shuffles;
}

constexpr Repeats MakeRepeats() {
  Repeats repeats{};
  for (std::size_t x = 0; x < 256; ++x)
    for (uint8_t& byte : repeats.rows[x])
      byte = static_cast<uint8_t>(x);
  return repeats;
}

} // namespace

constexpr Shuffles kKeepUnits = MakeShuffles<2>([](unsigned bits, std::size_t) { return (bits & 1) != 0; });
constexpr Shuffles kKeepTwoBytes =
    MakeShuffles<2>([](unsigned bits, std::size_t byte) { return byte == 0 || (bits & 1) != 0; });
constexpr Shuffles kKeepThreeBytes = MakeShuffles<4>([](unsigned bits, std::size_t byte) {
  return byte == 0 || (byte == 2 && (bits & 0x10) != 0) || (byte == 3 && (bits & 1) != 0);
});
constexpr Repeats kRepeats = MakeRepeats();

} // namespace mirel::detail
