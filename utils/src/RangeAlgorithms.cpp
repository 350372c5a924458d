// The searches and comparisons for pointers to code units.
//
// A loop that leaves at the first hit isn't vectorised by most compilers. These look at a block of fixed size
// at a time and only ask whether there is a hit in it, without leaving early; that every compiler turns into
// a few wide instructions. What is near the start of a range, and the block that has the hit, are left to
// loops that say where it is, and are quicker where it is close: by single units, for small sets by words.
//
// Three things here look as if they could be simplified, and are measured: each costs a factor of five or
// more. The loops marked noinline one compiler would otherwise merge with the loop around them, and then not
// use wide instructions. Collected bits become a bool by a cast, because for a comparison with 0 another
// would collect them as ints. Marks that might lie in the text they are made from are set one by one at -O2.

#include <utils/VectorOfByte.h>

#include <type_traits>

#include "Words.h"

namespace mirel {

namespace {

/// Units in a block. Large ones go through the bulk of a text, small ones through what is left at its end.
/// Loops of fewer rounds are unrolled by compilers before they see that wide instructions would do.
constexpr ssize_t kSmall = 32;
template <class T> constexpr ssize_t kLarge = 128 / ssize_t(sizeof(T));

/// So many units are looked at before the first block: most hits in practice are that close.
constexpr ssize_t kNear = 16;

/// All bits where a unit equals v, as wide as the unit: what a wide comparison yields, without a conversion.
template <class T> T Mask(bool equal) { return equal ? T(-1) : T(0); }

/// Whether one of n units is v.
template <ssize_t n, class T> bool Has(const T* p, T v) {
  T any = 0;
  for (ssize_t k = 0; k < n; ++k)
    any = T(any | Mask<T>(p[k] == v));
  return static_cast<bool>(any);
}

/// Whether there is a k below n with first at p[k] and last at q[k].
template <ssize_t n, class T> [[gnu::noinline]] bool HasBoth(const T* p, T first, const T* q, T last) {
  T any = 0;
  for (ssize_t k = 0; k < n; ++k)
    any = T(any | T((p[k] == first) & (q[k] == last)));
  return static_cast<bool>(any);
}

/// Whether there is one with middle at r[k] besides.
template <ssize_t n, class T>
[[gnu::noinline]] bool HasThree(const T* p, T first, const T* q, T last, const T* r, T middle) {
  T any = 0;
  for (ssize_t k = 0; k < n; ++k)
    any = T(any | T((p[k] == first) & (q[k] == last) & (r[k] == middle)));
  return static_cast<bool>(any);
}

/// Whether one of n units is in the set.
template <ssize_t n, class T> bool HasAny(const T* p, const T* y1, const T* y2) {
  for (; y1 != y2; ++y1)
    if (Has<n>(p, *y1))
      return true;
  return false;
}

/// Marks the places among n that hold v.
template <ssize_t n, class T> [[gnu::noinline]] void Mark(T* __restrict marks, const T* __restrict p, T v) {
  for (ssize_t k = 0; k < n; ++k)
    marks[k] = T(marks[k] | Mask<T>(p[k] == v));
}

/// Whether one of n units isn't in the set. After every few members it asks whether all units are found
/// already: in text most of them are among the first members of a set that is written with care.
template <ssize_t n, class T> bool HasOther(const T* p, const T* y1, const T* y2) {
  T marks[std::size_t(n)] = {};
  while (y1 != y2) {
    for (const T* const some = y2 - y1 < 8 ? y2 : y1 + 8; y1 != some; ++y1)
      Mark<n>(marks, p, *y1);
    T all = T(-1);
    for (ssize_t k = 0; k < n; ++k)
      all = T(all & marks[k]);
    if (static_cast<bool>(all))
      return false;
  }
  return true;
}

/// Goes forward over blocks in which hasHit says there is none.
template <class T, class F> const T* Skip(const T* p, const T* end, const F& hasHit) {
  constexpr std::integral_constant<ssize_t, kLarge<T>> large;
  constexpr std::integral_constant<ssize_t, kSmall> small;
  while (end - p >= large && !hasHit(p, large))
    p += large;
  while (end - p >= small && !hasHit(p, small))
    p += small;
  return p;
}

/// Goes back over blocks in which hasHit says there is none.
template <class T, class F> const T* SkipBack(const T* begin, const T* p, const F& hasHit) {
  constexpr std::integral_constant<ssize_t, kLarge<T>> large;
  constexpr std::integral_constant<ssize_t, kSmall> small;
  while (p - begin >= large && !hasHit(p - large, large))
    p -= large;
  while (p - begin >= small && !hasHit(p - small, small))
    p -= small;
  return p;
}

/// A forward search: the plain one near the start and from the block with the hit on.
template <class T, class Plain, class F>
const T* Forward(const T* x1, const T* x2, const Plain& plain, const F& hasHit) {
  const T* const far = x2 - x1 < kNear ? x2 : x1 + kNear;
  const T* const p = plain(x1, far);
  if (p != far)
    return p;
  return plain(Skip(far, x2, hasHit), x2);
}

/// A reverse search: plain returns its second argument when it finds nothing, as this does.
template <class T, class Plain, class F>
const T* Backward(const T* x1, const T* x2, const Plain& plain, const F& hasHit) {
  const T* const far = x2 - x1 < kNear ? x1 : x2 - kNear;
  const T* const p = plain(far, x2);
  if (p != x2)
    return p;
  const T* const end = SkipBack(x1, far, hasHit);
  const T* const q = plain(x1, end);
  return q == end ? x2 : q;
}

/// Whether the set has v in it. For bytes the C library is quicker, unless the set is tiny.
template <class T> bool IsIn(const T* y1, const T* y2, T v) {
  if (sizeof(T) == 1 && y2 - y1 > 4)
    return std::memchr(y1, v, std::size_t(y2 - y1)) != nullptr;
  return mirel::Find<const T*, T>(y1, y2, v) != y2;
}

/// The marks of those units of a word that are in the set, or of those that aren't.
template <class T> uint64_t MarkMembers(uint64_t word, const T* y1, const T* y2, bool isMember) {
  uint64_t marks = 0;
  for (; y1 != y2 && marks != kMarks<T>; ++y1)
    marks |= MarkEqual(word, *y1);
  return isMember ? marks : marks ^ kMarks<T>;
}

/// The largest set for which a search goes by words. A word is held against all of the set, a single unit
/// only until it is found, and for bytes that is done by the C library.
template <class T> constexpr ssize_t kSmallSet = sizeof(T) == 1 ? 20 : 32;

template <class T> bool IsByWords(const T* p, const T* end, const T* y1, const T* y2) {
  return end - p >= kWord<T> && y2 - y1 <= kSmallSet<T>;
}

/// The first or the last unit of [p, end) that is in the set, or isn't; end if there is none.
template <class T> const T* First(const T* p, const T* end, const T* y1, const T* y2, bool isMember) {
  if (IsByWords(p, end, y1, y2))
    for (const T* const last = end - kWord<T>;; p = last - p < kWord<T> ? last : p + kWord<T>) {
      if (const uint64_t marks = MarkMembers(LoadWord(p), y1, y2, isMember); marks != 0)
        return p + UnitsBeforeFirst<T>(marks);
      if (p == last)
        return end;
    }
  while (p != end && IsIn(y1, y2, *p) != isMember)
    ++p;
  return p;
}
template <class T> const T* Last(const T* p, const T* end, const T* y1, const T* y2, bool isMember) {
  if (IsByWords(p, end, y1, y2))
    for (const T* q = end - kWord<T>;; q = q - p < kWord<T> ? p : q - kWord<T>) {
      if (const uint64_t marks = MarkMembers(LoadWord(q), y1, y2, isMember); marks != 0)
        return q + UnitsBeforeLast<T>(marks);
      if (q == p)
        return end;
    }
  for (const T* q = end; q != p;)
    if (IsIn(y1, y2, *--q) == isMember)
      return q;
  return end;
}

/// A pattern of at least one unit.
template <class T> struct Pattern {
  Pattern(const T* y1, const T* y2)
      : begin(y1), last(y2 - y1 - 1), first(*y1), middle(y1[last / 2]), final(y1[last]) {}

  const T* begin;
  ssize_t last; ///< the index of the last unit
  T first, middle, final;

  /// Whether the pattern stands at p, where there is room for it.
  bool IsAt(const T* p) const { return *p == first && p[last] == final && IsEqual(begin, begin + last, p); }
  /// The first or the last place of [p, end) at which the pattern stands, or end.
  const T* First(const T* p, const T* end) const {
    while (p != end && !IsAt(p))
      ++p;
    return p;
  }
  const T* Last(const T* p, const T* end) const {
    for (const T* q = end; q != p;)
      if (IsAt(--q))
        return q;
    return end;
  }
  /// Whether a block of n places has one at which it may stand. Where the first unit is frequent, most blocks
  /// have one that fits with the last one, but few have one that fits with the middle too.
  template <ssize_t n> bool MayBeIn(const T* p) const {
    return HasBoth<n>(p, first, p + last, final) &&
           HasThree<n>(p, first, p + last, final, p + last / 2, middle);
  }
};

} // namespace

namespace detail {

template <class T> const T* ByBlock<T>::Find(const T* i1, const T* i2, T v) {
  if constexpr (sizeof(T) == 1) {
    const void* const p = i1 == i2 ? nullptr : std::memchr(i1, v, std::size_t(i2 - i1));
    return p ? static_cast<const T*>(p) : i2;
  } else {
    return Forward(
        i1, i2, [=](const T* p, const T* end) { return FindByFour(p, end, v); },
        [=](const T* p, auto n) { return Has<n>(p, v); });
  }
}

template <class T> const T* ByBlock<T>::FindLast(const T* i1, const T* i2, T v) {
  return Backward(
      i1, i2, [=](const T* p, const T* end) { return FindLastByFour(p, end, v); },
      [=](const T* p, auto n) { return Has<n>(p, v); });
}

template <class T> const T* ByBlock<T>::FindFirstOf(const T* x1, const T* x2, const T* y1, const T* y2) {
  return Forward(
      x1, x2, [=](const T* p, const T* end) { return First(p, end, y1, y2, true); },
      [=](const T* p, auto n) { return HasAny<n>(p, y1, y2); });
}

template <class T> const T* ByBlock<T>::FindFirstNotOf(const T* x1, const T* x2, const T* y1, const T* y2) {
  return Forward(
      x1, x2, [=](const T* p, const T* end) { return First(p, end, y1, y2, false); },
      [=](const T* p, auto n) { return HasOther<n>(p, y1, y2); });
}

template <class T> const T* ByBlock<T>::FindLastOf(const T* x1, const T* x2, const T* y1, const T* y2) {
  return Backward(
      x1, x2, [=](const T* p, const T* end) { return Last(p, end, y1, y2, true); },
      [=](const T* p, auto n) { return HasAny<n>(p, y1, y2); });
}

template <class T> const T* ByBlock<T>::FindLastNotOf(const T* x1, const T* x2, const T* y1, const T* y2) {
  return Backward(
      x1, x2, [=](const T* p, const T* end) { return Last(p, end, y1, y2, false); },
      [=](const T* p, auto n) { return HasOther<n>(p, y1, y2); });
}

template <class T>
const T* ByBlock<T>::FindFirstSubSequence(const T* x1, const T* x2, const T* y1, const T* y2) {
  if (x2 - x1 < y2 - y1)
    return x2;
  const Pattern<T> pattern(y1, y2);
  constexpr ssize_t large = kLarge<T>, small = kSmall;
  const T* const end = x2 - pattern.last; // behind the places where it has room
  const T* p = x1;
  if constexpr (sizeof(T) == 1) {
    // The C library looks for one byte faster than anything here, as long as it doesn't find it too often.
    for (ssize_t hits = 0; hits < 8 || p - x1 > 128 * hits; ++hits) {
      p = Find(p, end, pattern.first);
      if (p == end)
        return x2;
      if (pattern.IsAt(p))
        return p;
      ++p;
    }
  }
  for (;;) {
    const T* blockEnd = end;
    if (end - p >= large) {
      blockEnd = p + large;
      if (!pattern.template MayBeIn<large>(p)) {
        p = blockEnd;
        continue;
      }
    }
    for (; blockEnd - p >= small; p += small)
      if (pattern.template MayBeIn<small>(p))
        if (const T* const q = pattern.First(p, p + small); q != p + small)
          return q;
    if (blockEnd == end) {
      const T* const q = pattern.First(p, end);
      return q == end ? x2 : q;
    }
  }
}

template <class T>
const T* ByBlock<T>::FindLastSubSequence(const T* x1, const T* x2, const T* y1, const T* y2) {
  if (x2 - x1 < y2 - y1)
    return x2;
  const Pattern<T> pattern(y1, y2);
  constexpr ssize_t large = kLarge<T>, small = kSmall;
  for (const T* p = x2 - pattern.last;;) {
    const T* blockBegin = x1;
    if (p - x1 >= large) {
      blockBegin = p - large;
      if (!pattern.template MayBeIn<large>(blockBegin)) {
        p = blockBegin;
        continue;
      }
    }
    for (; p - blockBegin >= small; p -= small)
      if (pattern.template MayBeIn<small>(p - small))
        if (const T* const q = pattern.Last(p - small, p); q != p)
          return q;
    if (blockBegin == x1) {
      const T* const q = pattern.Last(x1, p);
      return q == p ? x2 : q;
    }
  }
}

template struct ByBlock<char8>;
template struct ByBlock<char16>;

int CompareByBlock(const char16* x1, const char16* x2, const char16* y1, const char16* y2) {
  // Equal stretches are told by their bytes, the one with the difference by its units.
  const ssize_t len = x2 - x1 < y2 - y1 ? x2 - x1 : y2 - y1;
  const char16* const end = x1 + len;
  const char16* p = x1;
  const char16* q = y1;
  const auto skip = [&](ssize_t n) {
    while (end - p >= n && IsEqual(p, p + n, q))
      p += n, q += n;
  };
  if (*p == *q) {
    skip(256);
    skip(16);
  }
  return LexicographicalCompareX<const char16*, const char16*>(p, x2, q, y2);
}

} // namespace detail

} // namespace mirel
