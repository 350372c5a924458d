// What users write compiles and means what it says; the declared signatures are there. POSIX headers come
// first here and last in another file, and both use the whole namespace.
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
static_assert(std::is_same_v<ssize_t, ::ssize_t> && std::is_same_v<char16, uint16>);

template <class T> class Overload : public testing::Test {};
TYPED_TEST_SUITE(Overload, CodeUnits);

/// Integer arguments of type N, where the declared parameters are ssize_t or int.
template <class T, class N> void CallWithIntegers() {
  const N n = 3, i = 1, zero = 0;
  const T x = 'x';
  basic_xstring<T> s(n, x);
  const basic_xstring<T> r = Of<T>("ab");
  EXPECT_EQ(xvector<T>(n, x).size(), 3);
  EXPECT_EQ((basic_xstring<T>(r.data(), i).size()), 1);
  EXPECT_EQ((basic_xstring<T>(r, zero, i).size()), 1);
  s.assign(n, x), s.append(n, x), s.insert(i, x), s.insert(i, n, x), s.insert(s.begin(), n, x),
      s.insert(zero, r);
  EXPECT_EQ(s.size(), 15);
  s.assign(r.data(), i), s.append(r.data(), i), s.insert(i, r.data(), i), s.insert(zero, r.begin(), r.end());
  EXPECT_EQ(s.size(), 5);
  s.replace(zero, i, r), s.replace(i, i, n, x), s.replace(zero, zero, r.data(), 2), s.replace(i, i, r, 0, 1);
  EXPECT_EQ(s.size(), 10);
  s.erase(zero, i), s.erase_range(zero, i), s.erase_element(i), s.reserve(n), s.resize(n, x);
  EXPECT_EQ(s.size(), 3);
  EXPECT_EQ(s.find(x, zero) + s.substr(i, i).size() + s.compare(zero, n, s), 2);
  s *= n;
  EXPECT_TRUE(s[i] == x && std::as_const(s).front() == 'a');
  s = std::as_const(s);
  EXPECT_EQ(s.length(), 9);
  s.insert(ssize_t(i), 2, x);
  EXPECT_EQ(s.size(), 11);
}

template <class T, class... N> void CallWithEach() { (CallWithIntegers<T, N>(), ...); }

TYPED_TEST(Overload, IntegersOfEveryType) {
  CallWithEach<TypeParam, short, int, unsigned, ssize_t, std::size_t, long long, unsigned char>();
}

TYPED_TEST(Overload, LiteralZeroIsANumber) {
  using S = basic_xstring<TypeParam>;
  const S r = Of<TypeParam>("ab");
  const TypeParam x = 'x';
  const ssize_t two = 2;
  S s;
  s.insert(0, x), s.insert(0, 3, x), s.insert(0, r), s.insert(0, 0x41), s.insert(0, r.data(), 1);
  EXPECT_EQ(Std(s), Std(Of<TypeParam>("aAabxxxx")));
  s.erase(0, 0), s.erase(0, 2), s.replace(0, 0, r), s.replace(0, 0, 1, x), s.replace(0, 0, r, 0, 1);
  s.replace(0, 0, r.data(), 1), s.replace(0, 0, r.c_str());
  EXPECT_EQ(Std(s), Std(Of<TypeParam>("abaaxababxxxx")));
  s.insert(1, 0), s += 0, s.append(1, 0), s.append(0, 0x41), s.assign(3, 0x41), s.append(0, two);
  EXPECT_EQ(Std(s), Std(Of<TypeParam>("AAA")));
  s.insert(1, 3, 0x41), s.assign(0, 0x41), s.push_back(0);
  EXPECT_EQ(s.find(0) + s.find(0, 0) + s.rfind(0) + s.find_first_of(0) + s.find_last_of(0), 0);
  EXPECT_EQ(s.find_first_not_of(0) + s.find_last_not_of(0), 2 * kNpos);
  EXPECT_EQ(s.find(0x2A, 0), kNpos);
  EXPECT_EQ(r.rfind(r, 0) + r.find_last_of(x, 0) + r.find_last_not_of(r.data(), 0, 1), 0 + 2 * kNpos);
  EXPECT_TRUE(S(0, 0x41).empty() && S(0, x).empty() && xvector<TypeParam>(0, 0x41).empty());
  EXPECT_TRUE(S(nullptr, 0).empty() && S(nullptr, nullptr).empty() && xvector<TypeParam>(nullptr, 0).empty());
  EXPECT_EQ(xvector<TypeParam>(r.data(), 0).size(), 0);
  s = {};
  EXPECT_EQ(s.size(), 0);
  enum { kZero };
  s.replace(s.begin(), s.end(), 0, 0x41), s.insert(0, kZero, x), s.insert(s.begin(), 0, 0x41),
      s.replace(0, 0, kZero, x);
  VectorOfByte().insert(nullptr, 0, 0);
  EXPECT_TRUE(s.empty() && S({r.data(), 0}).empty() && S({r, 0, 0}).empty());
  static_assert(!std::is_constructible_v<S, std::nullptr_t>);
}

TYPED_TEST(Overload, DeclaredSignatures) {
  using T = TypeParam;
  using V = xvector<T>;
  using S = basic_xstring<T>;
  static_assert(sizeof(S) == sizeof(VectorOfByte) && !std::is_polymorphic_v<S>);
  static_assert(std::is_same_v<decltype(V() + V()), const V> && std::is_same_v<decltype(S() + 'x'), const V>);
  static_assert(std::is_same_v<decltype(std::declval<S>().substr(0)), S>);
  static_assert(std::is_convertible_v<const T*, S> && !std::is_convertible_v<const T*, V>);
  static_assert(!std::is_default_constructible_v<typename V::reverse_iterator>);
  static_assert(std::is_nothrow_destructible_v<S> && std::is_nothrow_destructible_v<VectorOfByte>);
  static_assert(std::is_nothrow_swappable_v<V> && std::is_nothrow_swappable_v<S>);
  static_assert(noexcept(std::declval<S&>().swap(std::declval<S&>())));
  static_assert(noexcept(std::declval<VectorOfByte&>().swap(std::declval<VectorOfByte&>())));
  EXPECT_TRUE((static_cast<T* (V::*)(T*, const T&)>(&V::insert)) != nullptr);
  EXPECT_TRUE((static_cast<void (V::*)(ssize_t, int, const T&)>(&V::insert)) != nullptr);
  EXPECT_TRUE((static_cast<void (V::*)(ssize_t) const>(&V::reserve)) != nullptr);
  EXPECT_TRUE((static_cast<ssize_t (V::*)(const V&, ssize_t)>(&V::find_first_not_of)) != nullptr);
  EXPECT_TRUE((static_cast<S& (S::*)(ssize_t, ssize_t, const T*)>(&S::replace)) != nullptr);
}

} // namespace
