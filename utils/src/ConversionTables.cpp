// The tables of the conversion kernels.

#include "KernelTable.h"

namespace mirel::detail {

namespace {

/// Makes a shuffle for each mask. addBytes(mask, k, add) adds the bytes that take the place of byte k:
/// add(from, bits) adds the byte at index `from` if the lowest bit of `bits` is set.
template <class F> constexpr Shuffles MakeShuffles(const F& addBytes) {
  Shuffles shuffles{};
  for (unsigned mask = 0; mask < 256; ++mask) {
    std::size_t n = 0;
    const auto add = [&](unsigned from, unsigned bits) {
      if ((bits & 1) != 0 && n < 16)
        shuffles.rows[mask][n++] = static_cast<uint8_t>(from);
    };
    for (unsigned k = 0; k < 16; ++k)
      addBytes(mask, k, add);
  }
  return shuffles;
}

/// A fault of two adjacent bytes: the range of the first, the range of the second, and the bit of the fault.
struct PairFault {
  int first, firstLast, second, secondLast, bit;
};
/// From table 3-7 of the Unicode Standard. Two faults share a bit only if they differ in a single nibble:
/// otherwise nibbles of one and nibbles of the other could form pairs that aren't faults.
constexpr PairFault kFaults[] = {
    {0xC0, 0xFF, 0x00, 0x7F, 0}, {0xC0, 0xFF, 0xC0, 0xFF, 0}, // a continuation byte is missing
    {0x00, 0x7F, 0x80, 0xBF, 1},                              // an unexpected continuation byte
    {0xE0, 0xE0, 0x80, 0x9F, 2},                              // overlong
    {0xED, 0xED, 0xA0, 0xBF, 3},                              // a surrogate
    {0xC0, 0xC1, 0x80, 0xBF, 4},                              // overlong
    {0xF0, 0xF0, 0x80, 0x8F, 5}, {0xF5, 0xFF, 0x80, 0x8F, 5}, // overlong, and above U+10FFFF
    {0xF4, 0xFF, 0x90, 0xBF, 6},                              // above U+10FFFF
    {0x80, 0xBF, 0x80, 0xBF, 7}};                             // two continuation bytes

constexpr PairFaults MakePairFaults() {
  PairFaults faults{};
  for (const PairFault& fault : kFaults) {
    const auto add = [&fault](uint8_t& bits) { bits = static_cast<uint8_t>(bits | 1 << fault.bit); };
    for (int first = fault.first; first <= fault.firstLast; ++first) {
      add(faults.firstHigh[first >> 4]);
      add(faults.firstLow[first & 15]);
    }
    for (int second = fault.second; second <= fault.secondLast; ++second)
      add(faults.secondHigh[second >> 4]);
  }
  return faults;
}

constexpr BroadcastBytes MakeBroadcastBytes() {
  BroadcastBytes bytes{};
  for (std::size_t x = 0; x < 256; ++x)
    for (uint8_t& byte : bytes.rows[x])
      byte = static_cast<uint8_t>(x);
  return bytes;
}

} // namespace

constexpr Shuffles kKeepUnits =
    MakeShuffles([](unsigned mask, unsigned k, auto add) { add(k, mask >> k / 2); });
constexpr Shuffles kKeepTwoBytes =
    MakeShuffles([](unsigned mask, unsigned k, auto add) { add(k, k % 2 == 0 ? 1 : mask >> k / 2); });
constexpr Shuffles kKeepThreeBytes = MakeShuffles([](unsigned mask, unsigned k, auto add) {
  const unsigned kept[] = {1, 0, mask >> k / 4 >> 4, mask >> k / 4};
  add(k, kept[k % 4]);
});
constexpr Shuffles kReplaceUnits = MakeShuffles([](unsigned mask, unsigned k, auto add) {
  for (const unsigned from : {k, 8u, 9u, 10u})
    add(from, k < 8 && (mask >> k & 1) == (from != k));
});
constexpr PairFaults kPairFaults = MakePairFaults();
constexpr BroadcastBytes kBroadcastBytes = MakeBroadcastBytes();

} // namespace mirel::detail
