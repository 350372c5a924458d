// The conversions and searches in wide instructions: a table of functions for each instruction set.
//
// They are written once, in the vocabulary of Google Highway, and compiled once for each instruction set
// (Kernels.cpp). Everything has a scalar path with the same results, for processors that have none of these
// instruction sets.

#pragma once

#include <utils/VectorOfByte.h>

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
  int64 units; ///< in the other encoding, which in 32 bits may be more than fit in memory
};

/// How far a text was measured, and what that part comes to.
template <class T> struct Measured {
  const T* p;
  Lengths lengths;
};

/// What one instruction set offers for text of one width. The conversions read nothing outside [p, end) and
/// write nothing outside [out, outEnd), but may write more of it than they report.
template <class T> struct UnitKernels {
  using Out = OtherUnit<T>;
  Progress<T> (*convert)(const T* p, const T* end, Out* out, Out* outEnd);
  /// Goes on from malformed text by blocks, with U+FFFD for each maximal subpart, and adds how many there
  /// were. It stops before a well-formed block, and where text or room is short of a block, which may be at
  /// once.
  Progress<T> (*replace)(const T* p, const T* end, Out* out, Out* outEnd, ssize_t& replacements);
  /// Goes on up to a place, where a sequence begins, before which the text is well-formed, and which is the
  /// end or not far before malformed text.
  const T* (*skip)(const T* p, const T* end);
  /// Goes on as far, and measures.
  Measured<T> (*measure)(const T* p, const T* end);
  SearchKernels<T> searches;
};

/// What one instruction set offers.
struct Kernels : UnitKernels<char8>, UnitKernels<char16> {
  const char* name;
  /// As Utf16FromAscii(), for the first of n units; how many they are. It leaves less than a vector.
  ssize_t (*utf16FromAscii)(const char8* src, ssize_t n, char16* out);
};

// The tables of the conversions, once for all instruction sets. They are defined in a file of their own: g++
// builds a vector whose value it sees anew each time it is used, with three instructions in the loop, where a
// load is part of the instruction that uses it.

/// A byte shuffle for each mask of positions: it drops positions, and moves together what it keeps.
struct alignas(64) Shuffles {
  uint8_t rows[256][16];
};
/// For 8 positions of two bytes: keeps those whose bit is set.
extern const Shuffles kKeepUnits;
/// For 8 positions of two bytes: keeps the first byte of each, and the second of those whose bit is set.
extern const Shuffles kKeepTwoBytes;
/// For 4 positions of four bytes, the second of them unused: keeps the first byte of each, the last of those
/// whose bit is set in the lower half of the mask, and the third of those whose bit is set in the upper half.
extern const Shuffles kKeepThreeBytes;
/// For 8 bytes, and the 3 bytes of U+FFFD behind them, which take the place of those whose bit is set. The
/// rows of more than four bits are cut off.
extern const Shuffles kReplaceUnits;

/// What can be wrong with two bytes that follow each other, a bit for each fault: those that the nibbles of
/// the first and the high nibble of the second have in common. The highest bit stands for two continuation
/// bytes, which are a fault where nothing asks for them.
struct alignas(16) PairFaults {
  uint8_t firstHigh[16], firstLow[16], secondHigh[16];
};
extern const PairFaults kPairFaults;

/// Each byte, as often as the widest vector has bytes.
struct alignas(64) Repeats {
  uint8_t rows[256][32];
};
extern const Repeats kRepeats;

/// The k-th best kernels that this processor has, counted from 0; null if there are fewer. It asks the
/// processor each time: there is no state to initialise, so that it also works before main() and from any
/// thread.
const Kernels* KernelsAt(int k);

/// The best kernels that this processor has, or null. About 1 ns.
inline const Kernels* BestKernels() { return KernelsAt(0); }

/// The scalar path of the searches.
template <class T> const SearchKernels<T>& ScalarSearches();

} // namespace mirel::detail
