// The searches and comparisons for pointers to code units.
//
// A loop that leaves at the first hit isn't vectorised by compilers. These look at a block of fixed size at a
// time and only ask whether there is a hit in it, without leaving early; that every compiler turns into a few
// wide instructions. What is near the start of a range, and the block that has the hit, are left to the plain
// templates: they say where it is, and are quicker where it is close.

#include <utils/VectorOfByte.h>

#include <type_traits>

namespace mirel {

namespace {

/// Bytes in a block. Large ones go through the bulk of a text, small ones through what is left at its end.
constexpr ssize_t kLarge = 128;
constexpr ssize_t kSmall = 16;

/// So many units are looked at one by one before the first block: most hits in practice are that close.
constexpr ssize_t kNear = 16;

template <ssize_t Bytes, class T> constexpr ssize_t kUnits = Bytes / ssize_t(sizeof(T));

/// All bits where a unit equals v, as wide as the unit: what a wide comparison yields, without a conversion.
template <class T> T Mask(bool equal) { return equal ? T(-1) : T(0); }

/// Whether one of n units is v.
template <ssize_t n, class T> bool Has(const T* p, T v) {
  T any = 0;
  for (ssize_t k = 0; k < n; ++k)
    any = T(any | Mask<T>(p[k] == v));
  return any != 0;
}

/// Whether one of n places holds the first unit of a pattern, and the place last units behind it the last.
template <ssize_t n, class T> bool HasEnds(const T* p, T first, ssize_t last, T v) {
  T any = 0;
  for (ssize_t k = 0; k < n; ++k)
    any = T(any | (Mask<T>(p[k] == first) & Mask<T>(p[k + last] == v)));
  return any != 0;
}

/// Whether one of n units is in the set.
template <ssize_t n, class T> bool HasAny(const T* p, const T* y1, const T* y2) {
  for (; y1 != y2; ++y1)
    if (Has<n>(p, *y1))
      return true;
  return false;
}

/// Marks the places among n that hold v. Not inlined: merged with the loop over a set, one compiler turns the
/// two inside out, and is five times slower.
template <ssize_t n, class T> [[gnu::noinline]] void Mark(T* marks, const T* p, T v) {
  for (ssize_t k = 0; k < n; ++k)
    marks[k] = T(marks[k] | Mask<T>(p[k] == v));
}

/// Whether one of n units isn't in the set.
template <ssize_t n, class T> bool HasOther(const T* p, const T* y1, const T* y2) {
  T marks[std::size_t(n)] = {};
  for (; y1 != y2; ++y1)
    Mark<n>(marks, p, *y1);
  T all = T(-1);
  for (ssize_t k = 0; k < n; ++k)
    all = T(all & marks[k]);
  return all == 0;
}

/// Goes forward over blocks in which hasHit says there is none.
template <class T, class F> const T* Skip(const T* p, const T* end, const F& hasHit) {
  constexpr std::integral_constant<ssize_t, kUnits<kLarge, T>> large;
  constexpr std::integral_constant<ssize_t, kUnits<kSmall, T>> small;
  while (end - p >= large && !hasHit(p, large))
    p += large;
  while (end - p >= small && !hasHit(p, small))
    p += small;
  return p;
}

/// Goes back over blocks in which hasHit says there is none.
template <class T, class F> const T* SkipBack(const T* begin, const T* p, const F& hasHit) {
  constexpr std::integral_constant<ssize_t, kUnits<kLarge, T>> large;
  constexpr std::integral_constant<ssize_t, kUnits<kSmall, T>> small;
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
  if (p != far || far == x2)
    return p;
  return plain(Skip(far, x2, hasHit), x2);
}

/// A reverse search: plain returns its second argument when it finds nothing, as this does.
template <class T, class Plain, class F>
const T* Backward(const T* x1, const T* x2, const Plain& plain, const F& hasHit) {
  const T* const far = x2 - x1 < kNear ? x1 : x2 - kNear;
  const T* const p = plain(far, x2);
  if (p != x2 || far == x1)
    return p;
  const T* const end = SkipBack(x1, far, hasHit);
  const T* const q = plain(x1, end);
  return q == end ? x2 : q;
}

template <class T> const T* FindUnit(const T* i1, const T* i2, T v) {
  return Forward(
      i1, i2, [=](const T* p, const T* end) { return Find<const T*, T>(p, end, v); },
      [=](const T* p, auto n) { return Has<n>(p, v); });
}

template <class T> const T* FindLastUnit(const T* i1, const T* i2, T v) {
  return Backward(
      i1, i2, [=](const T* p, const T* end) { return FindLast<const T*, T>(p, end, v); },
      [=](const T* p, auto n) { return Has<n>(p, v); });
}

template <class T> const T* FindFirstInSet(const T* x1, const T* x2, const T* y1, const T* y2) {
  return Forward(
      x1, x2, [=](const T* p, const T* end) { return FindFirstOf<const T*, const T*>(p, end, y1, y2); },
      [=](const T* p, auto n) { return HasAny<n>(p, y1, y2); });
}

template <class T> const T* FindFirstNotInSet(const T* x1, const T* x2, const T* y1, const T* y2) {
  return Forward(
      x1, x2, [=](const T* p, const T* end) { return FindFirstNotOf<const T*, const T*>(p, end, y1, y2); },
      [=](const T* p, auto n) { return HasOther<n>(p, y1, y2); });
}

template <class T> const T* FindLastInSet(const T* x1, const T* x2, const T* y1, const T* y2) {
  return Backward(
      x1, x2, [=](const T* p, const T* end) { return FindLastOf<const T*, const T*>(p, end, y1, y2); },
      [=](const T* p, auto n) { return HasAny<n>(p, y1, y2); });
}

template <class T> const T* FindLastNotInSet(const T* x1, const T* x2, const T* y1, const T* y2) {
  return Backward(
      x1, x2, [=](const T* p, const T* end) { return FindLastNotOf<const T*, const T*>(p, end, y1, y2); },
      [=](const T* p, auto n) { return HasOther<n>(p, y1, y2); });
}

/// A pattern of at least one unit.
template <class T> struct Pattern {
  const T* begin;
  ssize_t last; ///< the index of the last unit

  /// Whether the pattern stands at p, where there is room for it.
  bool IsAt(const T* p) const {
    return *p == *begin && p[last] == begin[last] && IsEqual(begin, begin + last, p);
  }
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
  /// Whether a block of n places has one at which it may stand.
  template <class N> bool MayBeIn(const T* p, N n) const { return HasEnds<n>(p, *begin, last, begin[last]); }
};

template <class T> const T* FindFirstRun(const T* x1, const T* x2, const T* y1, const T* y2) {
  const Pattern<T> pattern{y1, y2 - y1 - 1};
  if (x2 - x1 <= pattern.last)
    return x2;
  const T* const end = x2 - pattern.last; // the places where it has room
  const T* p = x1;
  do { // a block may have a place that fits in its ends only
    p = Skip(p, end, [&](const T* q, auto n) { return pattern.MayBeIn(q, n); });
    const T* const blockEnd = end - p < kUnits<kSmall, T> ? end : p + kUnits<kSmall, T>;
    const T* const q = pattern.First(p, blockEnd);
    if (q != blockEnd)
      return q;
    p = blockEnd;
  } while (p != end);
  return x2;
}

template <class T> const T* FindLastRun(const T* x1, const T* x2, const T* y1, const T* y2) {
  const Pattern<T> pattern{y1, y2 - y1 - 1};
  if (x2 - x1 <= pattern.last)
    return x2;
  const T* p = x2 - pattern.last;
  do {
    p = SkipBack(x1, p, [&](const T* q, auto n) { return pattern.MayBeIn(q, n); });
    const T* const blockBegin = p - x1 < kUnits<kSmall, T> ? x1 : p - kUnits<kSmall, T>;
    const T* const q = pattern.Last(blockBegin, p);
    if (q != p)
      return q;
    p = blockBegin;
  } while (p != x1);
  return x2;
}

} // namespace

const char8* Find(const char8* i1, const char8* i2, const char8& v) {
  const void* const p =
      i1 == i2 ? nullptr : std::memchr(i1, static_cast<unsigned char>(v), std::size_t(i2 - i1));
  return p ? static_cast<const char8*>(p) : i2;
}
const char16* Find(const char16* i1, const char16* i2, const char16& v) { return FindUnit(i1, i2, v); }

const char8* FindLast(const char8* i1, const char8* i2, const char8& v) { return FindLastUnit(i1, i2, v); }
const char16* FindLast(const char16* i1, const char16* i2, const char16& v) {
  return FindLastUnit(i1, i2, v);
}

const char8* FindFirstSubSequence(const char8* x1, const char8* x2, const char8* y1, const char8* y2) {
  if (y1 == y2)
    return x1;
  // The C library looks for one byte faster than anything here, as long as it doesn't find it too often.
  const Pattern<char8> pattern{y1, y2 - y1 - 1};
  const char8* p = x1;
  for (ssize_t hits = 0; hits < 8 || p - x1 > 128 * hits; ++hits) {
    if (x2 - p <= pattern.last)
      return x2;
    const char8* const end = x2 - pattern.last;
    p = Find(p, end, *y1);
    if (p == end)
      return x2;
    if (pattern.IsAt(p))
      return p;
    ++p;
  }
  return FindFirstRun(p, x2, y1, y2);
}
const char16* FindFirstSubSequence(const char16* x1, const char16* x2, const char16* y1, const char16* y2) {
  return y1 == y2 ? x1 : FindFirstRun(x1, x2, y1, y2);
}

const char8* FindLastSubSequence(const char8* x1, const char8* x2, const char8* y1, const char8* y2) {
  return y1 == y2 ? x2 : FindLastRun(x1, x2, y1, y2);
}
const char16* FindLastSubSequence(const char16* x1, const char16* x2, const char16* y1, const char16* y2) {
  return y1 == y2 ? x2 : FindLastRun(x1, x2, y1, y2);
}

const char8* FindFirstOf(const char8* x1, const char8* x2, const char8* y1, const char8* y2) {
  return FindFirstInSet(x1, x2, y1, y2);
}
const char16* FindFirstOf(const char16* x1, const char16* x2, const char16* y1, const char16* y2) {
  return FindFirstInSet(x1, x2, y1, y2);
}

const char8* FindFirstNotOf(const char8* x1, const char8* x2, const char8* y1, const char8* y2) {
  return FindFirstNotInSet(x1, x2, y1, y2);
}
const char16* FindFirstNotOf(const char16* x1, const char16* x2, const char16* y1, const char16* y2) {
  return FindFirstNotInSet(x1, x2, y1, y2);
}

const char8* FindLastOf(const char8* x1, const char8* x2, const char8* y1, const char8* y2) {
  return FindLastInSet(x1, x2, y1, y2);
}
const char16* FindLastOf(const char16* x1, const char16* x2, const char16* y1, const char16* y2) {
  return FindLastInSet(x1, x2, y1, y2);
}

const char8* FindLastNotOf(const char8* x1, const char8* x2, const char8* y1, const char8* y2) {
  return FindLastNotInSet(x1, x2, y1, y2);
}
const char16* FindLastNotOf(const char16* x1, const char16* x2, const char16* y1, const char16* y2) {
  return FindLastNotInSet(x1, x2, y1, y2);
}

int LexicographicalCompareX(const char16* x1, const char16* x2, const char16* y1, const char16* y2) {
  // Equal stretches are told by their bytes, a stretch with a difference by its units. Most differences are
  // near.
  const ssize_t len = x2 - x1 < y2 - y1 ? x2 - x1 : y2 - y1;
  const char16* const end = x1 + len;
  const char16* p = x1;
  const char16* q = y1;
  const auto skip = [&](ssize_t n) {
    while (end - p >= n && IsEqual(p, p + n, q))
      p += n, q += n;
  };
  for (const char16* const near = end - p < 8 ? end : p + 8; p != near && *p == *q;)
    ++p, ++q;
  if (p - x1 == 8) {
    skip(256);
    skip(16);
  }
  return LexicographicalCompareX<const char16*, const char16*>(p, x2, q, y2);
}

} // namespace mirel
