// UTF-16 to UTF-8 in SIMD instructions, compiled once for each instruction set by Kernels.cpp.
//
// Kernels.cpp undefines the guard after each instruction set.

#ifndef MIREL_UTF16_KERNELS
#define MIREL_UTF16_KERNELS

#include "ConversionBlocks-inl.h"

HWY_BEFORE_NAMESPACE();
namespace mirel::detail::HWY_NAMESPACE {
namespace {

/// A bit for each unit that takes at least two bytes of UTF-8, and for each that takes at least three.
struct UnitMasks {
  uint64_t two, three;
  /// Returns how many bytes the first n units take.
  HWY_INLINE ssize_t Bytes(ssize_t n) const {
    return n + Count(two & FirstBits(n)) + Count(three & FirstBits(n));
  }
};

/// A block of UTF-16, of as many units as a vector has bytes.
template <class Tag> struct Utf16Block {
  using D = Tag;
  static constexpr ssize_t kUnits = kLanes<D>;
  // The last store is 16 bytes, of which at most 12 count.
  static constexpr ssize_t kMaxStored = 3 * kUnits + 4;
  static constexpr D d{};
  hn::Vec<D> low, high; ///< the bytes of the units
  hn::Vec<D> any;       ///< the bitwise or of the block's two vectors of units

  static HWY_INLINE Utf16Block Load(const char16* p) {
    return Of(hn::LoadU(d, BytesOf(p)), hn::LoadU(d, BytesOf(p) + kUnits));
  }
  /// Loads the n units at p, fewer than the block has, followed by zeros.
  static HWY_INLINE Utf16Block Load(const char16* p, ssize_t n) {
    return Of(LoadPart(p, n), n > 8 ? LoadPart(p + 8, n - 8) : hn::Zero(d));
  }
  static HWY_INLINE Utf16Block Of(hn::Vec<D> first, hn::Vec<D> second) {
    return {hn::ConcatEven(d, second, first), hn::ConcatOdd(d, second, first), hn::Or(first, second)};
  }

  /// Returns bytes whose highest bit tells that the unit isn't ASCII.
  HWY_INLINE hn::Vec<D> NonAscii() const { return hn::Or(hn::SaturatedAdd(high, Broadcast(d, 0x7F)), low); }
  /// Returns whether the block is ASCII. It tests the units as loaded, so ASCII text never needs `high`.
  HWY_INLINE bool IsAscii() const {
    const ToUnits<D> du;
    return hn::AllTrue(du, hn::Eq(hn::And(hn::BitCast(du, any), hn::Set(du, 0xFF80)), hn::Zero(du)));
  }
  HWY_INLINE hn::Vec<D> ThreeBytes() const { return hn::SaturatedAdd(high, Broadcast(d, 0x78)); }
  /// Returns the units whose high byte has the value kind in the bits of mask.
  HWY_INLINE hn::Mask<D> Is(uint8_t kind, uint8_t mask) const {
    return IsEqual(d, hn::And(high, Broadcast(d, mask)), kind);
  }
  /// Returns bits 6 to 13 of each unit, masked by kept, which includes the lowest two bits.
  HWY_INLINE hn::Vec<D> UpperBits(uint8_t kept) const {
    return hn::Or(Left<2>(d, high, kept & 0xFC), Right<6>(d, low, 0x03));
  }

  /// Stores a block without units from 0x800 on. Returns the end of its bytes.
  HWY_INLINE uint8_t* StoreTwo(uint64_t two, uint8_t* out) const {
    const auto lead = hn::Or(UpperBits(0x1F), Broadcast(d, 0xC0));
    const auto first = Select(IsNonAscii(d, NonAscii()), lead, low);
    const auto last = hn::Or(hn::And(low, Broadcast(d, 0x3F)), Broadcast(d, 0x80));
    return StorePairs<8, 1>(d, first, last, kKeepTwoBytes, two, out);
  }

  /// Stores any block. Returns the end of its bytes.
  template <bool kHasSurrogates> HWY_INLINE uint8_t* StoreThree(const UnitMasks& masks, uint8_t* out) const {
    const auto continuation = Broadcast(d, 0x80), lead3 = hn::Or(Right<4>(d, high, 0x0F), Broadcast(d, 0xE0));
    auto first = Select(IsNonAscii(d, ThreeBytes()), lead3, hn::Or(UpperBits(0x1F), Broadcast(d, 0xC0)));
    first = Select(IsNonAscii(d, NonAscii()), first, low);
    auto middle = hn::Or(UpperBits(0x3F), continuation),
         last = hn::Or(hn::And(low, Broadcast(d, 0x3F)), continuation);
    if constexpr (kHasSurrogates) {
      // A high surrogate gives the first three bytes, the third with bits of the low surrogate. The low
      // surrogate gives the last byte.
      const auto isHigh = Is(0xD8, 0xFC), isLow = Is(0xDC, 0xFC);
      const auto upper = hn::Add(UpperBits(0x0F), Broadcast(d, 1)); // bits 16 to 20 of the code point
      const auto lead4 = hn::Or(Right<2>(d, upper, 0x07), Broadcast(d, 0xF0));
      first = Select(isLow, last, Select(isHigh, lead4, first));
      const auto second = hn::Or(Left<4>(d, upper, 0x30), Right<2>(d, low, 0x0F));
      middle = Select(isHigh, hn::Or(second, continuation), middle);
      const auto third = hn::Or(Left<4>(d, low, 0x30),
                                hn::And(Window<1>(d, UpperBits(0x0F), hn::Zero(d)), Broadcast(d, 0x0F)));
      last = Select(isHigh, hn::Or(third, continuation), last);
    }
    // Four bytes for each unit: first, first, middle, last. The masks of even and of odd groups of four units
    // are kept apart, so that both masks of a group stand side by side.
    const ToUnits<D> du;
    const auto leads0 = hn::BitCast(du, hn::InterleaveLower(d, first, first));
    const auto leads1 = hn::BitCast(du, hn::InterleaveUpper(d, first, first));
    const auto continuations0 = hn::BitCast(du, hn::InterleaveLower(d, middle, last));
    const auto continuations1 = hn::BitCast(du, hn::InterleaveUpper(d, middle, last));
    const uint64_t even = (masks.two & 0x0F0F0F0F) << 4 | (masks.three & 0x0F0F0F0F) << 8;
    const uint64_t odd = (masks.two & 0xF0F0F0F0) | (masks.three & 0xF0F0F0F0) << 4;
    return StoreHalves<4, 1>(d,
                             {hn::BitCast(d, hn::InterleaveLower(du, leads0, continuations0)),
                              hn::BitCast(d, hn::InterleaveUpper(du, leads0, continuations0)),
                              hn::BitCast(d, hn::InterleaveLower(du, leads1, continuations1)),
                              hn::BitCast(d, hn::InterleaveUpper(du, leads1, continuations1))},
                             kKeepThreeBytes, {even, odd, even >> 8, odd >> 8}, out);
  }

  HWY_INLINE Converted Convert(ssize_t from, ssize_t to, uint8_t* out) const {
    const ssize_t n = to - from, unitsAfter = kUnits - to;
    if (IsAscii()) {
      hn::StoreU(low, d, out - from);
      return {n, n};
    }
    UnitMasks masks = {HighBits(d, NonAscii()), HighBits(d, ThreeBytes())};
    if (masks.three == 0)
      return {n, StoreTwo(masks.two, out - masks.Bytes(from)) - out - unitsAfter};
    if (BitsOf(d, Is(0xD8, 0xF8)) == 0)
      return {n, StoreThree<false>(masks, out - masks.Bytes(from)) - out - unitsAfter};
    const uint64_t highs = BitsOf(d, Is(0xD8, 0xFC)), lows = BitsOf(d, Is(0xDC, 0xFC));
    if (((highs << 1 ^ lows) & FirstBits(kUnits) & ~FirstBits(from)) != 0)
      return {0, 0};
    const ssize_t cutOff = static_cast<ssize_t>(highs >> (kUnits - 1));
    masks = {masks.two & ~lows, masks.three & ~lows}; // a low surrogate gives one byte, a high one three
    return {n - cutOff, StoreThree<true>(masks, out - masks.Bytes(from)) - out - unitsAfter - 3 * cutOff};
  }

  /// Stores a block of ASCII and of unpaired surrogates, no two of them side by side: eight units then give
  /// no more than 16 bytes.
  HWY_INLINE uint8_t* StoreAscii(uint64_t unpaired, uint8_t* out) const {
    const hn::Repartition<uint64_t, D> d64;
    alignas(16) static constexpr uint8_t kReplacement[16] = {0xEF, 0xBF, 0xBD, 0,    0,   0,
                                                             0,    0,    0xEF, 0xBF, 0xBD};
    const auto units = hn::BitCast(d64, low), replacement = hn::BitCast(d64, hn::LoadDup128(d, kReplacement));
    return StoreHalves<8, 2>(d,
                             {hn::BitCast(d, hn::InterleaveLower(d64, units, replacement)),
                              hn::BitCast(d, hn::InterleaveUpper(d64, units, replacement))},
                             kReplaceUnits, {unpaired << 4, unpaired >> 4}, out);
  }

  /// Returns the block with U+FFFD in the lanes of the mask.
  HWY_INLINE Utf16Block WithReplaced(hn::Mask<D> mask) const {
    return {Select(mask, Broadcast(d, 0xFD), low), Select(mask, Broadcast(d, 0xFF), high), any};
  }

  /// Converts the block, with U+FFFD for each unpaired surrogate.
  HWY_INLINE Replaced Replace(uint8_t* out) const {
    const uint64_t surrogates = BitsOf(d, Is(0xD8, 0xF8)), highs = BitsOf(d, Is(0xD8, 0xFC));
    const uint64_t cutOff = highs & uint64_t{1} << (kUnits - 1); // left to the next block
    if (surrogates == 0)
      return {{0, 0}, 0};
    if ((surrogates & surrogates << 1) == 0 && cutOff == 0) { // none has a neighbour to be paired with
      const UnitMasks masks = {HighBits(d, NonAscii()), HighBits(d, ThreeBytes())};
      const uint8_t* const outEnd = masks.two == surrogates
                                        ? StoreAscii(surrogates, out)
                                        : WithReplaced(Is(0xD8, 0xF8)).template StoreThree<false>(masks, out);
      return {{kUnits, outEnd - out}, Count(surrogates)};
    }
    const uint64_t lows = surrogates & ~highs;
    const uint64_t unpaired = (highs & ~(lows >> 1) & ~cutOff) | (lows & ~(highs << 1));
    if (unpaired == 0)
      return {{0, 0}, 0};
    return {WithReplaced(MaskOf(d, unpaired)).Convert(0, kUnits, out), Count(unpaired)};
  }
};

Progress<char16> Utf8FromUtf16(const char16* p, const char16* end, char8* out, char8* outEnd) {
  Conversion<char16> text{p, end, out, outEnd};
  if (end - p >= kLanes<Wide>)
    return text.At(text.ConvertAll<Utf16Block<Wide>>());
  if (end - p >= kLanes<Narrow>)
    return text.At(text.ConvertAll<Utf16Block<Narrow>>());
  return text.At(text.ConvertShort<Utf16Block<Narrow>>());
}

} // namespace
} // namespace mirel::detail::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
