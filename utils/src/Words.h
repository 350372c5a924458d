// Several code units at once in an ordinary integer. A word is as many units as 64 bits hold, the first one
// in the lowest bits.

#pragma once

#include <cstring>
#include <limits>
#include <type_traits>

#include <utils/xchar.h>

namespace mirel {

/// The unit as what it counts for in text, where char may be signed.
template <class T> std::make_unsigned_t<T> Unit(T x) { return static_cast<std::make_unsigned_t<T>>(x); }

/// The number of units in a word.
template <class T> constexpr ssize_t kWord = ssize_t(sizeof(uint64_t) / sizeof(T));
template <class T> constexpr ssize_t kUnitBits = 8 * ssize_t(sizeof(T));

/// The word that has x in each unit.
template <class T> constexpr uint64_t InEach(unsigned x) {
  return x * (~uint64_t(0) / std::numeric_limits<std::make_unsigned_t<T>>::max());
}
/// The highest bit of each unit: the mark of a unit, where units are marked.
template <class T> constexpr uint64_t kMarks = InEach<T>(1u << (kUnitBits<T> - 1));

// Where memory has the lowest bits first too, one access does what the loops say; compilers don't see that.
constexpr bool kIsLowestFirst = __BYTE_ORDER__ == __ORDER_LITTLE_ENDIAN__;

/// Reads a word.
template <class T> uint64_t LoadWord(const T* p) {
  uint64_t word = 0;
  if constexpr (kIsLowestFirst)
    std::memcpy(&word, p, sizeof(word));
  else
    for (ssize_t k = 0; k < kWord<T>; ++k)
      word |= uint64_t(Unit(p[k])) << kUnitBits<T> * k;
  return word;
}

/// Writes the first n units of a word.
template <ssize_t n, class T> void StoreWord(uint64_t word, T* out) {
  if constexpr (kIsLowestFirst)
    std::memcpy(out, &word, std::size_t(n) * sizeof(T));
  else
    for (ssize_t k = 0; k < n; ++k)
      out[k] = static_cast<T>(word >> kUnitBits<T> * k);
}

/// The marks of the units that are x.
template <class T> uint64_t MarkEqual(uint64_t word, T x) {
  constexpr uint64_t low = ~kMarks<T>;
  const uint64_t difference = word ^ InEach<T>(Unit(x));
  return ~(((difference & low) + low) | difference | low);
}

// The next two count instead of branching, since it can't be foreseen which unit it is. The loop has always
// the same number of rounds.

/// How many units stand before the first one that has a bit in the word, which isn't 0.
template <class T> ssize_t UnitsBeforeFirst(uint64_t word) {
  const uint64_t lowBits = (word ^ (word - 1)) & InEach<T>(1); // of the units up to that one
  return ssize_t(lowBits * InEach<T>(1) >> (64 - kUnitBits<T>)) - 1;
}

/// How many units stand before the last one that is marked; one is.
template <class T> ssize_t UnitsBeforeLast(uint64_t marks) {
  for (ssize_t bits = kUnitBits<T>; bits < 64; bits *= 2)
    marks |= marks >> bits;
  return ssize_t((marks >> (kUnitBits<T> - 1)) * InEach<T>(1) >> (64 - kUnitBits<T>)) - 1;
}

} // namespace mirel
