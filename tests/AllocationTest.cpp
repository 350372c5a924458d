#include "Support.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <functional>
#include <limits>
#include <new>
#include <vector>

#include <malloc.h>

#include <utils/Std.h>

// The linker replaces the static library's realloc with the wrapper; a shared library finds it in the
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
  allocation::requested = n;
  if (allocation::failAfter == 0 || n > PTRDIFF_MAX / 4) // even if a 32-bit machine has so much memory
    return nullptr;
  if (allocation::failAfter > 0)
    --allocation::failAfter;
  // Each growth moves the storage and overwrites the old one, so that stale pointers read other bytes.
  void* const moved = REAL_REALLOC(nullptr, n);
  if (p != nullptr && moved != nullptr) {
    const std::size_t size = malloc_usable_size(p);
    std::memcpy(moved, p, std::min(n, size));
    std::memset(p, 0xDD, size);
    std::free(p);
  }
  return moved;
}

namespace {

const volatile ssize_t kMax = std::numeric_limits<ssize_t>::max(); // unknown to the compiler
const volatile mirel::int64 kWide = mirel::int64(1) << 62;         // its lower 32 bits are 0

/// An edit, and its source text.
template <class V> struct Edit {
  const char* text;
  std::function<void(V&)> make;
};
#define EDIT(...)                                                                                            \
  {                                                                                                          \
#__VA_ARGS__, [&](auto& s) { __VA_ARGS__; }                                                              \
  }
template <class V> using EditsOf = std::vector<Edit<V>>;

template <class T> class Allocation : public testing::Test {};
TYPED_TEST_SUITE(Allocation, CodeUnits);

TYPED_TEST(Allocation, GrowthIsGeometric) {
  using S = basic_xstring<TypeParam>;
  const S text = Of<TypeParam>("seventeen units..");
  const EditsOf<S> edits = {
    EDIT(s.push_back('x')),
    EDIT(s.append(1, 'x')),
    EDIT(s.resize(s.size() + 1, 'x')),
    EDIT(s += text),
    EDIT(s.push_back('x'); s.c_str()),
    EDIT(s.append(1, 'x'); s.c_str()),
    EDIT(s += text; s.c_str()),
    EDIT(FillFrom(s, 10, [](auto*, ssize_t n) { return n - 3; }))
  };
  const auto allocations = [](int times, const Edit<S>& edit) {
    S s;
    return allocation::Count([&] {
      for (int i = 0; i < times; ++i)
        edit.make(s);
    });
  };
  for (const auto& edit : edits)
    EXPECT_LT(allocations(100000, edit), 40) << edit.text;
  EXPECT_LT(allocations(2000, EDIT(s.insert(s.size() / 2, 'x'))), 20);
  EXPECT_LT(allocations(2000, EDIT(s.push_front('y'))), 20);
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
  s.assign(9, 'a');
  s.erase(0, 8);
  s.resize(0, 'a');
  s.clear();
  EXPECT_EQ(s.capacity(), 16) << "only growth changes it";
  EXPECT_EQ(allocation::Count([&] { s + s; }), 0) << "an empty sum allocates nothing";
  s.resize(12, 'a');
  EXPECT_EQ(allocation::Count([&] { s + s; }), 1);
  EXPECT_EQ(allocation::Count([&] { s + 'x'; }), 1);
}

TYPED_TEST(Allocation, NoneIfThereIsRoomAndNoRangeAliases) {
  using S = basic_xstring<TypeParam>;
  const S r = Of<TypeParam>("xyz");
  const EditsOf<S> edits = {
    EDIT(s.append(r)),
    EDIT(s.insert(2, r.data(), 3)),
    EDIT(s.replace(1, 2, r, 1, 1)),
    EDIT(s.push_back(r.begin(), r.end())),
    EDIT(s.assign(r)),
    EDIT(s = r),
    EDIT(s.insert(0, 3, s[0])),
    EDIT(s.push_front(s.back())),
    EDIT(s += s[1]),
    EDIT(s.pop_back(); s.c_str()),
    EDIT(s.FindAndErase(s[0])),
    EDIT(s = *&s),
    EDIT(s.resize(6, 'x')),
    EDIT(s.assign(6, 'x')),
    EDIT(s.replace(0, 1, 4, 'x')),
    EDIT(s.resize(5, 'x'); s.c_str()),
    EDIT(s.push_back('x'); s.push_back('y'); s.push_back('z'))
  };
  for (const auto& edit : edits) {
    S s = Of<TypeParam>("abc");
    s.reserve(6); // most edits fill it exactly
    EXPECT_EQ(allocation::Count([&] { edit.make(s); }), 0) << edit.text;
    EXPECT_EQ(s.capacity(), 6) << edit.text;
  }
}

/// Expects that each edit throws if one of its allocations fails, and leaves v as it was.
template <class V> void ExpectSafe(const V& v, const EditsOf<V>& edits) {
  for (const auto& edit : edits) {
    SCOPED_TRACE(edit.text);
    int failures = 0;
    for (; failures < 4; ++failures) { // some edits never succeed
      V s(v);
      const auto* const data = s.data();
      allocation::failAfter = failures;
      try {
        edit.make(s);
        break;
      } catch (const std::bad_alloc&) {
      }
      allocation::failAfter = -1;
      ASSERT_EQ(s, v);
      ASSERT_EQ(s.data(), data);
      ASSERT_EQ(s.capacity(), v.size());
    }
    allocation::failAfter = -1;
    EXPECT_GT(failures, 0);
  }
}

TYPED_TEST(Allocation, AFailureChangesNothing) {
  using S = basic_xstring<TypeParam>;
  const S r = Of<TypeParam>("0123456789");
  const TypeParam* const z = r.c_str();
  ExpectSafe<S>(
      Of<TypeParam>("012"),
      {EDIT(s.reserve(100)), EDIT(s.resize(100, 'x')), EDIT(s.c_str()), EDIT(s.push_back('x')),
       EDIT(s.insert(1, 5, 'x')), EDIT(s = r), EDIT(s.assign(r)), EDIT(s.assign(z, 9)),
       EDIT(s.assign(9, 'x')), EDIT(s += r), EDIT(s += s), EDIT(s.assign(s, 1, 2)), EDIT(s.replace(1, 2, r)),
       EDIT(s.replace(0, 3, s.data() + 1, 2)), EDIT(s.assign(s.rbegin(), s.rend())),
       EDIT(s.insert(1, s.begin(), s.end())), EDIT(s *= 3), EDIT(s + s), EDIT(s.substr()), EDIT(S copy(s)),
       EDIT(s.push_front(s[1])), EDIT(s.insert(1, r)), EDIT(s.replace(1, 1, 5, 'x')),
       EDIT(s.push_back(3, r.begin(), r.end())), EDIT(s.append(z, 4)), EDIT(s.append(z)),
       // More than any machine has.
       EDIT(s.reserve(kMax)), EDIT(s.resize(kMax, 'x')), EDIT(s.append(kMax, 'x')),
       EDIT(s.append((kMax - 1) / ssize_t(sizeof(TypeParam)), 'x')), EDIT(s.insert(0, kMax / 2 + 1, 'x')),
       EDIT(s.assign(kMax, 'x')), EDIT(s *= kMax), EDIT(s *= kMax / 3 + 1), EDIT(s.append(s.data(), kMax))});
  S empty;
  empty *= kMax;
  EXPECT_THROW(empty.append(kWide, 'x'), std::bad_alloc);
  EXPECT_EQ(empty.capacity(), 0);
}

TEST(Allocation, AFailureLeavesABufferAsItWas) {
  const mirel::VectorOfByte r(9, 7);
  ExpectSafe<mirel::VectorOfByte>({1, 2, 3}, {EDIT(s.assign(r.begin(), r.end())), EDIT(s = r), EDIT(s += r),
                                              EDIT(s.insert(1, 9, 7)), EDIT(s.insert(1, r.begin(), r.end())),
                                              EDIT(s.insert(1, 7)), EDIT(s.growbytes(1)), EDIT(s.resize(4)),
                                              EDIT(s.push_back('x')), EDIT(s.insertbytes(0, kMax)),
                                              EDIT(s.resize(kMax))});
}

TYPED_TEST(Allocation, SumsOfSizesDontOverflow) {
  using S = basic_xstring<TypeParam>;
  constexpr ssize_t unit = sizeof(TypeParam), largest = std::numeric_limits<ssize_t>::max() / unit;
  S v(1, 'x');
  mirel::VectorOfByte& bytes = reinterpret_cast<mirel::VectorOfByte&>(v);
  const TypeParam* const data = v.data();
  const auto expectFailure = [&](ssize_t size, const Edit<S>& edit, ssize_t requested) {
    SCOPED_TRACE(edit.text);
    bytes.size_ = bytes.m_capacity = size * unit; // the storage is smaller, so nothing may be moved
    allocation::requested = 0;
    EXPECT_THROW(edit.make(v), std::bad_alloc);
    EXPECT_EQ(allocation::requested, std::size_t(requested * unit));
    EXPECT_EQ(v.size(), size);
    EXPECT_EQ(v.capacity(), size);
    EXPECT_EQ(v.data(), data);
  };
  for (const auto& edit : EditsOf<S>{EDIT(s.push_back('x')), EDIT(s.append(1, 'x')), EDIT(s.insert(0, 'x')),
                                     EDIT(s.c_str()), EDIT(s + s), EDIT(s + 'x'), EDIT(s *= 2)})
    expectFailure(largest, edit, 0);
  // Growth asks for no more than the edit needs if the doubled capacity would overflow.
  const ssize_t size = largest / 4 * 3;
  expectFailure(size, EDIT(s.push_back('x')), size + 1);
  expectFailure(size, EDIT(s.append(5, 'x')), size + 5);
  expectFailure(size, EDIT(s.c_str()), size + 1);
  bytes.size_ = bytes.m_capacity = unit;
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
