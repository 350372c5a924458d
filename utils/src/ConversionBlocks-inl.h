// What the conversions of both directions share: bits and bytes of vectors, and the loop over the blocks of a
// text; compiled once for each instruction set by Kernels.cpp.
//
// A text is converted in blocks. For every position of a block the kernel computes what a code point that
// begins there would give, even where none begins. A byte shuffle from a table then drops the positions where
// none begins. In well-formed text, the only branch that depends on where code points begin is the one for
// blocks that begin with 20 three-byte sequences. Masks with one bit for each position tell whether the block
// is well-formed; one that isn't is left to the scalar path, which finds the malformed sequence. From there a
// lossy conversion goes on in blocks whose masks tell where a maximal subpart begins; there U+FFFD replaces
// what was computed. A block ends before a code point that its end would cut off, so no state passes from one
// block to the next. The last block ends where the text ends. It overlaps what has been converted, and may
// store that part again.
//
// Kernels.cpp undefines the guard after each instruction set.

#ifndef MIREL_CONVERSION_BLOCKS
#define MIREL_CONVERSION_BLOCKS

#include <cstddef>
#include <cstdint>
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
/// Returns which bytes are in [80, x), in hexadecimal; 0 stands for 100.
template <class D> HWY_INLINE hn::Mask<D> IsFrom80Below(D d, hn::Vec<D> v, uint8_t x) {
  const hn::RebindToSigned<D> di;
  return hn::RebindMask(d, hn::Lt(hn::BitCast(di, v), hn::BitCast(di, Broadcast(d, x))));
}
template <class D> HWY_INLINE hn::Mask<D> IsNonAscii(D d, hn::Vec<D> v) { return IsFrom80Below(d, v, 0); }

/// Returns `yes` where the mask is set, `no` elsewhere. If plain char is unsigned, g++ 12 miscompiles a blend
/// of bytes: it compares the mask with 0 as char, and never blends.
template <class M, class V> HWY_INLINE V Select(M mask, V yes, V no) {
#if defined(__CHAR_UNSIGNED__) && HWY_ARCH_X86
  return hn::Or(hn::IfThenElseZero(mask, yes), hn::IfThenZeroElse(mask, no));
#else
  return hn::IfThenElse(mask, yes, no);
#endif
}

/// Returns the k-th 16 bytes of a vector, k counted from 0.
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

template <class Integer> HWY_INLINE uint64_t LoadUnaligned(const uint8_t* p) {
  Integer x;
  std::memcpy(&x, p, sizeof(x));
  return x;
}

/// Loads the given number of units, at most 16 bytes of them, followed by zeros.
template <class Unit> HWY_INLINE hn::Vec<Narrow> LoadPart(const Unit* from, ssize_t units) {
  const hn::Repartition<uint64_t, Narrow> d;
  const uint8_t* const p = BytesOf(from);
  const ssize_t bytes = units * ssize_t(sizeof(Unit)), n = bytes < 16 ? bytes : 16;
  uint64_t low = 0, high = 0;
  if (n >= 8) {
    low = LoadUnaligned<uint64_t>(p);
    // Two shifts, since a single one by 64 bits, if n is 8, would be undefined.
    high = LoadUnaligned<uint64_t>(p + n - 8) >> 4 * (16 - n) >> 4 * (16 - n);
  } else if (n >= 4) {
    low = LoadUnaligned<uint32_t>(p) | LoadUnaligned<uint32_t>(p + n - 4) << 8 * (n - 4);
  } else if (n > 0) {
    low = p[0] | uint64_t{p[n / 2]} << 8 * (n / 2) | uint64_t{p[n - 1]} << 8 * (n - 1);
  }
  return hn::BitCast(Narrow(), hn::InterleaveLower(hn::Set(d, low), hn::Set(d, high)));
}

/// Stores what the shuffle for a mask keeps of 16 bytes: kLeast of them, and kEach for each bit set in the
/// mask. All 16 bytes at out are written. The mask is in bits 4 to 11 of mask16, where it is the offset of
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

} // namespace
} // namespace mirel::detail::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#endif
