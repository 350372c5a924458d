// The scalar path of the searches for pointers to code units: for processors without kernels, and for the
// needles and sets that a kernel leaves to it.

#include <utils/RangeAlgorithms.h>

#include <iterator>

#include "KernelTable.h"

namespace mirel::detail {

namespace {

/// A set of code units, one bit for each possible unit.
template <class T> class UnitBitset {
public:
  UnitBitset(const T* y1, const T* y2) {
    for (; y1 != y2; ++y1)
      m_words[UnitValue(*y1) / 64] |= uint64_t(1) << UnitValue(*y1) % 64;
  }
  bool Has(T x) const { return (m_words[UnitValue(x) / 64] >> UnitValue(x) % 64 & 1) != 0; }

private:
  uint64_t m_words[sizeof(T) == 1 ? 256 / 64 : 65536 / 64] = {};
};

/// Returns the first unit of [p, end) that is in [y1, y2) or, if !isMember, isn't; end if there is none. The
/// UnitBitset is filled only if comparing with each member finds nothing in the first `near` units.
template <class It, class T> It FindInSet(It p, It end, const T* y1, const T* y2, bool isMember) {
  const ssize_t near = 8 + ssize_t(sizeof(UnitBitset<T>) / 8 / (std::size_t(y2 - y1) + 1));
  for (const It stop = end - p < near ? end : p + near; p != stop; ++p)
    if ((mirel::Find(y1, y2, *p) != y2) == isMember)
      return p;
  if (p == end)
    return p;
  const UnitBitset<T> set(y1, y2);
  while (p != end && set.Has(*p) != isMember)
    ++p;
  return p;
}

template <bool kIsMember, class T> const T* FindFirst(const T* x1, const T* x2, const T* y1, const T* y2) {
  return FindInSet(x1, x2, y1, y2, kIsMember);
}

template <bool kIsMember, class T> const T* FindLast(const T* x1, const T* x2, const T* y1, const T* y2) {
  const std::reverse_iterator<const T*> rbegin(x2), rend(x1);
  const auto found = FindInSet(rbegin, rend, y1, y2, kIsMember);
  return found == rend ? x2 : found.base() - 1;
}

} // namespace

template <class T> const SearchKernels<T>& ScalarSearches() {
  static constexpr SearchKernels<T> searches = {
      FindByFour,
      FindLastByFour,
      FindNeedle<const T*, const T*>,
      FindLastNeedle<const T*, const T*>,
      FindFirst<true, T>,
      FindFirst<false, T>,
      FindLast<true, T>,
      FindLast<false, T>,
      EqualElements<const T*, const T*>,
  };
  return searches;
}
template const SearchKernels<char8>& ScalarSearches();
template const SearchKernels<char16>& ScalarSearches();

} // namespace mirel::detail
