/// @file
/// The search for a needle in a range of random-access iterators, in linear time for every input.
///
/// It knows iterators over integers, but neither text nor containers. It allocates nothing and can't fail.

#pragma once

#include <string> // has std::reverse_iterator without the streams that <iterator> brings along
#include <type_traits>

#include "xchar.h"

namespace mirel {

namespace detail {

/// Decides how long a search may compare the needle at each position. That is fast as long as most
/// comparisons fail within the first units, and takes quadratic time if they don't.
class Credit {
public:
  explicit Credit(ssize_t needleLength) : m_credit(needleLength / 2 + 64) {}

  /// Returns whether the search may go on, after a comparison that found equalUnits equal units and then a
  /// difference; passed is the number of positions searched so far.
  bool Allows(ssize_t equalUnits, ssize_t passed) {
    m_credit -= equalUnits / 4 + 8;
    return m_credit + 4 * int64(passed) >= 0;
  }

private:
  int64 m_credit; // 64 bits, since four for each position may exceed a 32-bit ssize_t
};

/// Counts the equal elements before the first difference of the n at x and the n at y; n if all are equal.
template <class It1, class It2> ssize_t EqualElements(It1 x, It2 y, ssize_t n) {
  ssize_t i = 0;
  while (i < n && UnitValue(x[i]) == UnitValue(y[i]))
    ++i;
  return i;
}

/// Two-way string matching, by Crochemore and Perrin (1991). The needle is cut in two. Its right part is
/// compared forwards; a mismatch there moves the needle until its right part begins past the mismatch. Then
/// the left part is compared backwards; a mismatch there moves the needle by its period if the needle is
/// periodic, otherwise by one more than the longer part.
template <class It> class TwoWay {
public:
  /// Prepares a needle of at least one element.
  TwoWay(It y1, It y2) : m_needle(y1), m_length(y2 - y1) {
    const Suffix less = MaximalSuffix([](const auto& a, const auto& b) { return a < b; });
    const Suffix greater = MaximalSuffix([](const auto& a, const auto& b) { return b < a; });
    const Suffix suffix = less.begin > greater.begin ? less : greater;
    m_cut = suffix.begin;
    m_isPeriodic = EqualElements(y1, y1 + suffix.period, m_cut) == m_cut;
    const ssize_t right = m_length - m_cut;
    m_shift = m_isPeriodic ? suffix.period : (m_cut > right ? m_cut : right) + 1;
  }

  /// Returns the start of the first occurrence in [x1, x2), or x2.
  template <class It1> It1 Find(It1 x1, It1 x2) const {
    ssize_t known = 0; // the number of elements at the needle's beginning that are known to be equal
    while (x2 - x1 >= m_length) {
      const ssize_t from = m_cut > known ? m_cut : known;
      const ssize_t i = from + EqualElements(x1 + from, m_needle + from, m_length - from);
      if (i < m_length) {
        x1 += i - m_cut + 1;
        known = 0;
        continue;
      }
      ssize_t k = m_cut;
      while (k > known && UnitValue(x1[k - 1]) == UnitValue(m_needle[k - 1]))
        --k;
      if (k <= known)
        return x1;
      x1 += m_shift;
      known = m_isPeriodic ? m_length - m_shift : 0;
    }
    return x2;
  }

private:
  struct Suffix {
    ssize_t begin;
    ssize_t period;
  };

  /// Finds the needle's greatest suffix in the given order, and that suffix's period.
  template <class Less> Suffix MaximalSuffix(const Less& less) const {
    Suffix best = {0, 1};
    for (ssize_t candidate = 1, k = 0; candidate + k < m_length;) {
      const auto a = UnitValue(m_needle[candidate + k]), b = UnitValue(m_needle[best.begin + k]);
      if (less(a, b)) { // the candidate is smaller, and so are all suffixes that begin up to here
        candidate += k + 1;
        k = 0;
        best.period = candidate - best.begin;
      } else if (less(b, a)) {
        best = {candidate, 1};
        ++candidate;
        k = 0;
      } else if (++k == best.period) {
        candidate += k;
        k = 0;
      }
    }
    return best;
  }

  It m_needle;
  ssize_t m_length;
  ssize_t m_cut;     ///< the length of the left part
  ssize_t m_shift;   ///< how far a mismatch in the left part moves the needle
  bool m_isPeriodic; ///< whether m_shift is the needle's period
};

/// Returns the start of the first occurrence of [y1, y2) in [x1, x2), or x2. It compares the needle at each
/// position, and switches to TwoWay once that turns out to be slow.
template <class It1, class It2> It1 FindNeedle(It1 x1, It1 x2, It2 y1, It2 y2) {
  const ssize_t length = y2 - y1;
  if (length == 0)
    return x1;
  Credit credit(length);
  for (It1 p = x1; x2 - p >= length; ++p) {
    if (UnitValue(*p) != UnitValue(*y1))
      continue;
    const ssize_t n = EqualElements(p, y1, length);
    if (n == length)
      return p;
    if (!credit.Allows(n, p - x1))
      return TwoWay<It2>(y1, y2).Find(p + 1, x2);
  }
  return x2;
}

/// Returns the start of the last occurrence of [y1, y2) in [x1, x2), or x2.
template <class It1, class It2> It1 FindLastNeedle(It1 x1, It1 x2, It2 y1, It2 y2) {
  using Reverse1 = std::reverse_iterator<It1>;
  using Reverse2 = std::reverse_iterator<It2>;
  if (x2 - x1 < y2 - y1)
    return x2;
  const Reverse1 end(x1);
  const Reverse1 found = FindNeedle(Reverse1(x2), end, Reverse2(y2), Reverse2(y1));
  return found == end && y1 != y2 ? x2 : found.base() - (y2 - y1);
}

template <class It, class = void> inline constexpr bool kIsOverIntegers = false;
template <class It>
inline constexpr bool kIsOverIntegers<It, std::void_t<typename std::iterator_traits<It>::iterator_category>> =
    std::is_integral_v<typename std::iterator_traits<It>::value_type>&& std::is_base_of_v<
        std::random_access_iterator_tag, typename std::iterator_traits<It>::iterator_category>;

/// Whether both are random-access iterators over integers.
template <class It1, class It2>
inline constexpr bool kAreOverIntegers = kIsOverIntegers<It1>&& kIsOverIntegers<It2>;

} // namespace detail

} // namespace mirel
