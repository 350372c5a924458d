// Calls that users write compile and mean what they say, and the declared signatures exist. POSIX headers are
// included first, and namespace mirel is used whole, since their names must not conflict.
#include <sys/socket.h>
#include <sys/types.h>
#include <unistd.h>

#include "Support.h"

#include <algorithm>
#include <iterator>
#include <type_traits>

using namespace mirel;

namespace {

[[maybe_unused]] const ssize_t kIsStillAType = int64{1} + uint16{1} + uint8{1};
static_assert(std::is_same_v<ssize_t, ::ssize_t>);
static_assert(std::is_same_v<char16, uint16>);

template <class T> class Overload : public testing::Test {};
TYPED_TEST_SUITE(Overload, CodeUnits);

/// Integer arguments of type N, where the declared parameters are ssize_t or int.
template <class T, class N> void CallWithIntegers() {
  const N n = 3, i = 1, zero = 0;
  const T x = 'x';
  basic_xstring<T> s;
  const basic_xstring<T> r = Of<T>("ab");
  EXPECT_EDIT(s, (s = basic_xstring<T>(n, x)), "xxx");
  EXPECT_EDIT(s, (s = xvector<T>(n, x)), "xxx");
  EXPECT_EDIT(s, (s = basic_xstring<T>(r, zero, i)), "a");
  EXPECT_EDIT(s, (s = basic_xstring<T>(r.data(), i)), "a");
  EXPECT_EDIT(s, s.append(n, x), "axxx");
  EXPECT_EDIT(s, s.assign(n, x), "xxx");
  EXPECT_EDIT(s, s.insert(zero, r), "abxxx");
  EXPECT_EDIT(s, s.insert(i, x), "axbxxx");
  EXPECT_EDIT(s, s.insert(i, n, x), "axxxxbxxx");
  EXPECT_EDIT(s, s.insert(s.begin(), n, x), "xxxaxxxxbxxx");
  EXPECT_EDIT(s, s.assign(r.data(), i), "a");
  EXPECT_EDIT(s, s.append(r.data(), i), "aa");
  EXPECT_EDIT(s, s.insert(i, r.data(), i), "aaa");
  EXPECT_EDIT(s, s.insert(zero, r.begin(), r.end()), "abaaa");
  EXPECT_EDIT(s, s.replace(zero, i, r), "abbaaa");
  EXPECT_EDIT(s, s.replace(i, i, n, x), "axxxbaaa");
  EXPECT_EDIT(s, s.replace(zero, zero, r.data(), 2), "abaxxxbaaa");
  EXPECT_EDIT(s, s.replace(i, i, r, 0, 1), "aaaxxxbaaa");
  EXPECT_EDIT(s, s.erase(zero, i), "aaxxxbaaa");
  EXPECT_EDIT(s, s.erase_range(zero, i), "axxxbaaa");
  EXPECT_EDIT(s, s.erase_element(i), "axxbaaa");
  EXPECT_EDIT(s, s.reserve(n), "axxbaaa");
  EXPECT_EDIT(s, s.resize(n, x), "axx");
  EXPECT_EDIT(s, s *= n, "axxaxxaxx");
  EXPECT_EDIT(s, s.insert(ssize_t(i), 2, x), "axxxxaxxaxx");
  ExpectText(s.substr(i, i), "x", "substr");
  EXPECT_EQ(s.find(x, zero), 1);
  EXPECT_EQ(s.compare(zero, n, s), -1);
  EXPECT_EQ(s[i], x);
  EXPECT_EQ(std::as_const(s).front(), 'a');
  EXPECT_EQ(s.length(), 11);
}

template <class T, class... N> void CallWithEach() { (CallWithIntegers<T, N>(), ...); }

TYPED_TEST(Overload, TakesIntegersOfEveryType) {
  CallWithEach<TypeParam, short, int, unsigned, ssize_t, std::size_t, long long, unsigned char>();
}

TYPED_TEST(Overload, LiteralZeroIsANumber) {
  using S = basic_xstring<TypeParam>;
  const S r = Of<TypeParam>("ab");
  const TypeParam x = 'x';
  const ssize_t two = 2;
  enum { kZero };
  S s;
  EXPECT_EDIT(s, s.insert(0, x), "x");
  EXPECT_EDIT(s, s.insert(0, 3, x), "xxxx");
  EXPECT_EDIT(s, s.insert(0, r), "abxxxx");
  EXPECT_EDIT(s, s.insert(0, 0x41), "Aabxxxx");
  EXPECT_EDIT(s, s.insert(0, r.data(), 1), "aAabxxxx");
  EXPECT_EDIT(s, s.erase(0, 0), "aAabxxxx");
  EXPECT_EDIT(s, s.erase(0, 2), "abxxxx");
  EXPECT_EDIT(s, s.replace(0, 0, r), "ababxxxx");
  EXPECT_EDIT(s, s.replace(0, 0, 1, x), "xababxxxx");
  EXPECT_EDIT(s, s.replace(0, 0, r, 0, 1), "axababxxxx");
  EXPECT_EDIT(s, s.replace(0, 0, r.data(), 1), "aaxababxxxx");
  EXPECT_EDIT(s, s.replace(0, 0, r.c_str()), "abaaxababxxxx");
  EXPECT_EDIT(s, s.assign(3, 0x41), "AAA");
  EXPECT_EDIT(s, s.append(0, 0x41), "AAA");
  EXPECT_EDIT(s, s.append(0, two), "AAA");
  EXPECT_EDIT(s, s.insert(1, 3, 0x41), "AAAAAA");
  EXPECT_EDIT(s, s.insert(0, kZero, x), "AAAAAA");
  EXPECT_EDIT(s, s.insert(s.begin(), 0, 0x41), "AAAAAA");
  EXPECT_EDIT(s, s.replace(0, 5, kZero, x), "A");
  EXPECT_EDIT(s, s.insert(1, 0), std::string("A\0", 2));
  EXPECT_EDIT(s, s += 0, std::string("A\0\0", 3));
  EXPECT_EDIT(s, s.append(1, 0), std::string("A\0\0\0", 4));
  EXPECT_EDIT(s, s.replace(s.begin(), s.end(), 0, 0x41), "");
  EXPECT_EDIT(s, s.push_back(0), std::string(1, '\0'));
  EXPECT_EQ(s.find(0), 0);
  EXPECT_EQ(s.find(0, 0), 0);
  EXPECT_EQ(s.rfind(0), 0);
  EXPECT_EQ(s.find_first_of(0), 0);
  EXPECT_EQ(s.find_last_of(0), 0);
  EXPECT_EQ(s.find_first_not_of(0), kNpos);
  EXPECT_EQ(s.find_last_not_of(0), kNpos);
  EXPECT_EQ(s.find(0x2A, 0), kNpos);
  EXPECT_EQ(r.rfind(r, 0), 0);
  EXPECT_EQ(r.find_last_of(x, 0), kNpos);
  EXPECT_EQ(r.find_last_not_of(r.data(), 0, 1), kNpos);
  EXPECT_EDIT(s, s.assign(0, 0x41), "");
  EXPECT_EDIT(s, s = {}, "");
  for (const S& empty :
       {S(0, 0x41), S(0, x), S(nullptr, 0), S(nullptr, nullptr), S({r.data(), 0}), S({r, 0, 0})})
    EXPECT_EQ(empty.size(), 0);
  EXPECT_EQ(xvector<TypeParam>(0, 0x41).size(), 0);
  EXPECT_EQ(xvector<TypeParam>(nullptr, 0).size(), 0);
  EXPECT_EQ(xvector<TypeParam>(r.data(), 0).size(), 0);
  VectorOfByte().insert(nullptr, 0, 0);
  static_assert(!std::is_constructible_v<S, std::nullptr_t>);
}

TYPED_TEST(Overload, HasTheDeclaredSignatures) {
  using T = TypeParam;
  using V = xvector<T>;
  using S = basic_xstring<T>;
  static_assert(sizeof(S) == sizeof(VectorOfByte));
  static_assert(!std::is_polymorphic_v<S>);
  static_assert(std::is_same_v<decltype(V() + V()), const V>);
  static_assert(std::is_same_v<decltype(S() + 'x'), const V>);
  static_assert(std::is_same_v<decltype(std::declval<S>().substr(0)), S>);
  static_assert(std::is_convertible_v<const T*, S>);
  static_assert(!std::is_convertible_v<const T*, V>);
  static_assert(!std::is_default_constructible_v<typename V::reverse_iterator>);
  static_assert(std::is_nothrow_destructible_v<S>);
  static_assert(std::is_nothrow_destructible_v<VectorOfByte>);
  static_assert(std::is_nothrow_swappable_v<V>);
  static_assert(std::is_nothrow_swappable_v<S>);
  static_assert(noexcept(std::declval<S&>().swap(std::declval<S&>())));
  static_assert(noexcept(std::declval<VectorOfByte&>().swap(std::declval<VectorOfByte&>())));
  // A conversion to a type that no overload has doesn't compile.
  static_cast<void>(static_cast<T* (V::*)(T*, const T&)>(&V::insert));
  static_cast<void>(static_cast<void (V::*)(ssize_t, int, const T&)>(&V::insert));
  static_cast<void>(static_cast<void (V::*)(ssize_t) const>(&V::reserve));
  static_cast<void>(static_cast<ssize_t (V::*)(const V&, ssize_t)>(&V::find_first_not_of));
  static_cast<void>(static_cast<S& (S::*)(ssize_t, ssize_t, const T*)>(&S::replace));
}

} // namespace
