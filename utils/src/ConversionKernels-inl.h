// The conversions in SIMD instructions, compiled once for each instruction set by Kernels.cpp.
//
// A text is converted in blocks. For every position of a block the kernel computes what a code point that
// begins there would give, even where none begins. A byte shuffle from a table then drops the positions where
// none begins. In well-formed text, the only branch that depends on where code points begin is the one for
// blocks that begin with 20 three-byte sequences. Masks with one bit for each position tell whether the block
// is well-formed; one that isn't is left to the scalar path, which finds the malformed sequence. From there a
// lossy conversion goes on in blocks whose masks tell where a maximal subpart begins; there U+FFFD replaces
// what was computed.
// A block ends before a code point that its end would cut off, so no state passes from one block to the next.
// The last block ends where the text ends. It overlaps what has been converted, and may store that part
// again.
//
// There is no include guard: the file is included once for each instruction set.

#include <cstring>

#include <hwy/highway.h>

#include "KernelTable.h"

HWY_BEFORE_NAMESPACE();
namespace mirel::detail::HWY_NAMESPACE {
namespace {

namespace hn = hwy::HWY_NAMESPACE;

using Wide = hn::ScalableTag<uint8_t>;    // the widest of the instruction set
using Narrow = hn::FixedTag<uint8_t, 16>; // for short texts, and for shuffles, which work on 16 bytes
template <class D> using ToUnits = hn::Repartition<uint16_t, D>;
template <class D> constexpr ssize_t kLanes = static_cast<ssize_t>(hn::MaxLanes(D()));

// Bits and bytes

HWY_INLINE ssize_t Count(uint64_t bits) { return static_cast<ssize_t>(hwy::PopCount(bits)); }
constexpr uint64_t FirstBits(ssize_t n) { return n < 64 ? (uint64_t{1} << n) - 1 : ~uint64_t{0}; }

/// Returns the highest bit of each byte; the first byte gives the lowest bit of the result.
template <class D> HWY_INLINE uint64_t HighBits(D, hn::Vec<D> v) {
  const hn::RebindToSigned<D> di;
  uint64_t bits = 0;
  hn::StoreMaskBits(di, hn::Lt(hn::BitCast(di, v), hn::Zero(di)), reinterpret_cast<uint8_t*>(&bits));
  return bits;
}
template <class D> HWY_INLINE uint64_t BitsOf(D, hn::Mask<D> mask) {
  return HighBits(D(), hn::VecFromMask(D(), mask));
}

template <class D> HWY_INLINE hn::Mask<D> MaskOf(D d, uint64_t bits) {
  return hn::LoadMaskBits(d, reinterpret_cast<const uint8_t*>(&bits));
}

template <class D> HWY_INLINE hn::Vec<D> Broadcast(D d, uint8_t x) {
  return hn::Load(d, kBroadcastBytes.rows[x]);
}

// There are no shifts of bytes: these shift 16-bit units. `kept` is the mask of the bits that stay.
template <int kBits, class D> HWY_INLINE hn::Vec<D> Left(D d, hn::Vec<D> v, uint8_t kept) {
  return hn::And(hn::BitCast(d, hn::ShiftLeft<kBits>(hn::BitCast(ToUnits<D>(), v))), Broadcast(d, kept));
}
template <int kBits, class D> HWY_INLINE hn::Vec<D> Right(D d, hn::Vec<D> v, uint8_t kept) {
  return hn::And(hn::BitCast(d, hn::ShiftRight<kBits>(hn::BitCast(ToUnits<D>(), v))), Broadcast(d, kept));
}

template <class D> HWY_INLINE hn::Mask<D> IsEqual(D d, hn::Vec<D> v, uint8_t x) {
  return hn::Eq(v, Broadcast(d, x));
}
template <class D> HWY_INLINE hn::Mask<D> IsAtLeast(D d, hn::Vec<D> v, uint8_t x) {
  return hn::Eq(hn::Max(v, Broadcast(d, x)), v);
}
/// Which bytes are in [80, x), in hexadecimal; 0 stands for 100.
template <class D> HWY_INLINE hn::Mask<D> IsFrom80Below(D d, hn::Vec<D> v, uint8_t x) {
  const hn::RebindToSigned<D> di;
  return hn::RebindMask(d, hn::Lt(hn::BitCast(di, v), hn::BitCast(di, Broadcast(d, x))));
}
template <class D> HWY_INLINE hn::Mask<D> IsNonAscii(D d, hn::Vec<D> v) { return IsFrom80Below(d, v, 0); }

/// Returns yes where the mask is set, no elsewhere. If plain char is unsigned, g++ 12 miscompiles a blend of
/// bytes: it compares the mask with 0 as char, and never blends.
template <class M, class V> HWY_INLINE V Select(M mask, V yes, V no) {
#if defined(__CHAR_UNSIGNED__) && HWY_ARCH_X86
  return hn::Or(hn::IfThenElseZero(mask, yes), hn::IfThenZeroElse(mask, no));
#else
  return hn::IfThenElse(mask, yes, no);
#endif
}

/// The k-th 16 bytes of a vector.
template <int k, class D> HWY_INLINE hn::Vec<Narrow> SixteenBytes(D, hn::Vec<D> v) {
  if constexpr (kLanes<D> == 16)
    return v;
  else if constexpr (k == 0)
    return hn::LowerHalf(hn::Half<D>(), v);
  else
    return hn::UpperHalf(hn::Half<D>(), v);
}

/// Returns the vector that begins at the n-th byte of v, if next follows v.
template <int n, class D> HWY_INLINE hn::Vec<D> Window(D d, hn::Vec<D> v, hn::Vec<D> next) {
  if constexpr (n == 0)
    return v;
  else if constexpr (kLanes<D> == 16)
    return hn::CombineShiftRightBytes<n>(d, next, v);
  else if constexpr (n < 16)
    return hn::CombineShiftRightBytes<n>(d, hn::ConcatLowerUpper(d, next, v), v);
  else
    return hn::CombineShiftRightBytes<n - 16>(d, next, hn::ConcatLowerUpper(d, next, v));
}

template <class Unit> HWY_INLINE const uint8_t* BytesOf(const Unit* p) {
  return reinterpret_cast<const uint8_t*>(p);
}
template <class Unit> HWY_INLINE uint8_t* BytesOf(Unit* p) { return reinterpret_cast<uint8_t*>(p); }

template <class Word> HWY_INLINE uint64_t LoadWord(const uint8_t* p) {
  Word word;
  std::memcpy(&word, p, sizeof(word));
  return word;
}

/// Loads the given number of units, at most 16 bytes of them, followed by zeros.
template <class Unit> HWY_INLINE hn::Vec<Narrow> LoadPart(const Unit* from, ssize_t units) {
  const hn::Repartition<uint64_t, Narrow> d;
  const uint8_t* const p = BytesOf(from);
  const ssize_t bytes = units * ssize_t(sizeof(Unit)), n = bytes < 16 ? bytes : 16;
  uint64_t low = 0, high = 0;
  if (n >= 8) {
    low = LoadWord<uint64_t>(p);
    // Two shifts, by 64 bits in all if n is 8.
    high = LoadWord<uint64_t>(p + n - 8) >> 4 * (16 - n) >> 4 * (16 - n);
  } else if (n >= 4) {
    low = LoadWord<uint32_t>(p) | LoadWord<uint32_t>(p + n - 4) << 8 * (n - 4);
  } else if (n > 0) {
    low = p[0] | uint64_t{p[n / 2]} << 8 * (n / 2) | uint64_t{p[n - 1]} << 8 * (n - 1);
  }
  return hn::BitCast(Narrow(), hn::InterleaveLower(hn::Set(d, low), hn::Set(d, high)));
}

/// Stores what the shuffle for a mask keeps of 16 bytes: kLeast of them, and kEach for each of the mask's
/// bits. All 16 bytes at out are written. The mask is in bits 4 to 11 of mask16, where it is the offset of
/// its row. Returns the end of what is kept.
template <int kLeast, int kEach>
HWY_INLINE uint8_t* StoreKept(hn::Vec<Narrow> v, const Shuffles& shuffles, uint64_t mask16, uint8_t* out) {
  const Narrow d;
  hn::StoreU(hn::TableLookupBytes(v, hn::Load(d, &shuffles.rows[0][0] + (mask16 & 0xFF0))), d, out);
  return out + kLeast + kEach * Count(mask16 & 0xFF0);
}

/// Stores what the shuffles keep of the lower 16 bytes of every vector, then of the upper 16 bytes of every
/// vector. StoreKept() takes the masks as they are for the lower bytes, from their 16th bit on for the upper.
template <int kLeast, int kEach, class D, std::size_t n>
HWY_INLINE uint8_t* StoreHalves(D d, const hn::Vec<D> (&vectors)[n], const Shuffles& shuffles,
                                const uint64_t (&masks)[n], uint8_t* out) {
  for (std::size_t i = 0; i < n; ++i)
    out = StoreKept<kLeast, kEach>(SixteenBytes<0>(d, vectors[i]), shuffles, masks[i], out);
  if constexpr (16 < kLanes<D>)
    for (std::size_t i = 0; i < n; ++i)
      out = StoreKept<kLeast, kEach>(SixteenBytes<1>(d, vectors[i]), shuffles, masks[i] >> 16, out);
  return out;
}

/// Stores what the mask keeps of positions of two bytes each, the first from even, the second from odd.
template <int kLeast, int kEach, class D>
HWY_INLINE uint8_t* StorePairs(D d, hn::Vec<D> even, hn::Vec<D> odd, const Shuffles& shuffles, uint64_t mask,
                               uint8_t* out) {
  const auto lower = hn::InterleaveLower(d, even, odd), upper = hn::InterleaveUpper(d, even, odd);
  out = StoreKept<kLeast, kEach>(SixteenBytes<0>(d, lower), shuffles, mask << 4, out);
  out = StoreKept<kLeast, kEach>(SixteenBytes<0>(d, upper), shuffles, mask >> 4, out);
  if constexpr (16 < kLanes<D>) {
    out = StoreKept<kLeast, kEach>(SixteenBytes<1>(d, lower), shuffles, mask >> 12, out);
    out = StoreKept<kLeast, kEach>(SixteenBytes<1>(d, upper), shuffles, mask >> 20, out);
  }
  return out;
}

// A conversion, whatever its direction

/// How much of a block was converted, in units of the source and of the result; 0 and 0 if it isn't
/// well-formed.
struct Converted {
  ssize_t in, out;
};

/// How much of a block was converted, and how many U+FFFD that took.
struct Replaced {
  Converted converted;
  ssize_t replacements;
};

/// A conversion under way. A Block has, besides the functions called here:
/// - kUnits: how many units of the source it has,
/// - kMaxStored: the most units that its Convert() writes from out on, those past the result included.
///   Before out it rewrites only what the block's first units gave.
template <class In> struct Conversion {
  using Out = OtherUnit<In>;
  const In* p;
  const In* end;
  Out* out;
  Out* outEnd;

  HWY_INLINE Progress<In> At(Stop stop) const { return {p, out, stop}; }

  /// Converts the units [from, to) of a block. p points at the from-th; those before it have been converted.
  /// Returns kEnd if nothing stops the conversion here: it then goes on at p, which is before the to-th unit
  /// if the block's end cuts a code point off.
  template <class Block> HWY_INLINE Stop Convert(const Block& block, ssize_t from, ssize_t to) {
    constexpr ssize_t kMaxStoredBytes = Block::kMaxStored * ssize_t(sizeof(Out));
    // ASCII up to the block's end writes nothing past the result.
    const ssize_t room = to == Block::kUnits && block.IsAscii() ? to - from : Block::kMaxStored;
    if (outEnd - out >= room)
      return Accept(block.Convert(from, to, BytesOf(out)));
    uint8_t copy[std::size_t(2 * kMaxStoredBytes)];
    const Converted n = block.Convert(from, to, copy + kMaxStoredBytes);
    if (n.out > outEnd - out)
      return Stop::kNoRoom;
    std::memcpy(out, copy + kMaxStoredBytes, std::size_t(n.out) * sizeof(Out));
    return Accept(n);
  }

  HWY_INLINE Stop Accept(const Converted& n) {
    p += n.in, out += n.out;
    return n.in == 0 ? Stop::kMalformed : Stop::kEnd;
  }

  /// Converts a text of at least one block.
  template <class Block> HWY_INLINE Stop ConvertAll() {
    constexpr ssize_t kUnits = Block::kUnits;
    Stop stop = Stop::kEnd;
    while (stop == Stop::kEnd && end - p >= kUnits && outEnd - out >= Block::kMaxStored)
      stop = Accept(Block::Load(p).Convert(0, kUnits, BytesOf(out)));
    while (stop == Stop::kEnd && p != end) { // near the end of the source or of the room
      const ssize_t from = end - p < kUnits ? kUnits - (end - p) : 0;
      stop = Convert(Block::Load(p - from), from, kUnits);
    }
    return stop;
  }

  /// Converts blocks, with U+FFFD where they are malformed, up to one that is well-formed.
  template <class Block> HWY_INLINE void Replace(ssize_t& replacements) {
    while (end - p >= Block::kUnits && outEnd - out >= Block::kMaxStored) {
      const Replaced n = Block::Load(p).Replace(BytesOf(out));
      if (n.replacements == 0)
        return;
      p += n.converted.in, out += n.converted.out, replacements += n.replacements;
    }
  }

  /// Converts a text that is shorter than a block. A code point that its end cuts off is malformed, since
  /// zeros follow it.
  template <class Block> HWY_INLINE Stop ConvertShort() {
    const ssize_t n = end - p;
    return n == 0 ? Stop::kEnd : Convert(Block::Load(p, n), 0, n);
  }
};

template <class Block, class In>
Progress<In> ReplaceByBlocks(const In* p, const In* end, OtherUnit<In>* out, OtherUnit<In>* outEnd,
                             ssize_t& replacements) {
  Conversion<In> text{p, end, out, outEnd};
  text.template Replace<Block>(replacements);
  return text.At(Stop::kMalformed);
}

// UTF-8 to UTF-16

/// The low and the high bytes of UTF-16 units.
template <class D> struct Planes { hn::Vec<D> low, high; };

/// The units of the code points that would begin with the bytes of a, if b and c hold the bytes one and two
/// places further on.
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
    // The bits from the 16th on, less 1, as the high surrogate has them.
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
/// They alone tell where the next block begins, long before the masks do.
HWY_INLINE ssize_t CutOff(const uint8_t* end) {
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

  /// Returns the positions of lead bytes that the next byte may not follow: the sequence would be overlong, a
  /// surrogate, or above U+10FFFF.
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
    const ssize_t stop = to == kUnits ? kUnits - CutOff(p + kUnits) : to;
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
    // The last byte may begin a sequence if it is in [C2, F5). Where it can't, the next block's place is
    // known without waiting for CutOff(), which takes twice as long as all else here.
    if (allContinuations == 0 && static_cast<uint8_t>(p[kUnits - 1] - 0xC2) >= 0xF5 - 0xC2) {
      StoreLoneBytes(out);
      return {{kUnits, kUnits}, Count(allNonAscii)};
    }
    const ssize_t stop = kUnits - CutOff(p + kUnits);
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

// UTF-16 to UTF-8

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
  /// Returns whether the block is ASCII, from the units as loaded: ASCII then needs no high bytes.
  HWY_INLINE bool IsAscii() const {
    const ToUnits<D> du;
    return hn::AllTrue(du, hn::Eq(hn::And(hn::BitCast(du, any), hn::Set(du, 0xFF80)), hn::Zero(du)));
  }
  HWY_INLINE hn::Vec<D> ThreeBytes() const { return hn::SaturatedAdd(high, Broadcast(d, 0x78)); }
  /// Returns the units whose high byte has the value kind in the bits of mask.
  HWY_INLINE hn::Mask<D> Is(uint8_t kind, uint8_t mask) const {
    return IsEqual(d, hn::And(high, Broadcast(d, mask)), kind);
  }
  /// Returns the bits of each unit from the sixth on, masked by kept.
  HWY_INLINE hn::Vec<D> UpperBits(uint8_t kept) const {
    return hn::Or(Left<2>(d, high, kept & 0xFC), Right<6>(d, low, 0x03));
  }

  /// Stores a block without units from 800 on. Returns the end of its bytes.
  HWY_INLINE uint8_t* StoreTwo(uint64_t two, uint8_t* out) const {
    const auto lead = hn::Or(UpperBits(0x1F), Broadcast(d, 0xC0));
    const auto first = Select(IsNonAscii(d, NonAscii()), lead, low);
    const auto last = hn::Or(hn::And(low, Broadcast(d, 0x3F)), Broadcast(d, 0x80));
    return StorePairs<8, 1>(d, first, last, kKeepTwoBytes, two, out);
  }

  /// Stores any block. Returns the end of its bytes.
  template <bool kHasSurrogates> HWY_INLINE uint8_t* StoreThree(const UnitMasks& masks, uint8_t* out) const {
    const auto marker = Broadcast(d, 0x80), lead3 = hn::Or(Right<4>(d, high, 0x0F), Broadcast(d, 0xE0));
    auto first = Select(IsNonAscii(d, ThreeBytes()), lead3, hn::Or(UpperBits(0x1F), Broadcast(d, 0xC0)));
    first = Select(IsNonAscii(d, NonAscii()), first, low);
    auto middle = hn::Or(UpperBits(0x3F), marker), last = hn::Or(hn::And(low, Broadcast(d, 0x3F)), marker);
    if constexpr (kHasSurrogates) {
      // A high surrogate gives the first three bytes, the third with bits of the low surrogate. The low
      // surrogate gives the last byte.
      const auto isHigh = Is(0xD8, 0xFC), isLow = Is(0xDC, 0xFC);
      const auto upper = hn::Add(UpperBits(0x0F), Broadcast(d, 1)); // the bits from the 16th on
      const auto lead4 = hn::Or(Right<2>(d, upper, 0x07), Broadcast(d, 0xF0));
      first = Select(isLow, last, Select(isHigh, lead4, first));
      const auto second = hn::Or(Left<4>(d, upper, 0x30), Right<2>(d, low, 0x0F));
      middle = Select(isHigh, hn::Or(second, marker), middle);
      const auto third = hn::Or(Left<4>(d, low, 0x30),
                                hn::And(Window<1>(d, UpperBits(0x0F), hn::Zero(d)), Broadcast(d, 0x0F)));
      last = Select(isHigh, hn::Or(third, marker), last);
    }
    // Four bytes for each unit: first, first, middle, last. The masks of even and of odd groups of four units
    // are kept apart, so that both masks of a group stand side by side.
    const ToUnits<D> du;
    const auto leads0 = hn::BitCast(du, hn::InterleaveLower(d, first, first));
    const auto leads1 = hn::BitCast(du, hn::InterleaveUpper(d, first, first));
    const auto rests0 = hn::BitCast(du, hn::InterleaveLower(d, middle, last));
    const auto rests1 = hn::BitCast(du, hn::InterleaveUpper(d, middle, last));
    const uint64_t even = (masks.two & 0x0F0F0F0F) << 4 | (masks.three & 0x0F0F0F0F) << 8;
    const uint64_t odd = (masks.two & 0xF0F0F0F0) | (masks.three & 0xF0F0F0F0) << 4;
    return StoreHalves<4, 1>(d,
                             {hn::BitCast(d, hn::InterleaveLower(du, leads0, rests0)),
                              hn::BitCast(d, hn::InterleaveUpper(du, leads0, rests0)),
                              hn::BitCast(d, hn::InterleaveLower(du, leads1, rests1)),
                              hn::BitCast(d, hn::InterleaveUpper(du, leads1, rests1))},
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

// ASCII to UTF-16

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
