// UTF-8 and ASCII to UTF-16 in SIMD instructions, compiled once for each instruction set by Kernels.cpp.
//
// Kernels.cpp undefines the guard after each instruction set.

#ifndef MIREL_UTF8_KERNELS
#define MIREL_UTF8_KERNELS

#include "ConversionBlocks-inl.h"

HWY_BEFORE_NAMESPACE();
namespace mirel::detail::HWY_NAMESPACE {
namespace {

/// The low and the high bytes of UTF-16 units.
template <class D> struct Planes { hn::Vec<D> low, high; };

/// Returns the units of the code points that would begin with the bytes of a, if b and c hold the bytes one
/// and two places further on.
template <int kMaxBytes, class D>
HWY_INLINE Planes<D> UnitsOf(D d, hn::Vec<D> a, hn::Vec<D> b, hn::Vec<D> c) {
  const auto isTwo = IsFrom80Below(d, a, 0xE0); // or a continuation byte
  // The last six bits come from one byte, those before them from the byte before it.
  auto last = b, beforeLast = a;
  if constexpr (kMaxBytes > 2) {
    last = Select(isTwo, b, c);
    beforeLast = Select(isTwo, a, b);
  }
  const auto isContinuation = IsFrom80Below(d, a, 0xC0);
  if constexpr (kMaxBytes > 3) {
    // The second position of a four-byte sequence, where a continuation byte stands, gives the low surrogate.
    last = Select(isContinuation, c, last);
    beforeLast = Select(isContinuation, b, beforeLast);
  }
  auto low = hn::Or(Left<6>(d, beforeLast, 0xC0), hn::And(last, Broadcast(d, 0x3F)));
  auto high = Right<2>(d, beforeLast, 0x0F);
  if constexpr (kMaxBytes > 2)
    high = hn::Or(high, hn::IfThenZeroElse(isTwo, Left<4>(d, a, 0xF0)));
  if constexpr (kMaxBytes > 3) {
    high = Select(isContinuation, hn::Or(hn::And(high, Broadcast(d, 0x03)), Broadcast(d, 0xDC)), high);
    // Bits 16 to 20 of the code point, less 1, as the high surrogate has them.
    const auto upper = hn::Sub(hn::Or(Left<2>(d, a, 0x1C), Right<4>(d, b, 0x03)), Broadcast(d, 1));
    const auto lower = hn::Or(Left<2>(d, b, 0x3C), Right<4>(d, c, 0x03));
    const auto isFour = IsAtLeast(d, a, 0xF0);
    low = Select(isFour, hn::Or(Left<6>(d, upper, 0xC0), lower), low);
    high = Select(isFour, hn::Or(Right<2>(d, upper, 0x03), Broadcast(d, 0xD8)), high);
  }
  const auto isNonAscii = IsNonAscii(d, a);
  return {Select(isNonAscii, low, a), hn::IfThenElseZero(isNonAscii, high)};
}

/// Stores the bytes, widened to 16-bit units.
template <class D> HWY_INLINE void StoreWidened(D d, hn::Vec<D> bytes, uint8_t* out) {
  const ToUnits<D> du;
  hn::StoreU(hn::BitCast(d, hn::PromoteTo(du, hn::LowerHalf(bytes))), d, out);
  hn::StoreU(hn::BitCast(d, hn::PromoteTo(du, hn::UpperHalf(hn::Half<D>(), bytes))), d, out + kLanes<D>);
}

/// Returns how many bytes before end begin a sequence that end cuts off; at least three bytes precede end.
/// It reads only those three, so it tells where the next block begins long before the masks do.
HWY_INLINE ssize_t IncompleteAtEnd(const uint8_t* end) {
  const uint32_t isLead =
      uint32_t{end[-1] >= 0xC0} | uint32_t{end[-2] >= 0xE0} << 1 | uint32_t{end[-3] >= 0xF0} << 2;
  return static_cast<ssize_t>((hwy::Num0BitsBelowLS1Bit_Nonzero32(isLead | 8) + 1) % 4);
}

/// A block of kVectors vectors of UTF-8.
template <int kVectors, class D> struct Utf8Block {
  static constexpr ssize_t kUnits = kVectors * kLanes<D>;
  static constexpr ssize_t kMaxStored = kUnits;
  const uint8_t* p;
  hn::Vec<D> lastVector;

  static HWY_INLINE Utf8Block Load(const char8* p) {
    return {BytesOf(p), hn::LoadU(D(), BytesOf(p) + kUnits - kLanes<D>)};
  }
  /// Loads the n bytes at p, fewer than the block's one vector has, followed by zeros.
  static HWY_INLINE Utf8Block Load(const char8* p, ssize_t n) { return {nullptr, LoadPart(p, n)}; }

  /// Returns the vector that begins at the n-th byte of the k-th one; bytes past the block are zeros.
  template <int n> HWY_INLINE hn::Vec<D> Get(int k) const {
    return k + 1 < kVectors ? hn::LoadU(D(), p + k * kLanes<D> + n)
                            : Window<n>(D(), lastVector, hn::Zero(D()));
  }
  /// Returns a bit for each position. f gives the mask of a vector from that vector and the one that begins a
  /// byte later.
  template <class F> HWY_INLINE uint64_t Bits(const F& f) const {
    uint64_t bits = 0;
    for (int k = 0; k < kVectors; ++k)
      bits |= BitsOf(D(), f(Get<0>(k), Get<1>(k))) << k * kLanes<D>;
    return bits;
  }

  /// Returns the n-th highest bit of each byte, n counted from 0.
  template <int n> HWY_INLINE uint64_t BitsAt() const {
    uint64_t bits = 0;
    for (int k = 0; k < kVectors; ++k) {
      auto v = Get<0>(k);
      for (int shifts = 0; shifts < n; ++shifts)
        v = hn::Add(v, v);
      bits |= HighBits(D(), v) << k * kLanes<D>;
    }
    return bits;
  }

  HWY_INLINE bool IsAscii() const { return BitsAt<0>() == 0; }

  /// Returns the positions of lead bytes from E0 on that the next byte, if it is a continuation byte, may not
  /// follow: the sequence would be overlong, a surrogate, or above U+10FFFF.
  template <bool kHasFourBytes> HWY_INLINE uint64_t BadLeads() const {
    return Bits([](auto lead, auto next) HWY_ATTR {
      const D d;
      // 80 to 9F may not follow E0, and nothing else may follow ED; xor with 0D turns one into the other.
      const auto swap = hn::IfThenElseZero(IsFrom80Below(d, next, 0xA0), Broadcast(d, 0x0D));
      const auto bad = IsEqual(d, hn::Xor(lead, swap), 0xED);
      if (!kHasFourBytes)
        return bad;
      // 80 to 8F may not follow F0, and nothing else may follow F4; xor with 04 turns one into the other.
      const auto swap4 = hn::IfThenElseZero(IsFrom80Below(d, next, 0x90), Broadcast(d, 0x04));
      return hn::Or(bad, hn::Or(IsEqual(d, hn::Xor(lead, swap4), 0xF4), IsAtLeast(d, lead, 0xF5)));
    });
  }

  /// Stores the units of the positions whose bits are set, U+FFFD for malformed ones. Returns how many they
  /// are.
  template <int kMaxBytes, bool kReplaces = false>
  HWY_INLINE ssize_t Store(uint64_t keep, uint8_t* const out, uint64_t malformed = 0) const {
    uint8_t* end = out;
    for (int k = 0; k < kVectors; ++k) {
      const auto a = Get<0>(k), b = Get<1>(k), c = Get<2>(k);
      auto units = UnitsOf<kMaxBytes>(D(), a, b, c);
      if constexpr (kReplaces) {
        const auto isMalformed = MaskOf(D(), malformed >> k * kLanes<D>);
        units = {Select(isMalformed, Broadcast(D(), 0xFD), units.low),
                 Select(isMalformed, Broadcast(D(), 0xFF), units.high)};
      }
      end = StorePairs<0, 2>(D(), units.low, units.high, kKeepUnits, keep, end);
      keep = keep >> (kLanes<D> - 1) >> 1;
    }
    return static_cast<ssize_t>(static_cast<size_t>(end - out) / 2);
  }

  /// Converts the first 60 bytes, which are 20 three-byte sequences.
  HWY_INLINE Converted ConvertThreeByteSequences(uint8_t* out) const {
    const Narrow d;
    const ToUnits<Narrow> du;
    alignas(16) static constexpr uint8_t kLast[16] = {2, 1, 5, 4, 8, 7, 11, 10, 14, 13};
    alignas(16) static constexpr uint8_t kFirst[16] = {0, 0, 3, 3, 6, 6, 9, 9, 12, 12};
    for (int k = 0; k < 4; ++k) {
      const auto bytes = hn::LoadU(d, p + 15 * k);
      const auto last = hn::BitCast(du, hn::TableLookupBytes(bytes, hn::Load(d, kLast)));
      const auto first = hn::BitCast(du, hn::TableLookupBytes(bytes, hn::Load(d, kFirst)));
      const auto low =
          hn::Or(hn::And(last, hn::Set(du, 0x3F)), hn::ShiftRight<2>(hn::And(last, hn::Set(du, 0x3F00))));
      hn::StoreU(hn::BitCast(d, hn::Or(low, hn::ShiftLeft<12>(first))), d, out + 10 * k);
    }
    return {60, 20};
  }

  HWY_INLINE Converted Convert(ssize_t from, ssize_t to, uint8_t* out) const {
    if (IsAscii()) {
      for (int k = 0; k < kVectors; ++k)
        StoreWidened(D(), Get<0>(k), out - 2 * from + 2 * k * kLanes<D>);
      return {to - from, to - from};
    }
    const ssize_t stop = to == kUnits ? kUnits - IncompleteAtEnd(p + kUnits) : to;
    // A lead byte that is cut off is checked as well: it may stand where a continuation byte is missing.
    const uint64_t checked = FirstBits(stop + 1) & ~FirstBits(from), positions = checked & FirstBits(stop);
    const uint64_t continuations = Bits([](auto v, auto) HWY_ATTR { return IsFrom80Below(D(), v, 0xC2); });
    const uint64_t bad = continuations & BitsAt<1>(); // C0 and C1, which are never well-formed
    const uint64_t leads = BitsAt<0>() & ~continuations, leads3 = leads & BitsAt<2>();
    if (leads3 == 0) {
      if (((bad | (continuations ^ leads << 1)) & checked) != 0)
        return {0, 0};
      return {stop - from, Store<2>(positions & ~continuations, out)};
    }
    const uint64_t leads4 = leads3 & BitsAt<3>();
    const uint64_t misplaced = continuations ^ (leads << 1 | leads3 << 2 | leads4 << 3);
    if (((bad | misplaced) & checked) != 0 ||
        ((leads4 == 0 ? BadLeads<false>() : BadLeads<true>()) & positions) != 0)
      return {0, 0};
    if (leads4 != 0)
      return {stop - from, Store<4>(positions & (~continuations | leads4 << 1), out)};
    if constexpr (kUnits == 64)
      if ((continuations & FirstBits(60)) == 0xDB6DB6DB6DB6DB6 && from == 0)
        return ConvertThreeByteSequences(out);
    return {stop - from, Store<3>(positions & ~continuations, out)};
  }

  /// Stores the units of a block without continuation bytes: U+FFFD for every byte that isn't ASCII.
  HWY_INLINE void StoreLoneBytes(uint8_t* out) const {
    const D d;
    const hn::Repartition<int16_t, D> di;
    const hn::Half<hn::RebindToSigned<D>> half;
    for (int k = 0; k < kVectors; ++k) {
      const auto bytes = Get<0>(k), replaced = Select(IsNonAscii(d, bytes), Broadcast(d, 0xFD), bytes);
      // Sign extension widens FD to FFFD.
      const auto v = hn::BitCast(hn::RebindToSigned<D>(), replaced);
      hn::StoreU(hn::BitCast(d, hn::PromoteTo(di, hn::LowerHalf(half, v))), d, out + 2 * k * kLanes<D>);
      hn::StoreU(hn::BitCast(d, hn::PromoteTo(di, hn::UpperHalf(half, v))), d, out + (2 * k + 1) * kLanes<D>);
    }
  }

  /// Converts a block of more than one vector, with U+FFFD for each maximal subpart of malformed text.
  HWY_INLINE Replaced Replace(uint8_t* out) const {
    const uint64_t allNonAscii = BitsAt<0>();
    const uint64_t allContinuations = Bits([](auto v, auto) HWY_ATTR { return IsFrom80Below(D(), v, 0xC0); });
    // The last byte may begin a sequence if it is in [C2, F5). If it can't, the next block's place is
    // known without IncompleteAtEnd(); waiting for that takes twice as long as all else here.
    if (allContinuations == 0 && static_cast<uint8_t>(p[kUnits - 1] - 0xC2) >= 0xF5 - 0xC2) {
      StoreLoneBytes(out);
      return {{kUnits, kUnits}, Count(allNonAscii)};
    }
    const ssize_t stop = kUnits - IncompleteAtEnd(p + kUnits);
    const uint64_t continuations = allContinuations & FirstBits(stop);
    const uint64_t highest2 = allNonAscii & ~continuations;
    // The lead bytes that the next byte may follow, if it is a continuation byte.
    const uint64_t belowC2 = Bits([](auto v, auto) HWY_ATTR { return IsFrom80Below(D(), v, 0xC2); });
    const uint64_t leads = highest2 & ~belowC2 & ~BadLeads<true>();
    const uint64_t leads3 = leads & BitsAt<2>(), leads4 = leads3 & BitsAt<3>();
    // The bytes that continue what a lead byte began. All others begin a sequence or a subpart.
    const uint64_t second = leads << 1 & continuations;
    const uint64_t third = leads3 << 2 & second << 1 & continuations;
    const uint64_t fourth = leads4 << 3 & third << 1 & continuations;
    const uint64_t begins = FirstBits(stop) & ~(second | third | fourth);
    const uint64_t whole = (second >> 1 & ~leads3) | (third >> 2 & ~leads4) | fourth >> 3;
    const uint64_t malformed = begins & allNonAscii & ~whole;
    const ssize_t units = third == 0    ? Store<2, true>(begins, out, malformed)
                          : fourth == 0 ? Store<3, true>(begins, out, malformed)
                                        : Store<4, true>(begins | fourth >> 2, out, malformed);
    return {{stop, units}, Count(malformed)};
  }
};

using WideUtf8Block = Utf8Block<64 / kLanes<Wide>, Wide>;

Progress<char8> Utf16FromUtf8(const char8* p, const char8* end, char16* out, char16* outEnd) {
  Conversion<char8> text{p, end, out, outEnd};
  if (end - p >= 64)
    return text.At(text.ConvertAll<WideUtf8Block>());
  if (end - p >= 32)
    return text.At(text.ConvertAll<Utf8Block<32 / kLanes<Wide>, Wide>>());
  if (end - p >= 16)
    return text.At(text.ConvertAll<Utf8Block<1, Narrow>>());
  return text.At(text.ConvertShort<Utf8Block<1, Narrow>>());
}

/// Converts whole vectors from the i-th of n bytes on. Returns where it stopped.
template <class D> HWY_INLINE ssize_t WidenAscii(D d, const char8* src, ssize_t i, ssize_t n, char16* dst) {
  for (; n - i >= kLanes<D>; i += kLanes<D>) {
    const auto bytes = hn::LoadU(d, BytesOf(src + i));
    StoreWidened(d, Select(IsNonAscii(d, bytes), Broadcast(d, '?'), bytes), BytesOf(dst + i));
  }
  return i;
}

ssize_t Utf16FromAscii(const char8* src, ssize_t n, char16* dst) {
  return WidenAscii(Narrow(), src, WidenAscii(Wide(), src, 0, n, dst), n, dst);
}

} // namespace
} // namespace mirel::detail::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
