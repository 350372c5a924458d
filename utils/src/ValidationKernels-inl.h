// Checking and counting in SIMD instructions, compiled once for each instruction set by Kernels.cpp.
//
// A text is scanned in blocks. One that is well-formed is counted; the first that isn't ends the scan, and
// the scalar path finds the malformed sequence.
//
// There is no include guard: the file is included once for each instruction set.

#include <cstddef>
#include <cstdint>
#include <cstring>

#include "Utf16Kernels-inl.h"
#include "Utf8Kernels-inl.h"

HWY_BEFORE_NAMESPACE();
namespace mirel::detail::HWY_NAMESPACE {
namespace {

/// Returns nonzero bytes where a byte may not follow those before it. The nibbles of each two adjacent bytes
/// are looked up in kPairFaults. Both must be continuation bytes exactly where a lead byte two or three
/// places before the second requires it.
template <class D, class V = hn::Vec<D>> HWY_INLINE V Faults(D d, V bytes, V before) {
  constexpr int n = int(kLanes<D>);
  const V first = Window<n - 1>(d, before, bytes);
  const V byHigh = hn::TableLookupBytes(hn::LoadDup128(d, kPairFaults.firstHigh), Right<4>(d, first, 0x0F));
  const V byLow =
      hn::TableLookupBytes(hn::LoadDup128(d, kPairFaults.firstLow), hn::And(first, Broadcast(d, 0x0F)));
  const V bySecond =
      hn::TableLookupBytes(hn::LoadDup128(d, kPairFaults.secondHigh), Right<4>(d, bytes, 0x0F));
  // These have the highest bit set where the byte two places before is at least E0, or the byte three places
  // before at least F0.
  const V third = hn::SaturatedSub(Window<n - 2>(d, before, bytes), Broadcast(d, 0xE0 - 0x80));
  const V fourth = hn::SaturatedSub(Window<n - 3>(d, before, bytes), Broadcast(d, 0xF0 - 0x80));
  const V isContinued = hn::And(hn::Or(third, fourth), Broadcast(d, 0x80));
  return hn::Xor(hn::And(hn::And(byHigh, byLow), bySecond), isContinued);
}

/// Returns whether the n bytes at p, whole vectors, are ASCII.
template <ssize_t n> HWY_INLINE bool IsAscii(const char8* p) {
  auto all = hn::Zero(Wide());
  for (ssize_t i = 0; i < n; i += kLanes<Wide>)
    all = hn::Or(all, hn::LoadU(Wide(), BytesOf(p + i)));
  return hn::AllFalse(Wide(), IsNonAscii(Wide(), all));
}

/// A scan of UTF-8.
template <bool kIsCounted> struct Utf8Scan {
  using D = Wide;
  static constexpr ssize_t kUnits = WideUtf8Block::kUnits;

  hn::Vec<D> last; ///< the last vector of the block before; if that block is ASCII, any vector of ASCII
  ssize_t continuations, fourBytes;
  bool followsAscii;

  // Not a constructor: g++ compiles implicit constructors for the library's own target, not for the kernels'.
  static HWY_INLINE Utf8Scan Begin() { return {hn::Zero(D()), 0, 0, true}; }

  /// Returns whether the text stays well-formed through the block at p, except for a sequence that the
  /// block's end cuts off, and counts the block if so.
  HWY_INLINE bool Take(const char8* p) {
    const bool isAscii = IsAscii<kUnits>(p);
    if (isAscii && followsAscii)
      return true;
    const WideUtf8Block block = WideUtf8Block::Load(p);
    auto before = last, faults = hn::Zero(D());
    for (int k = 0; k < kUnits / kLanes<D>; ++k) {
      const auto bytes = block.template Get<0>(k);
      faults = hn::Or(faults, Faults(D(), bytes, before));
      before = bytes;
      if (isAscii) // only its first bytes can be at fault
        break;
    }
    if (!hn::AllTrue(D(), hn::Eq(faults, hn::Zero(D()))))
      return false;
    if constexpr (kIsCounted) {
      continuations += Count(block.Bits([](auto v, auto) HWY_ATTR { return IsFrom80Below(D(), v, 0xC0); }));
      fourBytes += Count(block.Bits([](auto v, auto) HWY_ATTR { return IsAtLeast(D(), v, 0xF0); }));
    }
    followsAscii = isAscii;
    last = before;
    return true;
  }
};

/// Scans UTF-8 in blocks as far as it is well-formed. Where it stops, a sequence begins.
template <bool kIsCounted> HWY_INLINE Measured<char8> ScanUtf8(const char8* const begin, const char8* end) {
  using Scan = Utf8Scan<kIsCounted>;
  Scan scan = Scan::Begin();
  const char8* p = begin;
  while (end - p >= Scan::kUnits && scan.Take(p)) {
    p += Scan::kUnits;
    // A loop of its own for ASCII takes half the time: it has no state.
    while (scan.followsAscii && end - p >= 2 * Scan::kUnits && IsAscii<2 * Scan::kUnits>(p))
      p += 2 * Scan::kUnits;
  }
  if (end - p < Scan::kUnits && p != end) {
    alignas(64) char8 rest[std::size_t(Scan::kUnits)] = {};
    std::memcpy(rest, p, std::size_t(end - p));
    if (scan.Take(rest)) {
      p = end;
      scan.followsAscii = true; // zeros follow the text
    }
  }
  const ssize_t cutOff = scan.followsAscii ? 0 : IncompleteAtEnd(BytesOf(p)); // left to the scalar path
  const ssize_t codePoints = p - begin - scan.continuations - (cutOff > 0);
  p -= cutOff;
  return {p, {codePoints, codePoints + scan.fourBytes - (cutOff > 0 && UnitValue(*p) >= 0xF0)}};
}

/// A scan of UTF-16. A bit tells the next block whether this one ends with a high surrogate: a block that
/// began at that surrogate would have to wait for the masks of this one.
template <bool kIsCounted, class D> struct Utf16Scan {
  using Block = Utf16Block<D>;
  static constexpr ssize_t kUnits = Block::kUnits;

  /// How many bytes fewer than three the units take: one for each unit below 0x800, another for each
  /// below 0x80.
  hn::Vec<hn::Repartition<uint64_t, D>> lacking;
  ssize_t surrogates, zeros;
  uint64_t isCutOff; ///< 1 if the block before ends with a high surrogate

  static HWY_INLINE Utf16Scan Begin() { return {hn::Zero(hn::Repartition<uint64_t, D>()), 0, 0, 0}; }

  /// Returns whether the text stays well-formed from unit `from` of the block at p on, except for a high
  /// surrogate at the block's end, and counts the block if so. The units before `from` count as zeros.
  HWY_INLINE bool Take(const char16* p, ssize_t from) {
    const ToUnits<D> du;
    auto first = hn::LoadU(du, p), second = hn::LoadU(du, p + kUnits / 2);
    if (from > 0) {
      first = hn::IfThenZeroElse(hn::FirstN(du, std::size_t(from)), first);
      second = hn::IfThenZeroElse(hn::FirstN(du, std::size_t(HWY_MAX(from - kUnits / 2, 0))), second);
    }
    const auto mask = hn::Set(du, 0xF800), surrogate = hn::Set(du, 0xD800);
    const auto kind1 = hn::And(first, mask), kind2 = hn::And(second, mask);
    const bool hasNoSurrogates = hn::AllFalse(du, hn::Or(hn::Eq(kind1, surrogate), hn::Eq(kind2, surrogate)));
    if (!hasNoSurrogates || isCutOff != 0) {
      const Block block = Block::Of(hn::BitCast(D(), first), hn::BitCast(D(), second));
      const uint64_t highs = BitsOf(D(), block.Is(0xD8, 0xFC)), lows = BitsOf(D(), block.Is(0xDC, 0xFC));
      if ((((highs << 1 | isCutOff << from) ^ lows) & FirstBits(kUnits)) != 0)
        return false;
      isCutOff = highs >> (kUnits - 1);
      surrogates += Count(highs | lows);
    }
    if constexpr (kIsCounted) {
      const auto zero = hn::Zero(du), nonAscii = hn::Set(du, 0xFF80);
      const auto isZero = [=](auto v) HWY_ATTR { return hn::VecFromMask(du, hn::Eq(v, zero)); };
      const auto below80 = hn::Add(isZero(hn::And(first, nonAscii)), isZero(hn::And(second, nonAscii)));
      const auto below = hn::Add(below80, hn::Add(isZero(kind1), isZero(kind2)));
      lacking = hn::Add(lacking, hn::SumsOf8(hn::BitCast(D(), hn::Sub(zero, below))));
    }
    zeros += from;
    return true;
  }
};

/// Scans UTF-16 in blocks as far as it is well-formed. Where it stops, a sequence begins. The last block ends
/// with the text, so the text must have at least as many units as a block.
template <bool kIsCounted, class D>
HWY_INLINE Measured<char16> ScanUtf16(const char16* const begin, const char16* end) {
  auto scan = Utf16Scan<kIsCounted, D>::Begin();
  constexpr ssize_t kUnits = Utf16Scan<kIsCounted, D>::kUnits;
  const char16* p = begin;
  while (end - p >= kUnits && scan.Take(p, 0))
    p += kUnits;
  if (end - p < kUnits && p != end && scan.Take(end - kUnits, kUnits - (end - p)))
    p = end;
  if (scan.isCutOff != 0) { // left to the scalar path
    --p;
    --scan.surrogates;
  }
  const hn::Repartition<uint64_t, D> d64;
  const ssize_t n = p - begin,
                lacking = ssize_t(hn::GetLane(hn::SumOfLanes(d64, scan.lacking))) - 2 * scan.zeros;
  return {p, {n - scan.surrogates / 2, 3 * int64(n) - lacking - scan.surrogates}};
}
template <bool kIsCounted> HWY_INLINE Measured<char16> ScanUtf16(const char16* p, const char16* end) {
  return end - p < kLanes<Wide> ? ScanUtf16<kIsCounted, Narrow>(p, end) : ScanUtf16<kIsCounted, Wide>(p, end);
}

const char8* SkipUtf8(const char8* p, const char8* end) { return ScanUtf8<false>(p, end).p; }
Measured<char8> MeasureUtf8(const char8* p, const char8* end) { return ScanUtf8<true>(p, end); }
const char16* SkipUtf16(const char16* p, const char16* end) { return ScanUtf16<false>(p, end).p; }
Measured<char16> MeasureUtf16(const char16* p, const char16* end) { return ScanUtf16<true>(p, end); }

} // namespace
} // namespace mirel::detail::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();
