#include "Support.h"

using namespace mirel;

namespace {

template <class T> class XString : public testing::Test {};
TYPED_TEST_SUITE(XString, CodeUnits);

TYPED_TEST(XString, ZeroTerminatedArguments) {
  using S = basic_xstring<TypeParam>;
  const S text = Of<TypeParam>("abcabc"), bc = Of<TypeParam>("bc"), none;
  const TypeParam* const z = bc.c_str();
  S s = z;
  (s = text.c_str()).append(z) += z;
  s.insert(0, z).replace(2, 3, z).insert(s.size(), none.c_str());
  EXPECT_EQ(Std(s), Std(Of<TypeParam>("bcbcabcbcbc")));
  EXPECT_LT(s.compare(0, 1, z), 0);
  EXPECT_EQ(Std(S(text, 1, 2)) + Std(text.substr(4, 2)) + Std(S(z, z + 1)), Std(Of<TypeParam>("bcbcb")));
  HackToForcexstringIntoUtilsDll();
}

} // namespace

#include <sys/types.h>
#include <unistd.h>
