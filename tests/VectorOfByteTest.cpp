#include "Support.h"

#include <list>
#include <random>
#include <vector>

#include <utils/VectorOfByte.h>

using namespace mirel;

namespace {

template <class T> class RangeAlgorithms : public testing::Test {};
TYPED_TEST_SUITE(RangeAlgorithms, CodeUnits);

TYPED_TEST(RangeAlgorithms, OrderUnitsAsUnsigned) {
  const TypeParam low[] = {1, 0x7F};
  static TypeParam high[] = {1, static_cast<TypeParam>(0x80)}; // through non-const pointers, the template
  const TypeParam* const constHigh = high;
  EXPECT_LT(LexicographicalCompareX(low, low + 2, constHigh, constHigh + 2), 0);
  EXPECT_GT(LexicographicalCompareX(high, high + 2, low, low + 2), 0);
  EXPECT_EQ(LexicographicalCompareX(high, high + 1, low, low + 2), -1);
  EXPECT_EQ(LexicographicalCompareX(low, low + 2, low, low + 1), 1);
  const TypeParam* const null = nullptr;
  EXPECT_EQ(LexicographicalCompareX(null, null, null, null), 0);
  EXPECT_EQ(LexicographicalCompareX(null, null, low, low + 1), -1);
  EXPECT_TRUE(IsEqual(null, null, null) && IsEqual(low, low + 1, constHigh) &&
              !IsEqual(low, low + 2, constHigh));
}

TYPED_TEST(RangeAlgorithms, FailedSearchesReturnTheEnd) {
  const auto text = Of<TypeParam>("abcbc"), bc = Of<TypeParam>("bc");
  const TypeParam *const x1 = text.begin(), *const x2 = text.end(), *const y1 = bc.begin(),
                         *const y2 = bc.end();
  EXPECT_EQ(FindFirstSubSequence(x1, x1 + 2, y1, y2), x1 + 2);
  EXPECT_EQ(FindFirstSubSequence(x1, x2, y1, y1), x1);
  EXPECT_EQ(FindLastSubSequence(x1, x1 + 2, y1, y2), x1 + 2);
  EXPECT_EQ(FindLastSubSequence(x1, x2, y1, y1), x2);
  EXPECT_TRUE(FindLast(x1, x1 + 1, 'b') == x1 + 1 && FindFirstNotOf(y1, y2, y1, y2) == y2);
  const std::list<TypeParam> list(x1, x2); // forward traversal is enough
  EXPECT_EQ(std::distance(list.begin(), FindFirstSubSequence(list.begin(), list.end(), y1, y2)), 1);
}

/// Whether the order, and all searches for a pattern or set, or its first unit, come to what the plain
/// templates come to.
template <class T> bool Agree(const T* x1, const T* x2, const T* y1, const T* y2) {
  using P = const T*;
  const auto sign = [](int x) { return (x > 0) - (x < 0); };
  return sign(LexicographicalCompareX(x1, x2, y1, y2)) == LexicographicalCompareX<P, P>(x1, x2, y1, y2) &&
         sign(LexicographicalCompareX(y1, y2, x1, x2)) == LexicographicalCompareX<P, P>(y1, y2, x1, x2) &&
         Find(x1, x2, *y1) == Find<P, T>(x1, x2, *y1) &&
         FindLast(x1, x2, *y1) == FindLast<P, T>(x1, x2, *y1) &&
         FindFirstSubSequence(x1, x2, y1, y2) == FindFirstSubSequence<P, P>(x1, x2, y1, y2) &&
         FindLastSubSequence(x1, x2, y1, y2) == FindLastSubSequence<P, P>(x1, x2, y1, y2) &&
         FindFirstOf(x1, x2, y1, y2) == FindFirstOf<P, P>(x1, x2, y1, y2) &&
         FindFirstNotOf(x1, x2, y1, y2) == FindFirstNotOf<P, P>(x1, x2, y1, y2) &&
         FindLastOf(x1, x2, y1, y2) == FindLastOf<P, P>(x1, x2, y1, y2) &&
         FindLastNotOf(x1, x2, y1, y2) == FindLastNotOf<P, P>(x1, x2, y1, y2);
}

TYPED_TEST(RangeAlgorithms, AgreeWithThePlainTemplates) {
  using T = TypeParam;
  const T high = static_cast<T>('a' + (1u << (8 * sizeof(T) - 1))); // the highest bit is all that differs
  std::mt19937 random(3);
  for (std::size_t size = 0; size < 420; size += size < 150 ? 1 : 7) {
    // A vector of exactly that size, and so its end is the end of what may be read.
    std::vector<T> text(size, 'a');
    const std::vector<T> other = text;
    const auto agree = [&](std::initializer_list<T> what) {
      return Agree<T>(text.data(), text.data() + size, what.begin(), what.end());
    };
    for (std::size_t at = 0; at < size; ++at) { // one hit, or one unit that isn't a member, at every place
      text[at] = high;
      ASSERT_TRUE(agree({high}) && agree({high, 'a'}) && agree({'b', high}) && agree({'a', high, 'a'}))
          << size << at;
      ASSERT_TRUE(agree({'a', 'b'}) && agree({'b', 'c', 'd', 'a', 'e', 'f'}) && agree({'a', 'a', high}))
          << size << at;
      const T* const x = text.data();
      ASSERT_EQ(LexicographicalCompareX(x, x + size, other.data(), other.data() + size) > 0, true)
          << size << at;
      ASSERT_LT(LexicographicalCompareX(x, x + at, other.data(), other.data() + size), 0) << size << at;
      text[at] = 'a';
    }
    ASSERT_TRUE(agree({high}) && agree({high, 'b'}) && agree({'a', 'b', 'c', 'd', 'e'}) &&
                agree({'a', 'a', 'b'}));
    for (int round = 0; round < 20; ++round) {
      for (T& unit : text)
        unit = random() % 16 == 0 ? high : static_cast<T>('a' + random() % 3);
      ASSERT_TRUE(agree({'a', 'b', 'c', 'a'}) && agree({high, 'b', 'c'}) && agree({'a', 'b', 'c'}) &&
                  agree({'c', high}));
    }
  }
}

TYPED_TEST(RangeAlgorithms, AgreeOnLongPatternsAndOnFirstUnitsThatAreRare) {
  using T = TypeParam;
  std::vector<T> text(4000, 'a');
  const std::vector<T> pattern(40, 'a');
  for (const std::size_t size : {20u, 39u, 40u, 41u, 200u})
    ASSERT_TRUE(Agree<T>(text.data(), text.data() + size, pattern.data(), pattern.data() + 40)) << size;
  for (std::size_t at = 5; at < text.size(); at += 190)
    text[at] = 'b', text[at + 1] = at == 3805 ? 'c' : 'd';
  for (const char* what : {"bc", "be", "ba", "bda"}) {
    const auto y = Of<T>(what);
    ASSERT_TRUE(Agree<T>(text.data(), text.data() + text.size(), y.begin(), y.end())) << what;
  }
}

TEST(VectorOfByteTest, EditsAtAnyPlace) {
  VectorOfByte b;
  b.insertbytes(0, 2);
  b[0] = 1, b[1] = 2;
  b.insert(1, 3), b.insert(0, 2, 9), b.insert(b.end(), 7), b.push_back(uint8(8)),
      b.push_back(b.begin(), b.end());
  EXPECT_EQ(b, (VectorOfByte{9, 9, 1, 3, 2, 7, 8, 9, 9, 1, 3, 2, 7, 8}));
  b.erase(0, 2), b.move(0, 1, 3), b.erase(b.begin() + 4, b.end()), b.erase_element(0);
  EXPECT_EQ(b, (VectorOfByte{2, 7, 7}));
  EXPECT_EQ(*b.insert(b.begin() + 1, 5), 5);
  EXPECT_EQ(*b.erase(b.begin()), 5);
  b.insert(1, b.begin(), b.end()), b += b;
  EXPECT_EQ(b, (VectorOfByte{5, 5, 7, 7, 7, 7, 5, 5, 7, 7, 7, 7}));
  b.assign(b.begin() + 1, b.begin() + 3), b.insert(b.begin(), 2, b.front()),
      b.insert(0, b.data(), b.data_end());
  EXPECT_EQ(b, (VectorOfByte{5, 5, 5, 7, 5, 5, 5, 7}));
  b.insert(b.begin() + 1, b.begin(), b.end()), b.insert(b.end(), ssize_t(2), b.back());
  EXPECT_EQ(b.size(), 18);
  b.erase(8, 10), b.push_back<unsigned short>(0x0102);
  const VectorOfByte c(b);
  EXPECT_EQ(c.size(), 10);
  EXPECT_EQ(c.front() + c.back() + c[9], 5 + 2 * c[9]);
  b.reserve(40);
  EXPECT_TRUE(b.owns(b.data() + 39) && !b.owns(b.data() + 40) && b.capacity() == 40);
  EXPECT_TRUE(c.data_end() - c.data() == 10 && b.owns(b.data()) && !b.owns(&b) &&
              !VectorOfByte().owns(nullptr));
}

TEST(VectorOfByteTest, ComparesBytes) {
  const VectorOfByte a{1, 2}, b{1, 200}, c;
  EXPECT_TRUE(a < b && a <= b && b > a && b >= a && a != b && !(a == b) && c < a && a >= a && a <= a);
  EXPECT_EQ(a.compare(0, 1, b, 0, 1) + a.compare(1, 0, c) + a.compare(2, 0, nullptr, 0) +
                a.compare(0, 1, b.data(), 1),
            0);
  EXPECT_EQ(VectorOfByte(3, 7), (VectorOfByte{7, 7, 7}));
  VectorOfByte d(a.begin(), a.end());
  const VectorOfByte& same = d;
  d = same;
  EXPECT_EQ(d, a);
  EXPECT_FALSE(d == b || VectorOfByte(c) == a);
  d = b;
  EXPECT_EQ(d, b);
  d = c;
  EXPECT_EQ(d, VectorOfByte(c));
  VectorOfByte().swap(d);
  EXPECT_TRUE(d.empty() && d.data() == nullptr);
}

} // namespace
