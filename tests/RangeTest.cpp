// Ranges of every kind of iterator, passed to every member that takes one.
#include "Support.h"

#include <cstdint>
#include <deque>
#include <forward_list>
#include <iterator>
#include <list>
#include <sstream>
#include <string>
#include <string_view>
#include <tuple>
#include <utility>
#include <vector>
#if __cplusplus >= 202002L
#include <span>
#endif

using namespace mirel;

namespace {

template <class T> class Range : public testing::Test {};
TYPED_TEST_SUITE(Range, CodeUnits);

const char kUnits[] = "ab\xE9\x80"; // the last two are negative if plain char is signed
constexpr std::size_t kSize = 4;

// Expectations stand outside the templates over iterators, which are compiled for every kind of range.
template <class T>
void Expect(const xvector<T>& got, const std::basic_string<T>& wanted, int line = __builtin_LINE()) {
  EXPECT_EQ(Std(got), wanted) << "in line " << line;
}
void Expect(ssize_t got, ssize_t wanted, int line = __builtin_LINE()) {
  EXPECT_EQ(got, wanted) << "in line " << line;
}

/// Expects that [r1, r2) is the text of kUnits, for each member that copies it.
template <class T, class It> void ExpectCopies(It r1, It r2) {
  const auto text = Std(Of<T>(kUnits));
  basic_xstring<T> s(r1, r2);
  Expect(s, text);
  Expect(xvector<T>(r1, r2), text);
  s.push_back(r1, r2);
  Expect(s, text + text);
  s.push_back(2, r1, r2);
  Expect(s, text + text + text + text);
  s.assign(r1, r2);
  Expect(s, text);
  s.insert(1, r1, r2);
  Expect(s, text.substr(0, 1) + text + text.substr(1));
}

/// Expects that [r1, r2) is the text of kUnits, for each member that looks for it.
template <class T, class It> void ExpectSearches(It r1, It r2) {
  const auto s = Of<T>(std::string("-") + kUnits + kUnits + "-");
  Expect(s.find(r1, r2), 1);
  Expect(s.find(r1, r2, 2), 5);
  Expect(s.rfind(r1, r2), 5);
  Expect(s.rfind(r1, r2, 4), 1);
  Expect(s.find_first_of(r1, r2), 1);
  Expect(s.find_first_not_of(r1, r2, 1), 9);
  Expect(s.find_last_of(r1, r2), 8);
  Expect(s.find_last_not_of(r1, r2, 8), 0);
  Expect(s.contains(r1, r2, 5), true);
  Expect(s.contains(r1, r2, 4), false);
  Expect(s.find(r1, r1, 3), 3);
  Expect(allocation::Count([&] { s.find(r1, r2); }), 0);
  Expect(allocation::Count([&] { s.rfind(r1, r2); }), 0);
  Expect(allocation::Count([&] { s.find_last_of(r1, r2); }), 0);
}

/// Expects that members copy and find [r1, r2), and how often an edit into storage with room allocates.
template <class T, class It> void ExpectAll(It r1, It r2, long allocations) {
  ExpectCopies<T>(r1, r2);
  ExpectSearches<T>(r1, r2);
  basic_xstring<T> s;
  s.reserve(100);
  Expect(allocation::Count([&] { s.push_back(r1, r2); }), allocations);
  Expect(allocation::Count([&] { s.push_back(r2, r2); }), 0);
}
template <class T, class Container> void ExpectAll(const Container& units, long allocations) {
  ExpectAll<T>(units.begin(), units.end(), allocations);
}

template <class U> std::vector<U> Units() {
  std::vector<U> v;
  for (const char c : std::string(kUnits))
    v.push_back(static_cast<U>(static_cast<unsigned char>(c)));
  return v;
}

/// The allocations for a contiguous range, which isn't copied first if its elements are as wide as T.
template <class T, class U> constexpr long kCopies = sizeof(U) == sizeof(T) ? 0 : 1;

enum class Scoped : short {};
template <class T, class... U> void ExpectElements() {
  const std::tuple<std::vector<U>...> units(Units<U>()...);
  std::apply([](const auto&... v) { (ExpectAll<T>(v.data(), v.data() + kSize, kCopies<T, U>), ...); }, units);
}

TYPED_TEST(Range, MayHaveElementsOfAnyType) {
  ExpectElements<TypeParam, char, signed char, unsigned char, short, unsigned short, char16_t, int, wchar_t,
                 char32_t, long long, Scoped>();
}

/// Ranges of elements of type U by iterators of every category.
template <class T, class U> void ExpectIterators() {
  auto v = Units<U>();
  const std::list<U> list(v.begin(), v.end());
  const std::deque<U> deque(v.rbegin(), v.rend());
  const std::forward_list<U> forward(v.begin(), v.end());
  ExpectAll<T>(std::as_const(v), kCopies<T, U>);
  ExpectAll<T>(list, 1);
  ExpectAll<T>(forward, 1);
  ExpectAll<T>(deque.rbegin(), deque.rend(), 1);
  basic_xstring<T> s(v.begin(), v.end());
  s.reserve(100);
  Expect(allocation::Count([&] { s.push_back(v.begin(), v.end()); }), kCopies<T, U>); // not const
  Expect(s, Std(Of<T>(std::string(kUnits) + kUnits)));
#if __cplusplus >= 202002L
  ExpectAll<T>(std::span(v.data(), kSize), kCopies<T, U>);
#endif
}

TYPED_TEST(Range, MayHaveAnyIterators) {
  ExpectIterators<TypeParam, signed char>();
  ExpectIterators<TypeParam, short>();
  ExpectIterators<TypeParam, int>();
}

TYPED_TEST(Range, MayComeFromAnyStringOrView) {
  using T = TypeParam;
  const std::string narrow = kUnits;
  const std::u16string wide = u"ab\xE9\x80";
  const long copiesNarrow = sizeof(T) == 1 ? 0 : 1, copiesWide = 1 - copiesNarrow;
  ExpectAll<T>(narrow, copiesNarrow);
  ExpectAll<T>(std::string_view(narrow), copiesNarrow);
  ExpectAll<T>(Of<char8>(kUnits), copiesNarrow);
  ExpectAll<T>(wide, copiesWide);
  ExpectAll<T>(std::u16string_view(wide), copiesWide);
  ExpectAll<T>(Of<char16>(kUnits), copiesWide);
  auto reversed = Of<T>(std::string(narrow.rbegin(), narrow.rend()));
  const auto& constant = reversed;
  ExpectCopies<T>(reversed.rbegin(), reversed.rend());
  ExpectSearches<T>(constant.rbegin(), constant.rend());
}

TYPED_TEST(Range, OfInputIteratorsIsCopied) {
  std::istringstream text(kUnits);
  const basic_xstring<TypeParam> s(std::istreambuf_iterator<char>{text}, std::istreambuf_iterator<char>{});
  EXPECT_EQ(Std(s), Std(Of<TypeParam>(kUnits)));
}

TYPED_TEST(Range, InTheStringItselfIsTakenAsItWas) {
  using T = TypeParam;
  using Other = std::conditional_t<sizeof(T) == 1, unsigned char, short>;
  auto s = Of<T>("abcd");
  const auto* const p = reinterpret_cast<const Other*>(s.data());
  s.insert(1, p + 1, p + 4);
  EXPECT_EQ(Std(s), Std(Of<T>("abcdbcd")));
  EXPECT_EDIT(s, s.assign(s.rbegin(), s.rend()), "dcbdcba");
  EXPECT_EDIT(s, s.push_back(2, s.begin(), s.begin() + 1), "dcbdcbadd");
}

/// Writes units as char16_t, which only the search reads. If the search read them as the vector's type, clang
/// would leave out the writes.
[[gnu::noinline]] bool StartsWith(const string16& s, char16_t first, char16_t second) {
  const char16_t units[] = {first, second};
  return s.contains(units, units + 2, 0);
}
TEST(RangeTest, UnitsWrittenAsAnotherTypeAreRead) { EXPECT_TRUE(StartsWith(Of<char16>("abc"), u'a', u'b')); }

TYPED_TEST(Range, ElementsThatDontFitAreNowhere) {
  auto s = Of<TypeParam>("a");
  s.push_back(static_cast<TypeParam>(-1));
  const int modulus = 1 << (8 * int(sizeof(TypeParam)));
  for (const int unit : {'a' + modulus, 'a' - modulus, -1}) { // truncated, they would be in the string
    const std::vector<int> v = {unit};
    const std::list<long long> list = {unit};
    EXPECT_EQ(s.find(v.begin(), v.end()), kNpos) << unit;
    EXPECT_EQ(s.rfind(list.begin(), list.end()), kNpos) << unit;
    EXPECT_EQ(s.find_first_of(v.begin(), v.end()), kNpos) << unit;
    EXPECT_EQ(s.find_last_not_of(list.begin(), list.end()), 1) << unit;
    EXPECT_FALSE(s.contains(v.begin(), v.end(), 0)) << unit;
  }
}

TEST(RangeTest, MoreThanMemoryHoldsIsAFailedAllocation) {
  mirel::string16 w;
  const auto at = [](std::size_t address) {
    return std::make_move_iterator(reinterpret_cast<const char*>(address));
  };
  EXPECT_THROW(w.assign(at(1), at(SIZE_MAX / 2)), std::bad_alloc);
}

TEST(RangeTest, ASingleUnitIsReadAsItsUnsignedValue) {
  string16 w;
  const char c = '\xE9';
  const signed char d = -23;
  EXPECT_EDIT(w, w += c, "\xE9");
  EXPECT_EDIT(w, w.push_back(d), "\xE9\xE9");
  EXPECT_EDIT(w, w.append(1, c), "\xE9\xE9\xE9");
  EXPECT_EDIT(w, w.insert(0, c), "\xE9\xE9\xE9\xE9");
  EXPECT_EDIT(w, w.insert(w.begin(), d), "\xE9\xE9\xE9\xE9\xE9");
  EXPECT_EDIT(w, w.resize(6, c), "\xE9\xE9\xE9\xE9\xE9\xE9");
  EXPECT_EDIT(w, w.replace(0, 5, 1, d), "\xE9\xE9");
  EXPECT_EDIT(w, w.push_front(c), "\xE9\xE9\xE9");
  ExpectText(w + c, "\xE9\xE9\xE9\xE9", "+");
  ExpectText(w + d, "\xE9\xE9\xE9\xE9", "+");
  ExpectText(string16(2, c), "\xE9\xE9", "construction");
  EXPECT_EQ(w.find(c, 1), 1);
  EXPECT_EQ(w.find(true), kNpos);
  EXPECT_EQ(w.find_last_not_of(d), kNpos);
  EXPECT_EQ(w.FindAndEraseFirst(c), 1);
  EXPECT_EQ(w.FindAndErase(d), 2);
}

} // namespace
