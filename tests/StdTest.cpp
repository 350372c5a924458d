// What utils/Std.h and movable strings add. Namespace mirel and std::literals are used whole, since their
// names must not conflict.
#include "Support.h"

#include <algorithm>
#include <cstdint>
#include <functional>
#include <iomanip>
#include <map>
#include <set>
#include <sstream>
#include <stdexcept>
#include <string_view>
#include <tuple>
#include <unordered_map>
#include <utility>
#include <vector>

#include <utils/Std.h>

using namespace mirel;
using namespace std::literals;

namespace {

template <class T> class StdLibrary : public testing::Test {};
TYPED_TEST_SUITE(StdLibrary, CodeUnits);

/// The operators that hold for a and b.
template <class A, class B> std::string Relations(const A& a, const B& b) {
  return std::string(a == b ? "== " : "") + (a != b ? "!= " : "") + (a < b ? "< " : "") +
         (a <= b ? "<= " : "") + (a > b ? "> " : "") + (a >= b ? ">= " : "");
}
constexpr char kSame[] = "== <= >= ", kBefore[] = "!= < <= ", kAfter[] = "!= > >= ";

TYPED_TEST(StdLibrary, OperatorsOrderUnsignedUnits) {
  using S = basic_xstring<TypeParam>;
  using M = MovableString<TypeParam>;
  static const struct {
    const char *a, *b, *relation;
  } kCases[] = {{"", "", kSame},
                {"", "a", kBefore},
                {"ab", "ab", kSame},
                {"ab", "abc", kBefore},
                {"b", "ab", kAfter},
                {"\x7F", "\x80", kBefore},
                {"a\xFF", "a", kAfter},
                {"\xC3", "z", kAfter},
                {"a long text, one unit", "a long text, one uniu", kBefore}};
  for (const auto& [textA, textB, relation] : kCases) {
    SCOPED_TRACE(testing::Message() << "\"" << textA << "\" and \"" << textB << "\"");
    const S a = Of<TypeParam>(textA), b = Of<TypeParam>(textB), empty;
    EXPECT_EQ(Relations(a, b), relation);
    EXPECT_EQ(Relations(a + empty, b), relation);
    EXPECT_EQ(Relations(M(a), b), relation);
    EXPECT_EQ(Relations(a, M(b)), relation);
    EXPECT_EQ(Relations(a, b.c_str()), relation);
    EXPECT_EQ(Relations(a.c_str(), b), relation);
    EXPECT_EQ(Relations(M(a), b.c_str()), relation);
    if constexpr (sizeof(TypeParam) == 1) {
      EXPECT_EQ(Relations(a, std::string_view(textB)), relation);
      EXPECT_EQ(Relations(std::string_view(textA), b), relation);
      EXPECT_EQ(Relations(std::string(textA), M(b)), relation);
    }
  }
  const S null(1, 0);
  EXPECT_TRUE(null > S().c_str()) << "a null counts in a string and ends a null-terminated one";
}

// Comparisons that aren't ours keep their meaning.
TEST(StdLibrary, OtherComparisonsStayTheirOwn) {
  EXPECT_TRUE("abc"s < "b"sv);
  EXPECT_TRUE(std::make_pair(string8("a"), 2) < std::make_pair(string8("b"), 1));
  EXPECT_EQ(std::vector<string8>(2, "x"), std::vector<string8>({"x", "x"}));
  EXPECT_TRUE(std::make_tuple(string8("a")) == std::make_tuple("a"));
  EXPECT_TRUE(std::equal_to<>()(string8("a"), "a"));
  std::ostringstream os;
  os << "abc" << 'd' << "e"s;
  EXPECT_EQ(os.str(), "abcde");
}

TYPED_TEST(StdLibrary, MapsAreSearchedWithoutCopies) {
  using S = basic_xstring<TypeParam>;
  const S long1 = Of<TypeParam>("a key that is too long for any buffer in the object"), long2 = long1;
  const TypeParam* const p = long1.c_str();
  std::map<S, int, Less> ordered;
  std::unordered_map<MovableString<TypeParam>, int, Hash, Equal> hashed;
  ordered[long1] = 1;
  hashed[long1] = 2;
  const long before = allocation::count;
  EXPECT_EQ(ordered.count(p), 1U);
  if constexpr (sizeof(TypeParam) == 1) {
    EXPECT_EQ(ordered.count(View(long2)), 1U);
  }
#if defined(__cpp_lib_generic_unordered_lookup)
  EXPECT_EQ(hashed.count(p), 1U);
  EXPECT_EQ(hashed.count(long2), 1U);
#endif
  EXPECT_EQ(allocation::count, before);
  EXPECT_TRUE(Equal()(p, long2.c_str())) << "two pointers are two texts";
  EXPECT_FALSE(Less()(p, long2.c_str()));
  EXPECT_NE(Hash()(Of<TypeParam>("units")), Hash()(Of<TypeParam>("unity")));
  EXPECT_EQ(std::hash<S>()(long1), Hash()(p));
  EXPECT_EQ(std::hash<MovableString<TypeParam>>()(long1), Hash()(p));
  EXPECT_EQ((std::unordered_map<S, int>{{long1, 3}}[long2]), 3);
  EXPECT_EQ(std::set<S>({long1, long2}).size(), 1U);
}

TEST(StdLibrary, ViewsAndCopiesKeepEveryUnit) {
  const string8 bytes("a\0\xFF", 3);
  EXPECT_EQ(View(bytes).data(), bytes.data());
  EXPECT_EQ(View(bytes), "a\0\xFF"sv);
  EXPECT_EQ(ToString(bytes), "a\0\xFF"s);
  EXPECT_EQ(ToString8("a\0\xFF"sv), bytes);
  EXPECT_EQ(ToString8(u8"Grüße"), "Gr\xC3\xBC\xC3\x9F"
                                  "e");
  const std::u16string units = u"a\0\xFFFF"s;
  EXPECT_EQ(Std(ToString16(units)), (std::basic_string<char16>{'a', 0, 0xFFFF}));
  EXPECT_EQ(ToU16String(ToString16(units)), units);
  EXPECT_EQ(std::hash<string8>()(bytes), std::hash<std::string_view>()("a\0\xFF"sv));
  EXPECT_EQ(Hash()("a\0\xFF"sv), std::hash<std::string_view>()("a\0\xFF"sv));
  const string8 empty; // has no storage
  EXPECT_EQ(View(empty), ""sv);
  EXPECT_EQ(ToU16String(string16()), u"");
  EXPECT_EQ(ToString8(std::string_view()).data(), nullptr);
  EXPECT_EQ(ToString16({}).data(), nullptr);
  EXPECT_EQ(Hash()(empty), Hash()(""));
}

TEST(StdLibrary, StreamsPadAsTheyPadAView) {
  const string8 s("a\0\xFF", 3);
  std::ostringstream ours, theirs;
  const auto write = [](std::ostream& os, const auto& text) {
    os << std::setfill('_') << '<' << std::setw(6) << text << std::left << std::setw(5) << text << text
       << '>';
  };
  write(ours, s);
  write(theirs, View(s));
  EXPECT_EQ(ours.str(), theirs.str());
  ours.str("");
  ours << mstring8("ab") + s;
  EXPECT_EQ(ours.str(), "aba\0\xFF"s);
}

TYPED_TEST(StdLibrary, MovableStringsMoveStorage) {
  using S = basic_xstring<TypeParam>;
  using M = MovableString<TypeParam>;
  static_assert(std::is_nothrow_move_constructible_v<M>);
  static_assert(std::is_nothrow_move_assignable_v<M>);
  static_assert(std::is_nothrow_swappable_v<M>);
  static_assert(sizeof(M) == sizeof(S));
  S s = Of<TypeParam>("text");
  const TypeParam* const storage = s.data();
  EXPECT_EQ(allocation::Count([&] {
              M a = std::move(s), b;
              EXPECT_TRUE(s.empty());
              b = std::move(a);
              EXPECT_TRUE(a.empty());
              M c(std::move(b));
              c = std::move(c);
              EXPECT_TRUE(b.empty());
              using std::swap;
              swap(a, c);
              swap(a, b);
              s.swap(b);
            }),
            0);
  EXPECT_EQ(s.data(), storage);

  M copy = s, sum = s + s, of = s.c_str(), two(2, 'x');
  EXPECT_EQ(sum, Of<TypeParam>("texttext"));
  EXPECT_EQ(two, Of<TypeParam>("xx"));
  copy = sum;
  of = s;
  sum = s + copy;
  two = s.c_str();
  EXPECT_EQ(copy, Of<TypeParam>("texttext"));
  EXPECT_EQ(sum, Of<TypeParam>("texttexttext"));
  EXPECT_EQ(of, two);
}

TYPED_TEST(StdLibrary, VectorsOfMovableStringsCopyNoText) {
  const auto fig = Of<TypeParam>("fig"), pear = Of<TypeParam>("pear");
  std::vector<MovableString<TypeParam>> words = {pear, fig, {}, fig};
  EXPECT_EQ(allocation::Count([&] {
              words.reserve(100);
              std::sort(words.begin(), words.end());
              words.erase(std::unique(words.begin(), words.end()), words.end());
              words.insert(words.begin() + 1, basic_xstring<TypeParam>());
            }),
            0);
  const std::vector<MovableString<TypeParam>> expected = {{}, {}, fig, pear};
  EXPECT_EQ(words, expected);
}

TYPED_TEST(StdLibrary, FillFromKeepsWhatWasWritten) {
  using S = basic_xstring<TypeParam>;
  S s = Of<TypeParam>("ab");
  const auto fill = [](unsigned n) {
    return [n](TypeParam* p, ssize_t room) {
      EXPECT_GE(room, ssize_t(n));
      std::fill(p, p + n, TypeParam('x'));
      return n;
    };
  };
  EXPECT_EQ(FillFrom(s, 5, fill(3)), 3);
  EXPECT_EQ(s, Of<TypeParam>("abxxx"));
  EXPECT_EQ(FillFrom(s, 0U, fill(0)), 0);
  EXPECT_EQ(FillFrom(s, std::size_t{9}, fill(0)), 0);
  EXPECT_THROW(
      FillFrom(s, 100, [](TypeParam* p, ssize_t) -> int { throw std::runtime_error(p ? "" : "null"); }),
      std::runtime_error);
  EXPECT_THROW(FillFrom(s, PTRDIFF_MAX, fill(1)), std::bad_alloc);
  EXPECT_EQ(s, Of<TypeParam>("abxxx"));
  S exact;
  FillFrom(exact, 1000, fill(1000));
  EXPECT_EQ(exact.capacity(), 1000);
}

} // namespace
