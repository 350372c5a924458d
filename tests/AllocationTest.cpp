#include "Support.h"

#include <cstdlib>
#include <functional>
#include <limits>
#include <new>
#include <vector>

// The linker puts the wrapper in the place of realloc in a static library; a shared one finds it in the
// program.
#ifdef MIREL_SHARED
#define REAL_REALLOC __libc_realloc
#define WRAPPED_REALLOC realloc
#else
#define REAL_REALLOC __real_realloc
#define WRAPPED_REALLOC __wrap_realloc
#endif

extern "C" void* REAL_REALLOC(void* p, std::size_t n) noexcept;
extern "C" void* WRAPPED_REALLOC(void* p, std::size_t n) noexcept {
  ++allocation::count;
  if (allocation::failAfter == 0 || n > PTRDIFF_MAX)
    return nullptr;
  if (allocation::failAfter > 0)
    --allocation::failAfter;
  return REAL_REALLOC(p, n);
}

namespace {

const volatile ssize_t kMax = std::numeric_limits<ssize_t>::max(); // unknown to the compiler

template <class T> class Allocation : public testing::Test {};
TYPED_TEST_SUITE(Allocation, CodeUnits);

TYPED_TEST(Allocation, GrowthIsGeometric) {
  using S = basic_xstring<TypeParam>;
  const S run = Of<TypeParam>("seventeen units..");
  const std::vector<std::function<void(S&)>> edits = {[](S& s) { s.push_back('x'); },
                                                      [](S& s) { s.append(1, 'x'); },
                                                      [](S& s) { s.resize(s.size() + 1, 'x'); },
                                                      [&](S& s) { s += run; },
                                                      [](S& s) { s.push_back('x'), s.c_str(); },
                                                      [](S& s) { s.append(1, 'x'), s.c_str(); },
                                                      [&](S& s) { s += run, s.c_str(); }};
  for (const auto& edit : edits) {
    S s;
    EXPECT_LT(allocation::Count([&] {
                for (int i = 0; i < 100000; ++i)
                  edit(s);
              }),
              40);
  }
  S s;
  EXPECT_LT(allocation::Count([&] {
              for (int i = 0; i < 2000; ++i)
                s.insert(s.size() / 2, 'x'), s.push_front('y');
            }),
            20);
}

TYPED_TEST(Allocation, CapacityFollowsTheStatedRules) {
  using S = basic_xstring<TypeParam>;
  S s;
  for (const ssize_t capacity : {1, 3, 3, 7, 7, 7, 7, 15}) {
    s.push_back('x');
    EXPECT_EQ(s.capacity(), capacity);
  }
  const TypeParam* const data = s.data();
  s.reserve(15);
  EXPECT_EQ(s.data(), data);
  s.reserve(16);
  EXPECT_EQ(s.capacity(), 16);
  EXPECT_EQ(S(s, 0, 5).capacity(), 5);
  EXPECT_EQ(s.substr(1, 6).capacity(), 6);
  s.assign(9, 'a'), s.erase(0, 8), s.resize(0, 'a'), s.clear();
  EXPECT_EQ(s.capacity(), 16);
  EXPECT_EQ(allocation::Count([&] { s + s, s + 'x'; }), 1) << "an empty sum takes none";
}

TYPED_TEST(Allocation, NoneWhereThereIsRoomAndNothingAliases) {
  using S = basic_xstring<TypeParam>;
  S s = Of<TypeParam>("abcdef");
  s.reserve(40);
  const S r = Of<TypeParam>("xyz");
  EXPECT_EQ(allocation::Count([&] {
              s.append(r), s.insert(2, r.data(), 3), s.replace(1, 2, r, 1, 1),
                  s.push_back(r.begin(), r.end());
              s.assign(r), s = r, s.insert(0, 3, s[0]), s.push_front(s.back()), s += s[1], s.c_str(),
                           s.pop_back();
              s.FindAndErase(s[0]), s.find(r), s.rfind(r), s.compare(r), s._Eq(r);
            }),
            0);
}

TYPED_TEST(Allocation, AFailureChangesNothing) {
  using S = basic_xstring<TypeParam>;
  const S r = Of<TypeParam>("0123456789");
  const std::vector<std::function<void(S&)>> edits = {
      [](S& s) { s.reserve(100); }, [](S& s) { s.resize(100, 'x'); }, [](S& s) { s.c_str(); },
      [](S& s) { s.push_back('x'); }, [](S& s) { s.insert(1, 5, 'x'); }, [&](S& s) { s = r; },
      [&](S& s) { s += r; }, [](S& s) { s += s; }, [](S& s) { s.assign(s, 1, 2); },
      [&](S& s) { s.replace(1, 2, r); }, [](S& s) { s.replace(0, 3, s.data() + 1, 2); },
      [](S& s) { s.assign(s.rbegin(), s.rend()); }, [](S& s) { s.insert(1, s.begin(), s.end()); },
      [](S& s) { s *= 3; }, [](S& s) { s + s; }, [](S& s) { s.substr(); }, [](S& s) { S copy(s); },
      [](S& s) { s.push_front(s[1]); }, [&](S& s) { s.insert(1, r); }, [&](S& s) { s.replace(1, 1, 5, 'x'); },
      [&](S& s) { s.push_back(3, r.begin(), r.end()); }, [&](S& s) { s.append(r.data(), 4); },
      [z = r.c_str()](S& s) { s.append(z); },
      // What no machine can have.
      [](S& s) { s.reserve(kMax); }, [](S& s) { s.resize(kMax, 'x'); }, [](S& s) { s.append(kMax, 'x'); },
      [](S& s) { s.append((kMax - 1) / ssize_t(sizeof(TypeParam)), 'x'); },
      [](S& s) { s.insert(0, kMax / 2 + 1, 'x'); }, [](S& s) { s.assign(kMax, 'x'); },
      [](S& s) { s *= kMax; }, [](S& s) { s *= kMax / 3 + 1; }, [](S& s) { s.append(s.data(), kMax); }};
  for (std::size_t i = 0; i < edits.size(); ++i) {
    int failures = 0;
    for (long failAfter = 0;; ++failAfter) {
      S s(r, 0, 3);
      const auto contents = Std(s);
      const TypeParam* const data = s.data();
      allocation::failAfter = failAfter;
      try {
        edits[i](s);
        allocation::failAfter = -1;
        break;
      } catch (const std::bad_alloc&) {
        allocation::failAfter = -1;
        ++failures;
        ASSERT_EQ(Std(s), contents) << i;
        ASSERT_EQ(s.data(), data) << i;
        ASSERT_EQ(s.capacity(), 3) << i;
      }
      if (failures > 4)
        break; // it never succeeds
    }
    EXPECT_GT(failures, 0) << i;
  }
  S empty;
  empty *= kMax;
  EXPECT_EQ(empty.capacity(), 0);
}

TYPED_TEST(Allocation, AFailedConversionThrowsAndKeepsTheBeginning) {
  using Other = std::conditional_t<sizeof(TypeParam) == 1, char16, char8>;
  basic_xstring<TypeParam> text = Of<TypeParam>("\u20AC");
  text *= 9000;
  basic_xstring<Other> all;
  ASSERT_TRUE(UtfToUtf(all, text.data(), text.size()));
  long failures = 0;
  for (bool isDone = false; !isDone && failures < 20;) {
    basic_xstring<Other> dst(3, 'x');
    allocation::failAfter = failures;
    try {
      isDone = UtfToUtf(dst, text.data(), text.size());
    } catch (const std::bad_alloc&) {
      ++failures;
    }
    allocation::failAfter = -1;
    EXPECT_EQ(Std(dst), Std(all.substr(0, dst.size())));
    EXPECT_EQ(dst.empty(), failures == 1 && !isDone);
  }
  EXPECT_GE(failures, sizeof(Other) == 1 ? 2 : 1);
  mirel::string16 wide(3, 'x');
  allocation::failAfter = 0;
  EXPECT_THROW(mirel::Utf16FromAscii(wide, "abcdef", 6), std::bad_alloc);
  allocation::failAfter = -1;
  EXPECT_EQ(Std(wide), (std::basic_string<char16>(3, 'x')));
  EXPECT_THROW(mirel::Utf16FromAscii(wide, "a", kMax), std::bad_alloc);
  EXPECT_THROW(mirel::Utf16FromUtf8(wide, "a", kMax), std::bad_alloc);
}

} // namespace
