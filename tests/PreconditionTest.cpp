// The calls that stop the process, each with its text, and the storage unchanged.
#include "Support.h"

#include <csignal>
#include <deque>
#include <functional>
#include <initializer_list>
#include <iterator>
#include <limits>
#include <list>
#include <memory>
#include <string>
#include <tuple>
#include <type_traits>
#include <unistd.h>
#include <utility>
#include <vector>

#include <utils/Std.h>
#include <utils/Utf.h>
#include <utils/xostream.h>

using mirel::string16;
using mirel::string8;
using mirel::VectorOfByte;

namespace {

// Volatile, so that compilers don't evaluate the calls and refuse them.
const volatile ssize_t kMax = std::numeric_limits<ssize_t>::max();
const volatile ssize_t kMin = std::numeric_limits<ssize_t>::min();

const char kPointer[] = "pn == 0 || (pn > 0 && p != nullptr)";
const char kRange[] = "r1 <= r2";
const char kSource[] = "0 <= ri && 0 <= rn && ri+rn <= r.size()";
const char kIndexCount[] = "0 <= i && 0 <= n && i+n <= size()";
const char kMoveTo[] = "0 <= d && 0 <= n && d+n <= size()";
const char kMoveFrom[] = "0 <= s && 0 <= n && s+n <= size()";
const char kForward[] = "0 <= offset && offset <= size()";
const char kReverse[] = "offset == npos || (0 <= offset && offset < size())";
const char kLength[] = "count == npos || (0 <= count && offset+count <= size())";
const char kIndex[] = "0 <= i && i <= size()";
const char kElement[] = "0 <= i && i < size()";
const char kIterator[] = "begin() <= i && i < end()";
const char kIterators[] = "begin() <= i1 && i1 <= i2 && i2 <= end()";
const char kCount[] = "0 <= count";
const char kNotEmpty[] = "size() > 0";
const char kCopied[] = "src1 == src2 || (src1 < src2 && src1 != nullptr && dst != nullptr)";

std::function<bool()> unchanged;

void ReportState(int) {
  const char* const text = unchanged() ? "[unchanged]\n" : "[changed]\n";
  if (write(STDERR_FILENO, text, strlen(text)) < 0)
    _exit(1);
}

/// Expects that stop ends the process with text, and that the storage is unchanged then.
void ExpectStop(const std::function<void()>& stop, const std::string& text, const std::string& call) {
  const auto reportAndStop = [&] {
    std::signal(SIGABRT, ReportState);
    stop();
  };
  EXPECT_EXIT(reportAndStop(), testing::KilledBySignal(SIGABRT),
              testing::AllOf(testing::ContainsRegex("tests: utils/[a-zA-Z/]+\\.(h|cpp):[0-9]+: .*::"),
                             testing::HasSubstr("Assertion `" + text + "' failed"),
                             testing::HasSubstr("[unchanged]")))
      << call;
}

/// A call with a container and arguments, and its source text. It refers to the closure that makes the call,
/// since hundreds of std::functions take a compiler a minute.
template <class V, class... A> struct CallOf {
  template <class F>
  CallOf(const char* text_, const F& f)
      : text(text_), closure(&f),
        invoke([](const void* g, V& v, A... a) { (*static_cast<const F*>(g))(v, a...); }) {}
  const char* text;
  const void* closure;
  void (*invoke)(const void*, V&, A...);
};
#define CALL(PARAMETERS, ...)                                                                                \
  {                                                                                                          \
#__VA_ARGS__, [&] PARAMETERS { static_cast<void>(v); static_cast<void>(__VA_ARGS__); }                       \
  }
#define WITHOUT(...) CALL((auto& v), __VA_ARGS__)
#define WITH_I(...) CALL((auto& v, ssize_t i), __VA_ARGS__)
#define WITH_N(...) CALL((auto& v, ssize_t n), __VA_ARGS__)
#define WITH_I_N(...) CALL((auto& v, ssize_t i, ssize_t n), __VA_ARGS__)
#define WITH_I1_I2(...) CALL((auto& v, ssize_t i1, ssize_t i2), __VA_ARGS__)
#define WITH_P_PN(...) CALL((auto& v, auto p, ssize_t pn), __VA_ARGS__)
#define WITH_R1_R2(...) CALL((auto& v, auto r1, auto r2), __VA_ARGS__)
#define FORWARD(WITH, ...)                                                                                   \
  WITH(v.find(__VA_ARGS__)), WITH(v.find_first_of(__VA_ARGS__)), WITH(v.find_first_not_of(__VA_ARGS__))
#define REVERSE(WITH, ...)                                                                                   \
  WITH(v.rfind(__VA_ARGS__)), WITH(v.find_last_of(__VA_ARGS__)), WITH(v.find_last_not_of(__VA_ARGS__))

/// An argument as a message shows it: a pointer, or an iterator that converts to one, by its address, since
/// what it points to isn't null-terminated.
template <class A> auto Shown(A a) {
  if constexpr (std::is_convertible_v<A, const void*>)
    return static_cast<const void*>(a);
  else
    return a;
}

/// Expects that each of the calls stops with text for each of the arguments, and that the storage of v is
/// unchanged then.
template <class V, class... A>
void ExpectStops(V& v, const std::string& text, const std::vector<std::tuple<A...>>& arguments,
                 std::initializer_list<CallOf<V, A...>> calls) {
  const VectorOfByte& b = reinterpret_cast<const VectorOfByte&>(v);
  const VectorOfByte before = b;
  unchanged = [&, data = b.data(), capacity = b.capacity()] {
    return b == before && b.data() == data && b.capacity() == capacity;
  };
  for (const auto& call : calls)
    for (const auto& values : arguments) {
      const auto shown = std::apply([](A... a) { return std::tuple(Shown(a)...); }, values);
      ExpectStop([&] { std::apply([&](A... a) { call.invoke(call.closure, v, a...); }, values); }, text,
                 call.text + (" with arguments " + testing::PrintToString(shown)));
    }
}

template <class T> class Precondition : public testing::Test {};
TYPED_TEST_SUITE(Precondition, CodeUnits);

using Singles = std::vector<std::tuple<ssize_t>>;
using Pairs = std::vector<std::tuple<ssize_t, ssize_t>>;
const std::vector<std::tuple<>> kOnce = {{}};

// Bad values for a string of three units.
const Singles kBadIndex = {{-1}, {4}, {kMin}, {kMax}};
const Singles kBadElement = {{-1}, {3}, {kMin}, {kMax}};
const Singles kBadReverse = {{-2}, {3}, {kMin}, {kMax}};
const Singles kBadLengthFrom2 = {{-2}, {2}, {kMin}, {kMax}};
const Singles kBadCount = {{-1}, {kMin}};
const Pairs kBadSubrange = {{-1, 1},      {0, -1},      {1, 3},       {4, 0},    {1, kMax},
                            {kMax, kMax}, {kMin, kMax}, {kMin, kMin}, {kMax, 1}, {2, kMin}};
const Pairs kBadIndices = {{-1, 1}, {2, 1}, {0, 4}, {4, 4}, {0, kMax}, {kMin, kMin}};
const Pairs kBadIterators = {{-1, 1}, {2, 1}, {0, 4}, {4, 4}};

// If a call is bad in two ways, with an index of 99 for example, the first check must report it.

TYPED_TEST(Precondition, StopsBadSubranges) {
  using S = basic_xstring<TypeParam>;
  const S r = Of<TypeParam>("xyz");
  const TypeParam x = 'x';
  S s = Of<TypeParam>("abc");
  ExpectStops(s, kSource, kBadSubrange,
              {WITH_I_N(S(r, i, n)), WITH_I_N(v.assign(r, i, n)), WITH_I_N(v.append(r, i, n)),
               WITH_I_N(v.insert(99, r, i, n)), WITH_I_N(v.replace(0, 1, r, i, n))});
  ExpectStops(s, kIndexCount, kBadSubrange,
              {WITH_I_N(v.replace(i, n, r)), WITH_I_N(v.replace(i, n, r, 9, 9)),
               WITH_I_N(v.replace(i, n, nullptr, 1)), WITH_I_N(v.replace(i, n, -1, x)),
               WITH_I_N(v.replace(i, n, r.c_str()))});
  ExpectStops(s, "0 <= i1 && i1 <= i2 && i2 <= size()", kBadIndices, {WITH_I1_I2(v.erase_range(i1, i2))});
  ExpectStops(s, kIterators, kBadIterators,
              {WITH_I1_I2(v.replace(v.begin() + i1, v.begin() + i2, r)),
               WITH_I1_I2(v.replace(v.begin() + i1, v.begin() + i2, nullptr, 1)),
               WITH_I1_I2(v.replace(v.begin() + i1, v.begin() + i2, -1, x))});
}

TYPED_TEST(Precondition, StopsBadIndicesAndCounts) {
  using T = TypeParam;
  using S = basic_xstring<T>;
  const S r = Of<T>("xyz");
  const T *const q = r.data(), *const z = r.c_str(), x = 'x';
  S s = Of<T>("abc");
  ExpectStops(s, kForward, kBadIndex,
              {FORWARD(WITH_I, x, i), FORWARD(WITH_I, r, i), FORWARD(WITH_I, z, i),
               FORWARD(WITH_I, q + 1, q, i), WITH_I(v.contains(q + 1, q, i)), WITH_I(v.substr(i, 9))});
  ExpectStops(
      s, kReverse, kBadReverse,
      {REVERSE(WITH_I, x, i), REVERSE(WITH_I, r, i), REVERSE(WITH_I, z, i), REVERSE(WITH_I, q + 1, q, i)});
  ExpectStops(s, kLength, kBadLengthFrom2, {WITH_N(v.substr(2, n))});
  ExpectStops(s, kIndex, kBadIndex,
              {WITH_I(v.insert(i, r)), WITH_I(v.insert(i, r, 0, 1)), WITH_I(v.insert(i, q, 1)),
               WITH_I(v.insert(i, z))});
  ExpectStops(s, kIndex, Singles{{-1}, {4}}, {WITH_I(v.insert(v.begin() + i, x))});
  ExpectStops(s, kElement, kBadElement, {WITH_I(v[i] = x)});
  ExpectStops(s, kCount, kBadCount,
              {WITH_N(xvector<T>(n, x)), WITH_N(v.assign(n, x)), WITH_N(v.append(n, x)),
               WITH_N(v.insert(v.begin(), n, x)), WITH_N(v.replace(1, 1, n, x)),
               WITH_N(v.replace(v.begin(), v.end(), n, x)), WITH_N(v.push_back(n, q + 1, q)),
               WITH_N(v *= n)});
  ExpectStops(s, "size >= 0", kBadCount, {WITH_N(v.reserve(n))});
  ExpectStops(s, "newSize >= 0", kBadCount, {WITH_N(v.resize(n, x))});
  const auto filled = [](ssize_t n) { return [n](T*, ssize_t) { return n; }; };
  ExpectStops(s, "0 <= most", kBadCount, {WITH_N(mirel::FillFrom(v, n, filled(0)))});
  ExpectStops(s, "0 <= filled && filled <= most", Singles{{-1}, {1}, {kMax}, {kMin}},
              {WITH_N(mirel::FillFrom(v, 0, filled(n)))});
}

/// Expects that members that copy [r1, r2) stop with one text, and members that search for it with another.
template <class S, class It>
void ExpectRangeStops(S& s, It from, It to, const char* copying, const char* searching) {
  const std::vector<std::tuple<It, It>> range = {{from, to}};
  ExpectStops(s, copying, range,
              {WITH_R1_R2(S(r1, r2)), WITH_R1_R2(v.assign(r1, r2)), WITH_R1_R2(v.push_back(r1, r2)),
               WITH_R1_R2(v.push_back(2, r1, r2)), WITH_R1_R2(v.insert(1, r1, r2))});
  if (searching)
    ExpectStops(
        s, searching, range,
        {WITH_R1_R2(v.contains(r1, r2, 0)), FORWARD(WITH_R1_R2, r1, r2), REVERSE(WITH_R1_R2, r1, r2)});
}

TYPED_TEST(Precondition, StopsBadRanges) {
  using T = TypeParam;
  using S = basic_xstring<T>;
  const S r = Of<T>("xyz");
  const T *const q = r.data(), *const volatile null = nullptr;
  const std::vector<int> ints = {'a', 1 << 16};
  const int* const volatile nullInt = nullptr;
  const std::deque<T> deque(3);
  const std::string text = "xyz";
  S s = Of<T>("abc");
  const auto reversed = [&](auto r1, auto r2) { ExpectRangeStops(s, r1, r2, kRange, kRange); };
  reversed(q + 1, q);
  reversed(ints.data() + 1, ints.data());
  reversed(ints.end(), ints.begin());
  reversed(text.end(), text.begin());
  reversed(deque.end(), deque.begin());
  reversed(deque.rend(), deque.rbegin());
  reversed(r.rend(), r.rbegin());
  reversed(s.rend(), s.rbegin());
  reversed(q, +null);
  const auto isNull = [&](auto r1, auto r2) {
    ExpectRangeStops(s, r1, r2, kCopied, "r1 == r2 || r1 != nullptr");
  };
  isNull(+null, q);
  isNull(+nullInt, ints.data());
  isNull(const_cast<T*>(null), s.end());
  isNull(std::reverse_iterator<const T*>(q), std::reverse_iterator<const T*>(null));
  isNull(typename S::const_reverse_iterator(q), typename S::const_reverse_iterator(null));
  isNull(std::make_move_iterator(std::string::const_iterator()), std::make_move_iterator(text.end()));
  ExpectRangeStops(s, ints.begin(), ints.end(), "Fits<T>(*r1)", nullptr);
  const std::list<short> negative(1, -1);
  if (sizeof(T) == 1)
    ExpectRangeStops(s, negative.begin(), negative.end(), "Fits<T>(*r1)", nullptr);
  // What is checked before a range.
  ExpectStops(s, kCount, kBadCount, {WITH_N(v.push_back(n, +null, q)), WITH_N(v.push_back(n, q + 1, q))});
  ExpectStops(s, kForward, kBadIndex, {FORWARD(WITH_I, +null, q, i), WITH_I(v.contains(+null, q, i))});
  ExpectStops(s, kReverse, kBadReverse, {REVERSE(WITH_I, +null, q, i)});
  ExpectStops(s, kRange, kOnce, {WITHOUT(v.push_back(0, q + 1, q))});
  EXPECT_EDIT(s, s.push_back(0, +null, q), "abc");
  EXPECT_EDIT(s, s.push_back(0, ints.begin(), ints.end()), "abc");
}

TYPED_TEST(Precondition, StopsNullStrings) {
  using T = TypeParam;
  using S = basic_xstring<T>;
  S s = Of<T>("abc");
  const T* const volatile null = nullptr;
#define WITH_Z(...) CALL((auto& v, auto z), __VA_ARGS__)
  ExpectStops(s, "s != nullptr", std::vector<std::tuple<const T*>>{{null}},
              {WITH_Z(S{z}), WITH_Z(v = z), WITH_Z(v.assign(z)), WITH_Z(v += z), WITH_Z(v.append(z)),
               WITH_Z(v.insert(99, z)), WITH_Z(v.replace(99, 9, z)), WITH_Z(v.compare(z)),
               WITH_Z(v.compare(99, 9, z)), WITH_Z(v._Eq(z)), WITH_Z(v._Lt(z)), FORWARD(WITH_Z, z, 99),
               REVERSE(WITH_Z, z, 99)});
}

TYPED_TEST(Precondition, StopsBadPointersAndCounts) {
  using T = TypeParam;
  using S = basic_xstring<T>;
  const S r = Of<T>("xyz");
  const T* const q = r.data();
  T* const volatile null = nullptr;
  S s = Of<T>("abc");
  ExpectStops(s, kPointer,
              std::vector<std::tuple<const T*, ssize_t>>{{null, 1}, {null, kMax}, {q, -1}, {q, kMin}},
              {WITH_P_PN(S(p, pn)), WITH_P_PN(v.assign(p, pn)), WITH_P_PN(v.append(p, pn)),
               WITH_P_PN(v.insert(99, p, pn)), WITH_P_PN(v.replace(1, 1, p, pn)),
               WITH_P_PN(v.replace(v.begin(), v.end(), p, pn)), WITH_P_PN(v.compare(p, pn)),
               FORWARD(WITH_P_PN, p, 99, pn), REVERSE(WITH_P_PN, p, 99, pn)});
  const auto empty = std::make_unique<S>();
  const S& constEmpty = *empty;
  ExpectStops(s, kNotEmpty, kOnce, {WITHOUT(empty->pop_front()), WITHOUT(empty->pop_back())});
  ExpectStops(s, "p", kOnce,
              {WITHOUT(*empty->rbegin()), WITHOUT(empty->rbegin().operator->()), WITHOUT(++empty->rbegin()),
               WITHOUT(constEmpty.rbegin()--)});
}

TYPED_TEST(Precondition, StopsBadElementRanges) {
  using T = TypeParam;
  using mirel::p_copy, mirel::p_create;
  auto s = Of<T>("abc");
  T* const volatile null = nullptr, * const q = s.begin();
  ExpectStops(s, "r1 >= r2 || r1 != nullptr", kOnce, {WITHOUT(p_create(+null, q, 'x'))});
  ExpectStops(s, kCopied, std::vector<std::tuple<const T*, const T*>>{{q + 1, q}, {null, q}},
              {WITH_R1_R2(p_copy(q, r1, r2)), WITH_R1_R2(p_copy(+null, r1, r2))});
  ExpectStops(s, "src1 == src2 || dst != nullptr", kOnce, {WITHOUT(p_copy(+null, v.begin(), v.end()))});
  const T* const c = q;
  ExpectStops(s, kCopied, kOnce, {WITHOUT(p_copy(+null, c, c + 1))});
  ExpectStops(s, kCount, kOnce, {WITHOUT(xvector<T>(int{-1}, T('x')))});
  T copied[3] = {};
  p_copy(copied, q, q + 3);
  EXPECT_EQ(copied[2], 'c');
  EXPECT_EQ((xvector<T>{'a', 'b', 'c'}).size(), 3);
  EXPECT_EDIT(s, p_copy(+null, q, q), "abc");
  EXPECT_EDIT(s, p_create(+null, +null, 'x'), "abc");
  EXPECT_EDIT(s, p_create(q + 3, q, 'x'), "abc");
}

TEST(Precondition, StopsBadCallsOfBuffers) {
  const uint8_t byte = 1;
  VectorOfByte b{1, 2, 3};
  ExpectStops(b, "size_ >= 0", Singles{{4}, {kMax}}, {WITH_N(v.pop_back(n))});
  ExpectStops(b, kCount, kBadCount, {WITH_N(v.pop_back(n)), WITH_N(v.growbytes(n))});
  ExpectStops(b, "0 <= n", kBadCount, {WITH_N(v.resize(n)), WITH_N(v.insertbytes(3, n))});
  ExpectStops(b, kIndex, kBadIndex, {WITH_I(v.insertbytes(i, -1))});
  const std::vector<std::tuple<const uint8_t*, const uint8_t*>> reversed = {{&byte + 1, &byte}};
  ExpectStops(b, kRange, reversed, {WITH_R1_R2(v.insert(v.begin(), r1, r2))});
}

template <class V> class PreconditionOfAny : public testing::Test {};
using Containers = testing::Types<string8, string16, VectorOfByte>;
TYPED_TEST_SUITE(PreconditionOfAny, Containers);

TYPED_TEST(PreconditionOfAny, StopsBadCallsOfStringsAndBuffers) {
  using V = TypeParam;
  using P = const typename V::value_type*;
  const typename V::value_type x = 'x';
  const volatile P null = nullptr;
  const P q = &x;
  V s(3, x);
  ExpectStops(s, kSource, kBadSubrange, {WITH_I_N(v.compare(0, 1, v, i, n))});
  ExpectStops(s, kIndexCount, kBadSubrange,
              {WITH_I_N(v.erase(i, n)), WITH_I_N(v.compare(i, n, v)), WITH_I_N(v.compare(i, n, v, 9, 9)),
               WITH_I_N(v.compare(i, n, nullptr, 1))});
  ExpectStops(s, kMoveTo, kBadSubrange, {WITH_I_N(v.move(i, 99, n))});
  ExpectStops(s, kMoveFrom, kBadElement, {WITH_I(v.move(0, i, 1))});
  ExpectStops(s, kIterators, kBadIterators, {WITH_I1_I2(v.erase(v.begin() + i1, v.begin() + i2))});
  ExpectStops(s, kIterator, Singles{{-1}, {3}}, {WITH_I(v.erase(v.begin() + i))});
  ExpectStops(s, kIndex, kBadIndex,
              {WITH_I(v.insert(i, x)), WITH_I(v.insert(i, -1, x)), WITH_I(v.insert(i, q + 1, q)),
               WITH_I(v.insert(i, +null, q))});
  ExpectStops(s, kElement, kBadElement, {WITH_I(v.erase_element(i)), WITH_I(std::as_const(v)[i])});
  ExpectStops(s, kCount, kBadCount, {WITH_N(V(n, x)), WITH_N(v.insert(1, n, x))});
  ExpectStops(s, kPointer, std::vector<std::tuple<P, ssize_t>>{{null, 1}, {null, kMax}, {q, -1}, {q, kMin}},
              {WITH_P_PN(v.compare(1, 1, p, pn))});
  for (const auto& [text, from] : {std::pair<const char*, P>(kRange, q + 1), {kCopied, +null}})
    ExpectStops(s, text, std::vector<std::tuple<P, P>>{{from, q}},
                {WITH_R1_R2(V(r1, r2)), WITH_R1_R2(v.assign(r1, r2)), WITH_R1_R2(v.push_back(r1, r2)),
                 WITH_R1_R2(v.insert(1, r1, r2))});
  const auto empty = std::make_unique<V>();
  const V& constEmpty = *empty;
  ExpectStops(s, kNotEmpty, kOnce,
              {WITHOUT(empty->front()), WITHOUT(empty->back()), WITHOUT(constEmpty.front()),
               WITHOUT(constEmpty.back())});
}

TEST(Precondition, StopsBadConversions) {
  string16 wide = Of<char16>("abc");
  string8 narrow = Of<char8>("abc");
  ExpectStops(wide, "srcLen >= 0", kBadCount, {WITH_N(Utf16FromUtf8(v, "a", n))});
  ExpectStops(wide, "src", kOnce, {WITHOUT(Utf16FromUtf8(v, nullptr))});
  ExpectStops(wide, "newSize >= 0", kBadCount, {WITH_N(Utf16FromAscii(v, "a", n))});
  ExpectStops(narrow, "srcLen >= 0", kBadCount, {WITH_N(Utf8FromUtf16(v, wide.data(), n))});
  ExpectStops(narrow, "src", kOnce, {WITHOUT(Utf8FromUtf16(v, nullptr))});
  ExpectStops(wide, kPointer,
              std::vector<std::tuple<const char8*, ssize_t>>{{nullptr, 1}, {"a", -1}, {"a", kMin}},
              {WITH_P_PN(AppendUtf16(v, p, pn)), WITH_P_PN(Utf16FromUtf8Lossy(v, p, pn)),
               WITH_P_PN(mirel::Utf8Stream().Append(v, p, pn)), WITH_P_PN(mirel::FindMalformed(p, pn)),
               WITH_P_PN(mirel::ExplainMalformed(p, pn, 9)), WITH_P_PN(mirel::Utf16Length(p, pn)),
               WITH_P_PN(mirel::CountCodePoints(p, pn)), WITH_P_PN(mirel::CodePoints(p, pn))});
  ExpectStops(narrow, kPointer,
              std::vector<std::tuple<const char16*, ssize_t>>{{nullptr, 1}, {wide.data(), kMin}},
              {WITH_P_PN(AppendUtf8(v, p, pn)), WITH_P_PN(Utf8FromUtf16Lossy(v, p, pn)),
               WITH_P_PN(mirel::Utf16Stream().Append(v, p, pn)), WITH_P_PN(mirel::FindMalformed(p, pn)),
               WITH_P_PN(mirel::Utf8Length(p, pn)), WITH_P_PN(mirel::CodePoints(p, pn))});
  ExpectStops(wide, "0 <= offset && offset < pn", kBadElement,
              {WITH_I(mirel::ExplainMalformed("abc", 3, i)), WITH_I(ExplainMalformed(v, i))});
  ExpectStops(wide, "0 <= offset && offset < pn", kOnce, {WITHOUT(mirel::ExplainMalformed("", 0, 0))});
}

TEST(Precondition, StopsBadCallsOfStreams) {
  struct : mirel::IOutputStream {
    void WriteStream(const void*, ssize_t) override {}
    void FlushStream() override {}
  } sink;
  mirel::xostream os(sink);
  VectorOfByte none;
  ExpectStops(none, "x", kOnce, {WITHOUT(os.put(static_cast<const char*>(nullptr)))});
  ExpectStops(none, kPointer,
              std::vector<std::tuple<const char*, ssize_t>>{{nullptr, 1}, {"a", -1}, {"a", kMin}},
              {WITH_P_PN(os.put(p, pn)), WITH_P_PN(os.write(p, pn)), WITH_P_PN(os.put_internal(p, pn, 0)),
               WITH_P_PN(os.writebytes(reinterpret_cast<const uint8_t*>(p), pn))});
  ExpectStops(none, "0 <= indent", kBadCount, {WITH_N(os.Indent(n))});
}

TEST(Precondition, ReportsTheLineOfTheCheck) {
  // clang-format off
  const int line = __LINE__; const auto check = [] { MIREL_ASSERT(kMax < 0); };
  // clang-format on
  EXPECT_EXIT(check(), testing::KilledBySignal(SIGABRT),
              testing::HasSubstr("PreconditionTest.cpp:" + std::to_string(line) + ": "));
}

} // namespace
