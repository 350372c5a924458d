// The conversions and searches in SIMD instructions: a table of functions for each instruction set.
//
// They are written once, in the vocabulary of Google Highway, and compiled once for each instruction set
// (Kernels.cpp). Everything has a scalar path with the same results, for processors that have none of these
// instruction sets.

#pragma once

#include <cstdint>
#include <type_traits>

#include <utils/RangeAlgorithms.h>
#include <utils/xchar.h>

namespace mirel::detail {

/// Why a conversion stopped.
enum class Stop {
  kEnd,       ///< it has reached the end of the source
  kMalformed, ///< what follows is malformed or cut off, as far as the kernel can tell
  kNoRoom     ///< what follows may not fit in the destination
};

template <class T> using OtherUnit = std::conditional_t<sizeof(T) == 1, char16, char8>;

/// How far a conversion got.
template <class T> struct Progress {
  const T* p;        ///< the first unit that isn't converted, where a code point begins
  OtherUnit<T>* out; ///< past the end of the result
  Stop stop;
};

/// The lengths of a text.
struct Lengths {
  ssize_t codePoints;
  int64 units; ///< in the other encoding; in a 32-bit program they may not fit in memory
};

/// How far a text was measured, and the lengths of that part.
template <class T> struct Measured {
  const T* p;
  Lengths lengths;
};

/// What one instruction set offers for text of one width. The conversions read nothing outside [p, end) and
/// write nothing outside [out, outEnd), but may write more of it than they report. skip() and measure() take
/// no text of fewer than kMinUnitsForKernels units: for UTF-16 they read a whole block that ends
/// with the text.
template <class T> struct UnitKernels {
  using Out = OtherUnit<T>;
  Progress<T> (*convert)(const T* p, const T* end, Out* out, Out* outEnd);
  /// Converts blocks from malformed text on, with U+FFFD for each maximal subpart, and adds how many there
  /// were to replacements. It stops before a well-formed block, or when less than a block of text or room is
  /// left, so it may convert nothing. It always reports Stop::kMalformed.
  Progress<T> (*replace)(const T* p, const T* end, Out* out, Out* outEnd, ssize_t& replacements);
  /// Returns the end of a well-formed prefix that cuts no sequence off: the end of the text, or a place not
  /// far before malformed text.
  const T* (*skip)(const T* p, const T* end);
  /// Measures the prefix that skip() returns the end of.
  Measured<T> (*measure)(const T* p, const T* end);
  SearchKernels<T> searches;
};

/// What one instruction set offers for text of both widths.
struct Kernels : UnitKernels<char8>, UnitKernels<char16> {
  const char* name;
  /// Converts as many of the n units at src as fill whole vectors, as Utf16FromAscii() does. Returns how many
  /// these are; fewer than 16 are left.
  ssize_t (*utf16FromAscii)(const char8* src, ssize_t n, char16* out);
};

/// The fewest units for which a kernel that checks or counts pays: a shorter text is decoded one code point
/// at a time in the time that a kernel takes to copy it into a block. It can't be below 16: the kernels for
/// UTF-16 read a whole block that ends with the text. Conversions have no such limit.
constexpr ssize_t kMinUnitsForKernels = 24;

/// Once the scalar path decodes malformed text, it goes on until this many units in a row are well-formed:
/// where malformed sequences are dense, the kernels would be tried in vain.
constexpr ssize_t kWellFormedBeforeKernels = 64;

// The tables of the conversions, once for all instruction sets. They are defined in a file of their own, so
// that g++ doesn't see their values: it builds a vector of known value anew at each use, with three
// instructions in the loop, while a load is part of the instruction that uses it.

/// A byte shuffle for each mask of positions, which drops or replaces positions and leaves no gaps.
struct alignas(64) Shuffles {
  uint8_t rows[256][16];
};
/// For 8 positions of two bytes: keeps those whose bit is set.
extern const Shuffles kKeepUnits;
/// For 8 positions of two bytes: keeps the first byte of each, and the second of those whose bit is set.
extern const Shuffles kKeepTwoBytes;
/// For 4 positions of four bytes, of which the second byte is never kept: keeps the first byte of each
/// position, its last byte if its bit in the lower half of the mask is set, and its third byte if its bit in
/// the upper half is set.
extern const Shuffles kKeepThreeBytes;
/// For 8 bytes followed by the 3 bytes of U+FFFD: puts U+FFFD in place of the bytes whose bit is set. Rows of
/// masks with more than four bits set are cut off.
extern const Shuffles kReplaceUnits;

/// What can be wrong with two adjacent bytes, a bit for each kind of fault. Two bytes have a fault if both
/// nibbles of the first and the high nibble of the second have its bit. The highest bit stands for two
/// continuation bytes, which are a fault unless a lead byte requires them.
struct alignas(16) PairFaults {
  uint8_t firstHigh[16], firstLow[16], secondHigh[16];
};
extern const PairFaults kPairFaults;

/// Each value of a byte, broadcast to the widest vector.
struct alignas(64) BroadcastBytes {
  uint8_t rows[256][32];
};
extern const BroadcastBytes kBroadcastBytes;

/// Returns the k-th best kernels that this processor has, counted from 0; null if there are fewer. Each
/// call reads what the compiler's runtime has found out about the processor before the program's constructors
/// run. The library has no state to initialise, so this also works before main() and from any thread.
const Kernels* KernelsAt(int k);

/// Returns the best kernels that this processor has, or null, in about 1 ns.
inline const Kernels* BestKernels() { return KernelsAt(0); }

/// Returns the scalar path of the searches.
template <class T> const SearchKernels<T>& ScalarSearches();

} // namespace mirel::detail
