// The calls that stop the process, each with its text, and with everything as it was.
#include "Support.h"

#include <csignal>
#include <functional>
#include <limits>
#include <unistd.h>
#include <utility>
#include <vector>

#include <utils/xostream.h>

using mirel::string16;
using mirel::string8;
using mirel::VectorOfByte;

namespace {

// Volatile, so that compilers can't see through the calls and refuse them.
const volatile ssize_t kMax = std::numeric_limits<ssize_t>::max();
const volatile ssize_t kMin = std::numeric_limits<ssize_t>::min();

const char kSubrange[] = "0 <= ri && 0 <= rn && ri+rn <= r.size()";
const char kPointer[] = "pn == 0 || (pn > 0 && p != nullptr)";
const char kIndexCount[] = "0 <= i && 0 <= n && i+n <= size()";
const char kForward[] = "0 <= offset && offset <= size()";
const char kReverse[] = "offset == npos || (0 <= offset && offset < size())";
const char kLength[] = "count == npos || (0 <= count && offset+count <= size())";
const char kIndex[] = "0 <= i && i <= size()";
const char kElement[] = "0 <= i && i < size()";
const char kIterators[] = "begin() <= i1 && i1 <= i2 && i2 <= end()";
const char kCount[] = "0 <= count";
const char kRange[] = "r1 <= r2";

std::function<bool()> unchanged;

void ReportState(int) {
  const char* const text = unchanged() ? "[unchanged]\n" : "[changed]\n";
  if (write(STDERR_FILENO, text, strlen(text)) < 0)
    _exit(1);
}

/// Expects that action stops with text while the storage of v is as before.
template <class V, class F> void ExpectStop(V& v, const std::string& text, const F& action) {
  const VectorOfByte& b = reinterpret_cast<const VectorOfByte&>(v);
  const VectorOfByte before = b;
  unchanged = [&, data = b.data(), capacity = b.capacity()] {
    return b == before && b.data() == data && b.capacity() == capacity;
  };
  const auto stop = [&] {
    std::signal(SIGABRT, ReportState);
    action(v);
  };
  EXPECT_EXIT(stop(), testing::KilledBySignal(SIGABRT),
              testing::AllOf(testing::HasSubstr("Assertion `" + text + "' failed"),
                             testing::HasSubstr("[unchanged]")));
}

template <class T> class Precondition : public testing::Test {};
TYPED_TEST_SUITE(Precondition, CodeUnits);

TYPED_TEST(Precondition, SubrangesStopForEveryPairOfValues) {
  using S = basic_xstring<TypeParam>;
  const S r = Of<TypeParam>("xyz");
  const TypeParam x = 'x';
  using Call = std::function<void(S&, ssize_t, ssize_t)>;
  const std::vector<std::pair<const char*, Call>> calls = {
      {kSubrange, [&](S&, ssize_t i, ssize_t n) { S(r, i, n); }},
      {kSubrange, [&](S& s, ssize_t i, ssize_t n) { s.assign(r, i, n); }},
      {kSubrange, [&](S& s, ssize_t i, ssize_t n) { s.append(r, i, n); }},
      {kSubrange, [&](S& s, ssize_t i, ssize_t n) { s.insert(99, r, i, n); }},
      {kSubrange, [&](S& s, ssize_t i, ssize_t n) { s.replace(0, 1, r, i, n); }},
      {kSubrange, [&](S& s, ssize_t i, ssize_t n) { s.compare(0, 1, r, i, n); }},
      {kIndexCount, [&](S& s, ssize_t i, ssize_t n) { s.erase(i, n); }},
      {kIndexCount, [&](S& s, ssize_t i, ssize_t n) { s.replace(i, n, r); }},
      {kIndexCount, [&](S& s, ssize_t i, ssize_t n) { s.replace(i, n, r, 9, 9); }},
      {kIndexCount, [&](S& s, ssize_t i, ssize_t n) { s.replace(i, n, nullptr, 1); }},
      {kIndexCount, [&](S& s, ssize_t i, ssize_t n) { s.replace(i, n, -1, x); }},
      {kIndexCount, [&](S& s, ssize_t i, ssize_t n) { s.replace(i, n, r.c_str()); }},
      {kIndexCount, [&](S& s, ssize_t i, ssize_t n) { s.compare(i, n, r); }},
      {kIndexCount, [&](S& s, ssize_t i, ssize_t n) { s.compare(i, n, r, 9, 9); }},
      {kIndexCount, [&](S& s, ssize_t i, ssize_t n) { s.compare(i, n, nullptr, 1); }},
      {"0 <= d && 0 <= n && d+n <= size()", [](S& s, ssize_t i, ssize_t n) { s.move(i, 0, n); }},
  };
  const std::pair<ssize_t, ssize_t> bad[] = {{-1, 1},      {0, -1},      {1, 3},       {4, 0},    {1, kMax},
                                             {kMax, kMax}, {kMin, kMax}, {kMin, kMin}, {kMax, 1}, {2, kMin}};
  S s = Of<TypeParam>("abc");
  for (const auto& [text, call] : calls)
    for (const auto& [i, n] : bad)
      ExpectStop(s, text, [&, call = call, i = i, n = n](S& v) { call(v, i, n); });
  for (const ssize_t i : {ssize_t(-1), ssize_t(3), ssize_t(kMax), ssize_t(kMin)})
    ExpectStop(s, "0 <= s && 0 <= n && s+n <= size()", [i](S& v) { v.move(0, i, 1); });
}

TYPED_TEST(Precondition, CallsThatStop) {
  using T = TypeParam;
  using S = basic_xstring<T>;
  const S r = Of<T>("xyz");
  const T* const p = r.data();
  T* const volatile null = nullptr;
  const T x = 'x';
  const std::vector<std::pair<const char*, std::function<void(S&)>>> calls = {
      {kPointer, [&](S&) { S(+null, 1); }},
      {kPointer, [&](S& s) { s.assign(p, -1); }},
      {kPointer, [&](S& s) { s.append(nullptr, 3); }},
      {kPointer, [&](S& s) { s.insert(99, nullptr, 3); }},
      {kPointer, [&](S& s) { s.replace(1, 1, nullptr, 3); }},
      {kPointer, [&](S& s) { s.replace(s.begin(), s.end(), nullptr, 3); }},
      {kPointer, [&](S& s) { s.compare(nullptr, 1); }},
      {kPointer, [&](S& s) { s.compare(1, 1, p, kMin); }},
      {kPointer, [&](S& s) { s.find(nullptr, 99, 1); }},
      {kPointer, [&](S& s) { s.rfind(nullptr, 99, 1); }},
      {kPointer, [&](S& s) { s.find_first_of(p, 99, -1); }},
      {kPointer, [&](S& s) { s.find_first_not_of(p, 99, -1); }},
      {kPointer, [&](S& s) { s.find_last_of(p, 99, -1); }},
      {kPointer, [&](S& s) { s.find_last_not_of(p, 99, -1); }},
      {kForward, [&](S& s) { s.find(x, kNpos); }},
      {kForward, [&](S& s) { s.find(r, 4); }},
      {kForward, [&](S& s) { s.find(r.c_str(), kMax); }},
      {kForward, [&](S& s) { s.find_first_of(x, kMin); }},
      {kForward, [&](S& s) { s.find_first_of(r, 4); }},
      {kForward, [&](S& s) { s.find_first_not_of(x, 4); }},
      {kForward, [&](S& s) { s.contains(p, p, 4); }},
      {kForward, [&](S& s) { s.substr(4, 9); }},
      {kLength, [&](S& s) { s.substr(2, 2); }},
      {kLength, [&](S& s) { s.substr(1, kMax); }},
      {kReverse, [&](S& s) { s.rfind(x, 3); }},
      {kReverse, [&](S& s) { s.rfind(r, -2); }},
      {kReverse, [&](S& s) { s.find_last_of(x, kMax); }},
      {kReverse, [&](S& s) { s.find_last_of(r, 3); }},
      {kReverse, [&](S& s) { s.find_last_not_of(x, 3); }},
      {kReverse, [&](S& s) { s.find_last_not_of(r, kMin); }},
      {kRange, [&](S&) { S(p + 1, p); }},
      {kRange, [&](S& s) { s.assign(p + 1, p); }},
      {kRange, [&](S& s) { s.push_back(p + 1, p); }},
      {kRange, [&](S& s) { s.insert(0, p + 1, p); }},
      {kRange, [&](S& s) { s.find(p + 1, p); }},
      {kRange, [&](S& s) { s.rfind(p + 1, p); }},
      {kRange, [&](S& s) { s.find_last_not_of(p + 1, p); }},
      {kCount, [&](S&) { S(-1, x); }},
      {kCount, [&](S&) { xvector<T>(-1, x); }},
      {kCount, [&](S& s) { s.assign(-1, x); }},
      {kCount, [&](S& s) { s.append(kMin, x); }},
      {kCount, [&](S& s) { s.insert(1, -1, x); }},
      {kCount, [&](S& s) { s.insert(s.begin(), -1, x); }},
      {kCount, [&](S& s) { s.replace(1, 1, -1, x); }},
      {kCount, [&](S& s) { s.replace(s.begin(), s.end(), -1, x); }},
      {kCount, [&](S& s) { s.push_back(-1, p + 1, p); }},
      {kCount, [&](S& s) { s *= -1; }},
      {kIndex, [&](S& s) { s.insert(4, x); }},
      {kIndex, [&](S& s) { s.insert(-1, r); }},
      {kIndex, [&](S& s) { s.insert(4, -1, x); }},
      {kIndex, [&](S& s) { s.insert(4, p + 1, p); }},
      {kIndex, [&](S& s) { s.insert(kMax, r, 0, 1); }},
      {kIndex, [&](S& s) { s.insert(kMin, r.c_str()); }},
      {kIndex, [&](S& s) { s.insert(s.end() + 1, x); }},
      {kIterators, [&](S& s) { s.erase(s.begin() - 1, s.end()); }},
      {kIterators, [&](S& s) { s.erase(s.begin() + 1, s.begin()); }},
      {kIterators, [&](S& s) { s.replace(s.begin(), s.end() + 1, r); }},
      {kIterators, [&](S& s) { s.replace(s.begin(), s.end() + 1, +null, 1); }},
      {kIterators, [&](S& s) { s.replace(s.begin(), s.end() + 1, -1, x); }},
      {"begin() <= i && i < end()", [&](S& s) { s.erase(s.end()); }},
      {"0 <= i1 && i1 <= i2 && i2 <= size()", [&](S& s) { s.erase_range(2, 1); }},
      {"0 <= i1 && i1 <= i2 && i2 <= size()", [&](S& s) { s.erase_range(0, kMax); }},
      {kElement, [&](S& s) { s.erase_element(3); }},
      {kElement, [&](S& s) { s[3] = x; }},
      {kElement, [&](S& s) { std::as_const(s)[-1]; }},
      {"size() > 0", [&](S&) { S().front(); }},
      {"size() > 0", [&](S&) { S().back(); }},
      {"size() > 0", [&](S&) { std::as_const(*std::make_unique<S>()).front(); }},
      {"size() > 0", [&](S&) { std::as_const(*std::make_unique<S>()).back(); }},
      {"size() > 0", [&](S&) { S().pop_front(); }},
      {"size() > 0", [&](S&) { S().pop_back(); }},
      {"size >= 0", [&](S& s) { s.reserve(-1); }},
      {"newSize >= 0", [&](S& s) { s.resize(kMin, x); }},
      {"p", [&](S&) { *S().rbegin(); }},
      {"p", [&](S&) { S().rbegin().operator->(); }},
      {"p", [&](S&) { ++S().rbegin(); }},
      {"p", [&](S&) { std::as_const(*std::make_unique<S>()).rbegin()--; }},
      {"r1 >= r2 || r1 != nullptr", [&](S& s) { mirel::p_create(+null, s.begin(), x); }},
      {"src1 == src2 || (src1 < src2 && src1 != nullptr && dst != nullptr)",
       [&](S& s) { mirel::p_copy(s.begin(), p + 1, p); }},
      {"src1 == src2 || dst != nullptr", [&](S& s) { mirel::p_copy(+null, s.begin(), s.end()); }},
  };
  S s = Of<T>("abc");
  for (const auto& [text, call] : calls)
    ExpectStop(s, text, call);
}

TEST(Precondition, OfBuffersConversionsAndStreams) {
  using Call = std::function<void(VectorOfByte&)>;
  const uint8_t byte = 1;
  VectorOfByte b{1, 2, 3};
  const std::vector<std::pair<const char*, Call>> calls = {
      {kElement, [](VectorOfByte& v) { std::as_const(v)[3]; }},
      {kElement, [](VectorOfByte& v) { v.erase_element(-1); }},
      {"size_ >= 0", [](VectorOfByte& v) { v.pop_back(4); }},
      {kCount, [](VectorOfByte& v) { v.pop_back(-1); }},
      {kCount, [](VectorOfByte& v) { v.growbytes(-1); }},
      {kCount, [](VectorOfByte& v) { v.insert(1, -1, 'x'); }},
      {"0 <= n", [](VectorOfByte& v) { v.resize(-1); }},
      {"0 <= n", [](VectorOfByte& v) { v.insertbytes(3, kMin); }},
      {kIndex, [](VectorOfByte& v) { v.insertbytes(4, 1); }},
      {kIndex, [](VectorOfByte& v) { v.insert(kMax, -1, 'x'); }},
      {kIndex, [&](VectorOfByte& v) { v.insert(-1, &byte, &byte); }},
      {kRange, [](VectorOfByte& v) { v.insert(0, v.end(), v.begin()); }},
      {kRange, [](VectorOfByte& v) { v.assign(v.end(), v.begin()); }},
      {"0 <= d && 0 <= n && d+n <= size()", [](VectorOfByte& v) { v.move(1, 0, kMax); }},
      {"0 <= s && 0 <= n && s+n <= size()", [](VectorOfByte& v) { v.move(1, kMax, 1); }},
      {kIterators, [](VectorOfByte& v) { v.erase(v.end(), v.begin()); }},
      {"begin() <= i && i < end()", [](VectorOfByte& v) { v.erase(v.end()); }},
      {kIndexCount, [](VectorOfByte& v) { v.erase(1, kMax); }},
      {kIndexCount, [](VectorOfByte& v) { v.compare(2, 2, v); }},
      {kIndexCount, [](VectorOfByte& v) { v.compare(2, 2, v, 9, 9); }},
      {kIndexCount, [](VectorOfByte& v) { v.compare(2, 2, nullptr, 1); }},
      {kSubrange, [](VectorOfByte& v) { v.compare(0, 1, v, 2, 2); }},
      {kPointer, [](VectorOfByte& v) { v.compare(0, 1, nullptr, 1); }},
      {"size() > 0", [](VectorOfByte&) { VectorOfByte().front(); }},
      {"size() > 0", [](VectorOfByte&) { VectorOfByte().back(); }},
      {"size() > 0", [](VectorOfByte&) { std::as_const(*std::make_unique<VectorOfByte>()).front(); }},
      {"size() > 0", [](VectorOfByte&) { std::as_const(*std::make_unique<VectorOfByte>()).back(); }},
  };
  for (const auto& [text, call] : calls)
    ExpectStop(b, text, call);

  string16 wide = Of<char16>("abc");
  string8 narrow = Of<char8>("abc");
  ExpectStop(wide, "srcLen >= 0", [](string16& s) { mirel::Utf16FromUtf8(s, "a", -1); });
  ExpectStop(wide, "src", [](string16& s) { mirel::Utf16FromUtf8(s, nullptr); });
  ExpectStop(wide, "newSize >= 0", [](string16& s) { mirel::Utf16FromAscii(s, "a", -1); });
  ExpectStop(narrow, "srcLen >= 0", [&](string8& s) { mirel::Utf8FromUtf16(s, wide.data(), kMin); });
  ExpectStop(narrow, "src", [](string8& s) { mirel::Utf8FromUtf16(s, nullptr); });

  struct : mirel::IOutputStream {
    void WriteStream(const void*, ssize_t) override {}
    void FlushStream() override {}
  } sink;
  mirel::xostream os(sink);
  ExpectStop(narrow, "x", [&](string8&) { os.put(static_cast<const char*>(nullptr)); });
  ExpectStop(narrow, kPointer, [&](string8&) { os.put(nullptr, 1); });
  ExpectStop(narrow, kPointer, [&](string8&) { os.write("a", -1); });
  ExpectStop(narrow, "0 <= indent", [&](string8&) { os.Indent(-1); });
}

} // namespace
