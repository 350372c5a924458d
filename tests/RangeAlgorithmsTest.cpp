#include "Support.h"

#include <algorithm>
#include <array>
#include <chrono>
#include <list>
#include <random>
#include <vector>

#include <utils/RangeAlgorithms.h>

#include "../utils/src/KernelTable.h"

using namespace mirel;

namespace {

template <class T> class RangeAlgorithms : public testing::Test {};
TYPED_TEST_SUITE(RangeAlgorithms, CodeUnits);

TYPED_TEST(RangeAlgorithms, OrderUnitsAsUnsigned) {
  const TypeParam low[] = {1, 0x7F};
  static TypeParam high[] = {1, static_cast<TypeParam>(0x80)}; // non-const pointers take the template
  const TypeParam* const constHigh = high;
  EXPECT_LT(LexicographicalCompareX(low, low + 2, constHigh, constHigh + 2), 0);
  EXPECT_GT(LexicographicalCompareX(high, high + 2, low, low + 2), 0);
  const TypeParam* const null = nullptr;
  EXPECT_EQ(LexicographicalCompareX(null, null, null, null), 0);
  EXPECT_EQ(LexicographicalCompareX(null, null, low, low + 1), -1);
  EXPECT_TRUE(IsEqual(null, null, null));
  EXPECT_TRUE(IsEqual(low, low + 1, constHigh));
  EXPECT_FALSE(IsEqual(low, low + 2, constHigh));
}

/// The results of the standard library for all eight searches.
template <class It1, class It2> std::array<It1, 8> Expected(It1 x1, It1 x2, It2 y1, It2 y2) {
  const std::reverse_iterator<It1> r1(x2), r2(x1);
  const auto isIn = [=](auto x) { return std::find(y1, y2, x) != y2; };
  const auto last = [=](auto found) { return found == r2 ? x2 : std::prev(found.base()); };
  return {std::find(x1, x2, *y1),           last(std::find(r1, r2, *y1)),
          std::search(x1, x2, y1, y2),      std::find_end(x1, x2, y1, y2),
          std::find_if(x1, x2, isIn),       std::find_if_not(x1, x2, isIn),
          last(std::find_if(r1, r2, isIn)), last(std::find_if_not(r1, r2, isIn))};
}

const char* const kSearches[] = {
    "find",        "findLast",       "findFirstSubSequence", "findLastSubSequence",
    "findFirstOf", "findFirstNotOf", "findLastOf",           "findLastNotOf"};

/// Checks the templates for the iterators of any container.
template <class Container> void SearchAnyContainer() {
  const auto binary = [](unsigned bits) { // the binary digits of a number without the highest
    Container digits;
    for (; bits > 1; bits /= 2)
      digits.push_back(bits % 2 == 0 ? 'a' : 'b');
    return digits;
  };
  for (unsigned bits = 1; bits < 1 << 7; ++bits)
    for (unsigned needleBits = 1; needleBits < 1 << 4; ++needleBits) {
      const Container text = binary(bits), needle = binary(needleBits);
      const auto x1 = text.begin(), x2 = text.end(), y1 = needle.begin(), y2 = needle.end();
      EXPECT_EQ(LexicographicalCompareX(x1, x2, y1, y2), text < needle ? -1 : text != needle);
      if (needle.empty()) {
        EXPECT_EQ(FindFirstSubSequence(x1, x2, y1, y2), x1);
        EXPECT_EQ(FindLastSubSequence(x1, x2, y1, y2), x2);
        EXPECT_EQ(FindFirstOf(x1, x2, y1, y2), x2);
        EXPECT_EQ(FindFirstNotOf(x1, x2, y1, y2), x1);
      } else {
        const std::array<decltype(text.begin()), 8> found = {Find(x1, x2, *y1),
                                                             FindLast(x1, x2, *y1),
                                                             FindFirstSubSequence(x1, x2, y1, y2),
                                                             FindLastSubSequence(x1, x2, y1, y2),
                                                             FindFirstOf(x1, x2, y1, y2),
                                                             FindFirstNotOf(x1, x2, y1, y2),
                                                             FindLastOf(x1, x2, y1, y2),
                                                             FindLastNotOf(x1, x2, y1, y2)};
        const auto expected = Expected(x1, x2, y1, y2);
        for (std::size_t k = 0; k < found.size(); ++k)
          EXPECT_EQ(std::distance(x1, found[k]), std::distance(x1, expected[k]))
              << kSearches[k] << " of " << testing::PrintToString(needle) << " in "
              << testing::PrintToString(text);
      }
    }
}
TYPED_TEST(RangeAlgorithms, TakeAnyIterators) {
  SearchAnyContainer<std::list<TypeParam>>();
  SearchAnyContainer<std::vector<TypeParam>>();
}

/// An implementation of the searches, and its name.
template <class T> struct Implementation {
  std::string name;
  mirel::detail::SearchKernels<T> searches;
};

/// The functions that a program calls, the scalar path, and each of the processor's kernels.
template <class T> std::vector<Implementation<T>> Implementations() {
  using P = const T*;
  using namespace mirel::detail;
  std::vector<Implementation<T>> implementations = {
      {"as chosen",
       {[](P x1, P x2, T v) { return Find(x1, x2, v); }, [](P x1, P x2, T v) { return FindLast(x1, x2, v); },
        [](P x1, P x2, P y1, P y2) { return FindFirstSubSequence(x1, x2, y1, y2); },
        [](P x1, P x2, P y1, P y2) { return FindLastSubSequence(x1, x2, y1, y2); },
        [](P x1, P x2, P y1, P y2) { return FindFirstOf(x1, x2, y1, y2); },
        [](P x1, P x2, P y1, P y2) { return FindFirstNotOf(x1, x2, y1, y2); },
        [](P x1, P x2, P y1, P y2) { return FindLastOf(x1, x2, y1, y2); },
        [](P x1, P x2, P y1, P y2) { return FindLastNotOf(x1, x2, y1, y2); },
        BestSearches(P()).findDifference}}};
#ifndef MIREL_SHARED // a shared library hides its kernels
  implementations.push_back({"scalar", ScalarSearches<T>()});
  for (int k = 0; const Kernels* const kernels = KernelsAt(k); ++k)
    implementations.push_back({kernels->name, static_cast<const UnitKernels<T>*>(kernels)->searches});
#endif
  return implementations;
}

TYPED_TEST(RangeAlgorithms, TakeEmptyRangesAndSets) {
  using T = TypeParam;
  const T text[] = {'a', 'b'}, *const x2 = text + 2, *const null = nullptr;
  for (const auto& [name, s] : Implementations<T>()) {
    EXPECT_EQ(s.find(null, null, 'a'), null) << name;
    EXPECT_EQ(s.findLast(null, null, 'a'), null) << name;
    EXPECT_EQ(s.findFirstSubSequence(null, null, text, x2), null) << name;
    EXPECT_EQ(s.findLastSubSequence(null, null, text, x2), null) << name;
    EXPECT_EQ(s.findLastNotOf(null, null, text, x2), null) << name;
    EXPECT_EQ(s.findFirstOf(text, x2, null, null), x2) << name;
    EXPECT_EQ(s.findFirstNotOf(text, x2, null, null), text) << name;
    EXPECT_EQ(s.findLastNotOf(text, x2, null, null), text + 1) << name;
    EXPECT_EQ(s.findDifference(nullptr, nullptr, 0), 0) << name;
  }
  EXPECT_EQ(FindFirstSubSequence(text, x2, null, null), text);
  EXPECT_EQ(FindLastSubSequence(text, x2, null, null), x2);
}

/// Compares every implementation with the standard library. A sanitizer checks the ends of both vectors.
template <class T> void Check(const std::vector<T>& text, const std::vector<T>& needle) {
  static const std::vector<Implementation<T>> implementations = Implementations<T>();
  const T *const x1 = text.data(), *const x2 = x1 + text.size(), *const y1 = needle.data(),
                 *const y2 = y1 + needle.size();
  const auto expected = Expected(x1, x2, y1, y2);
  for (const auto& [name, s] : implementations) {
    const T* const found[] = {s.find(x1, x2, *y1),
                              s.findLast(x1, x2, *y1),
                              s.findFirstSubSequence(x1, x2, y1, y2),
                              s.findLastSubSequence(x1, x2, y1, y2),
                              s.findFirstOf(x1, x2, y1, y2),
                              s.findFirstNotOf(x1, x2, y1, y2),
                              s.findLastOf(x1, x2, y1, y2),
                              s.findLastNotOf(x1, x2, y1, y2)};
    for (std::size_t k = 0; k < 8; ++k) // expectations would take most of the time
      if (found[k] != expected[k])
        FAIL() << name << ", " << kSearches[k] << " in " << text.size() << " units: " << found[k] - x1
               << ", not " << expected[k] - x1 << "; " << testing::PrintToString(needle);
  }
}

TYPED_TEST(RangeAlgorithms, FindOneHitAtEveryPlace) {
  using T = TypeParam;
  using Units = std::vector<T>;
  using Texts = std::vector<Units>;
  const T high =
      static_cast<T>('a' + (1u << (8 * sizeof(T) - 1))); // differs from 'a' in the highest bit only
  Texts sets = {{'a', 'b'}, {'b', 'c', 'd', 'a', high}, Units(70, high), Units(70, 'a'), {}, {}, {}};
  for (unsigned k = 0; k < 26; ++k) { // members in few rows of 16 units, and in many
    sets[4].push_back(static_cast<T>('b' + k));
    sets[5].push_back(static_cast<T>(0xA0 + 17 * k));
  }
  for (unsigned k = 0; k < 72;
       ++k) // members in nine rows, the last of which shares its bit with the row of 'a'
    sets[6].push_back(static_cast<T>(k % 9 < 8 ? 0x62 + k % 9 * 16 : 0xE1));
  for (std::size_t size = 0; size < 420; size += size < 150 ? 1 : 29) {
    std::vector<T> text(size, 'a');
    for (std::size_t at = 0; at <= size; ++at) { // the last round has no hit
      if (at < size)
        text[at] = high;
      for (const auto& needle : Texts{{high}, {high, 'a'}, {'b', high}, {'a', high, 'a'}, sets[at % 7]})
        ASSERT_NO_FATAL_FAILURE(Check(text, needle));
      if (at < size)
        text[at] = 'a';
    }
  }
}

TEST(RangeAlgorithmsTest, FindOneDifferenceAtEveryPlace) {
  for (std::size_t size = 0; size < 420; size += size < 150 ? 1 : 29) {
    const std::vector<char16> text(size, 'a');
    auto other = text;
    const char16 *const x = text.data(), *const y = other.data();
    for (std::size_t at = 0; at < size; ++at) {
      other[at] = 0x8061;
      for (const auto& implementation : Implementations<char16>())
        ASSERT_EQ(implementation.searches.findDifference(x, y, ssize_t(size)), ssize_t(at))
            << implementation.name << ' ' << size;
      ASSERT_LT(LexicographicalCompareX(x, x + size, y, y + size), 0) << size << ' ' << at;
      ASSERT_GT(LexicographicalCompareX(y, y + size, x, x + at), 0) << size << ' ' << at;
      other[at] = 'a';
    }
    ASSERT_EQ(LexicographicalCompareX(x, x + size, y, y + size), 0) << size;
  }
}

/// A unit that the set's tables take for a member, and a real member fewer than 20 units after it, in either
/// direction. Such a member was missed once.
TEST(RangeAlgorithmsTest, MembersSoonAfterAFalseHitAreFound) {
  std::vector<char16> set; // in nine rows, the first and the last of which share a bit
  for (int row = 0; row < 9; ++row)
    set.push_back(static_cast<char16>(0x1009 + row * 0x1110));
  for (std::size_t between = 0; between < 20; ++between) {
    std::vector<char16> text(2000, 'a');
    text.push_back(0x1089);
    text.insert(text.end(), between, 'a');
    text.push_back(set[3]);
    ASSERT_NO_FATAL_FAILURE(Check(text, set));
    std::reverse(text.begin(), text.end());
    ASSERT_NO_FATAL_FAILURE(Check(text, set));
  }
}

/// A place that differs from the needle in one unit, at every index.
TYPED_TEST(RangeAlgorithms, RejectPlacesThatDifferInOneUnit) {
  using Units = std::vector<TypeParam>;
  for (const std::size_t size : {3u, 17u, 41u, 64u, 100u, 300u}) {
    Units needle;
    for (std::size_t k = 0; k < size; ++k)
      needle.push_back(static_cast<TypeParam>('a' + k * k % 23));
    for (std::size_t at = 0; at < size; ++at) {
      Units before = needle, after = needle;
      before[at] = after[at] = '!';
      before.insert(before.end(), needle.begin(), needle.end());
      after.insert(after.begin(), needle.begin(), needle.end());
      ASSERT_NO_FATAL_FAILURE(Check(before, needle)) << at;
      ASSERT_NO_FATAL_FAILURE(Check(after, needle)) << at;
    }
  }
}

TYPED_TEST(RangeAlgorithms, AgreeWithTheStandardOnRandomTexts) {
  using T = TypeParam;
  std::mt19937 random(3);
  const auto units = [&](std::size_t size, unsigned kinds, unsigned distance) {
    std::vector<T> result(size);
    for (T& unit : result)
      unit = static_cast<T>(0x50 + random() % kinds * distance);
    return result;
  };
  for (int round = 0; round < 4000; ++round) {
    const auto kinds = unsigned(1 + random() % 40), distance = unsigned(1 + random() % (1u << random() % 14));
    const auto text = units(random() % 700, kinds, distance);
    ASSERT_NO_FATAL_FAILURE(Check(text, units(1 + random() % 6, kinds, distance)));
    ASSERT_NO_FATAL_FAILURE(Check(text, units(1 + random() % 100, 60, distance))) << "a large set";
  }
}

/// Needles that are found late or never and resemble the text before: parts of the Fibonacci word, a repeated
/// unit with another one in it, and 45 or more units of a periodic text, followed by "b".
TYPED_TEST(RangeAlgorithms, FindPeriodicNeedles) {
  using T = TypeParam;
  std::string fibonacci = "ab", before = "a", period;
  while (fibonacci.size() < 3000) {
    before.swap(fibonacci);
    fibonacci = before + fibonacci;
  }
  while (period.size() < 3000)
    period += "aabab";
  const auto check = [](const std::string& text, std::string needle) {
    for (int direction = 0; direction < 2; ++direction) {
      Check(std::vector<T>(text.begin(), text.end()), std::vector<T>(needle.begin(), needle.end()));
      std::reverse(needle.begin(), needle.end());
    }
  };
  for (const std::size_t n : {1u, 2u, 5u, 40u, 63u, 64u, 200u, 700u})
    for (const std::size_t m : {0u, 1u, 3u, 21u, 55u, 300u}) {
      const std::string a(n, 'a'), b = a + 'b' + std::string(m, 'a');
      check(std::string(2000, 'a'), b);
      check(std::string(1500, 'a') + 'b' + std::string(m + 9, 'a'), b);
      check(fibonacci, fibonacci.substr(m, n));
      check(fibonacci, fibonacci.substr(m, n) + "bb");
      check(period + fibonacci, period.substr(m, n + 45) + 'b');
      check(period + 'b', period.substr(0, m + 45) + 'b');
    }
}

TEST(RangeAlgorithmsTest, TwoWayFindsAllShortNeedles) {
  std::mt19937 random(5);
  for (unsigned bits = 2; bits < 1u << 9; ++bits) { // the highest set bit marks the needle's end
    std::vector<short> needle;
    for (unsigned b = bits; b > 1; b /= 2)
      needle.push_back(b % 2 != 0);
    for (int round = 0; round < 40; ++round) {
      std::vector<int> text(random() % 30);
      for (int& unit : text)
        unit = random() % 8 == 0 ? 2 : int(random() % 2);
      const auto expected = std::search(text.begin(), text.end(), needle.begin(), needle.end());
      const mirel::detail::TwoWay<const short*> twoWay(needle.data(), needle.data() + needle.size());
      const auto last = FindLastSubSequence(text.begin(), text.end(), needle.begin(), needle.end());
      const auto expectedLast = std::find_end(text.begin(), text.end(), needle.begin(), needle.end());
      ASSERT_EQ(twoWay.Find(text.begin(), text.end()) - text.begin(), expected - text.begin())
          << testing::PrintToString(needle) << " in " << testing::PrintToString(text);
      ASSERT_EQ(last - text.begin(), expectedLast - text.begin())
          << testing::PrintToString(needle) << " in " << testing::PrintToString(text);
    }
  }
}

TYPED_TEST(RangeAlgorithms, NoNeedleIsSlow) {
  using T = TypeParam;
  const std::vector<T> text(1 << 20, 'a');
  std::vector<T> first(1 << 18, 'a'), last = first;
  first.end()[-2] = last[1] = 'b';
  const T *const x1 = text.data(), *const x2 = x1 + text.size();
  const auto start = std::chrono::steady_clock::now();
  for (const auto& implementation : Implementations<T>()) {
    ASSERT_EQ(implementation.searches.findFirstSubSequence(x1, x2, first.data(), first.data() + first.size()),
              x2);
    ASSERT_EQ(implementation.searches.findLastSubSequence(x1, x2, last.data(), last.data() + last.size()),
              x2);
  }
  const std::vector<int> integers(text.begin(), text.end());
  EXPECT_EQ(FindFirstSubSequence(integers.begin(), integers.end(), first.begin(), first.end()),
            integers.end());
  EXPECT_EQ(FindLastSubSequence(integers.begin(), integers.end(), last.begin(), last.end()), integers.end());
  const std::chrono::duration<double> time = std::chrono::steady_clock::now() - start;
  EXPECT_LT(time.count(), 8)
      << "seconds; in time proportional to the product of the lengths, one search takes longer";
}

} // namespace
