// Vectors beyond the limits of 32 bits: more than 4 GiB of bytes, more than 2^31 units of 16 bits. The tests
// take up to 18 GiB of memory.
#include "../Support.h"

namespace {

template <class T> class Large : public testing::Test {};
TYPED_TEST_SUITE(Large, CodeUnits);

TYPED_TEST(Large, GrowsIsSearchedEditedAndConverted) {
  using T = TypeParam;
  constexpr ssize_t kSize = (sizeof(T) == 1 ? ssize_t(1) << 32 : ssize_t(1) << 31) + 1000;
  basic_xstring<T> s, piece(1 << 24, 'a');
  const basic_xstring<T> end = Of<T>("the end");
  while (s.size() < kSize)
    s += piece;
  s.resize(kSize, 'a');
  s += end;
  s.push_back('!');
  ASSERT_EQ(s.size(), kSize + 8);
  const auto expectEnd = [&](ssize_t at) {
    EXPECT_EQ(s.find(end), at);
    EXPECT_EQ(s.rfind(end), at);
    EXPECT_EQ(s.find('!') - 7, at);
    EXPECT_EQ(s.find_first_of(end), at);
    EXPECT_EQ(s.find_first_not_of('a'), at);
    EXPECT_EQ(s.find_last_of('t'), at);
    EXPECT_EQ(s.substr(at)[4], 'e');
    EXPECT_EQ(s.compare(at, 7, end), 0);
  };
  expectEnd(kSize);
  s.insert(kSize, 5, 'a');
  s.replace(kSize + 2, 1, piece, 0, 3);
  expectEnd(kSize + 7);
  s.erase(10, 3);
  s.insert(0, 'a');
  expectEnd(kSize + 5);
  s.push_front('c');
  EXPECT_EQ(s.rfind('c'), 0);
  EXPECT_EQ(s.find('c'), 0);
  EXPECT_EQ(s.FindAndErase('c'), 1);
  EXPECT_EQ(s[kSize + 4], 'a');

  using Other = std::conditional_t<sizeof(T) == 1, char16, char8>;
  basic_xstring<Other> converted;
  ASSERT_TRUE(UtfToUtf(converted, s.data(), s.size()));
  const ssize_t size = s.size();
  basic_xstring<T>().swap(s); // frees it
  EXPECT_EQ(converted.size(), size);
  EXPECT_EQ(converted.rfind(Of<Other>("the end!")), size - 8);
  EXPECT_EQ(converted.find_first_not_of('a'), size - 8);
}

} // namespace
