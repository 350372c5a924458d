// Random edits and searches, compared with the standard strings.
#include "Edits.h"

#include <random>

using namespace mirel;

namespace {

struct Random {
  ssize_t operator()(ssize_t max) { return std::uniform_int_distribution<ssize_t>(0, max)(engine); }
  std::mt19937 engine{20240229};
};

template <class T> class XVector : public testing::Test, protected TextMaker<T, Random> {
protected:
  XVector() : TextMaker<T, Random>(random) {}
  Random random;
};
TYPED_TEST_SUITE(XVector, CodeUnits);

TYPED_TEST(XVector, EditsLikeAString) {
  Edits<TypeParam, Random> edits(this->random);
  for (int step = 0; step < 60000; ++step)
    ASSERT_NO_FATAL_FAILURE(edits.Step()) << "step " << step;
}

TYPED_TEST(XVector, SearchesAndComparesLikeAString) {
  Searches<TypeParam, Random> searches(this->random);
  for (int step = 0; step < 40000; ++step)
    ASSERT_NO_FATAL_FAILURE(searches.Step(step % 100 == 0 ? 300 : 12)) << "step " << step;
}

TYPED_TEST(XVector, ReverseIteratorsConvertToPointersPastTheirElement) {
  auto v = Of<TypeParam>("abc");
  const auto& cv = v;
  EXPECT_EQ(std::basic_string<TypeParam>(cv.rbegin(), cv.rend()), Std(Of<TypeParam>("cba")));
  auto it = v.rbegin();
  auto constIt = cv.rbegin();
  EXPECT_EQ(*constIt++, 'c');
  EXPECT_EQ(static_cast<const TypeParam*>(constIt), v.begin() + 2);
  EXPECT_TRUE(it == cv.rbegin());
  EXPECT_EQ(static_cast<TypeParam*>(it), v.end());
  EXPECT_EQ(static_cast<TypeParam*>(v.rend()), v.begin());
  EXPECT_EQ(*it++, 'c');
  *it = 'x';
  EXPECT_EQ(*it.operator->(), 'x');
  EXPECT_EQ(v[1], 'x');
  EXPECT_TRUE(it != v.rend());
  EXPECT_EQ(*--it, 'c');
  EXPECT_EQ(*it--, 'c');
  const auto* const data = v.data();
  typename TestFixture::S w;
  v.swap(w);
  EXPECT_EQ(w.data(), data);
  EXPECT_EQ(v.data(), nullptr);
  EXPECT_TRUE(v.rbegin() == v.rend());
}

TYPED_TEST(XVector, TakesNullTerminatedArguments) {
  using Text = basic_xstring<TypeParam>;
  const Text text = Of<TypeParam>("abcabc"), bc = Of<TypeParam>("bc"), none;
  const TypeParam* const z = bc.c_str();
  Text s = z;
  EXPECT_EDIT(s, (s = text.c_str()).append(z) += z, "abcabcbcbc");
  EXPECT_EDIT(s, s.insert(0, z).replace(2, 3, z).insert(s.size(), none.c_str()), "bcbcabcbcbc");
  EXPECT_LT(s.compare(0, 1, z), 0);
  ExpectText(Text(text, 1, 2), "bc", "construction");
  ExpectText(text.substr(4, 2), "bc", "substr");
  ExpectText(Text(z, z + 1), "b", "construction");
  HackToForcexstringIntoUtilsDll();
}

} // namespace
