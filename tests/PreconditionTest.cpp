// The calls that stop the process, each with its text, and with everything as it was.
#include "Support.h"

#include <csignal>
#include <functional>
#include <limits>
#include <memory>
#include <tuple>
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

const char kPointer[] = "pn == 0 || (pn > 0 && p != nullptr)";
const char kIndexCount[] = "0 <= i && 0 <= n && i+n <= size()";
const char kForward[] = "0 <= offset && offset <= size()";
const char kReverse[] = "offset == npos || (0 <= offset && offset < size())";
const char kLength[] = "count == npos || (0 <= count && offset+count <= size())";
const char kIndex[] = "0 <= i && i <= size()";
const char kElement[] = "0 <= i && i < size()";
const char kIterators[] = "begin() <= i1 && i1 <= i2 && i2 <= end()";
const char kCount[] = "0 <= count";

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
              testing::AllOf(testing::ContainsRegex("[a-zA-Z]+\\.(h|cpp):[0-9]+: .*::"),
                             testing::HasSubstr("Assertion `" + text + "' failed"),
                             testing::HasSubstr("[unchanged]")));
}

template <class V, class... A> struct CallsOf { using Type = std::vector<std::function<void(V&, A...)>>; };

/// Expects that each of the calls stops with text for each of the arguments.
template <class V, class... A>
void ExpectStops(V& v, const std::string& text, const std::vector<std::tuple<A...>>& arguments,
                 const typename CallsOf<V, A...>::Type& calls) {
  for (std::size_t i = 0; i < calls.size(); ++i)
    for (std::size_t k = 0; k < arguments.size(); ++k) {
      SCOPED_TRACE("call " + std::to_string(i) + ", arguments " + std::to_string(k));
      const auto action = [&](V& w) { std::apply([&](A... a) { calls[i](w, a...); }, arguments[k]); };
      ExpectStop(v, text, action);
    }
}

template <class T> class Precondition : public testing::Test {};
TYPED_TEST_SUITE(Precondition, CodeUnits);

using One = std::vector<std::tuple<ssize_t>>;
using Two = std::vector<std::tuple<ssize_t, ssize_t>>;

// Bad values for a string of three units.
const One kBadIndex = {{-1}, {4}, {kMin}, {kMax}};
const One kBadElement = {{-1}, {3}, {kMin}, {kMax}};
const One kBadReverse = {{-2}, {3}, {kMin}, {kMax}};
const One kBadLengthFrom2 = {{-2}, {2}, {kMin}, {kMax}};
const One kBadCount = {{-1}, {kMin}};
const Two kBadSubrange = {{-1, 1},      {0, -1},      {1, 3},       {4, 0},    {1, kMax},
                          {kMax, kMax}, {kMin, kMax}, {kMin, kMin}, {kMax, 1}, {2, kMin}};
const Two kBadIndices = {{-1, 1}, {2, 1}, {0, 4}, {4, 4}, {0, kMax}, {kMin, kMin}};
const Two kBadIterators = {{-1, 1}, {2, 1}, {0, 4}, {4, 4}};

TYPED_TEST(Precondition, OfSubranges) {
  using S = basic_xstring<TypeParam>;
  const S r = Of<TypeParam>("xyz");
  const TypeParam x = 'x';
  S s = Of<TypeParam>("abc");
  ExpectStops(s, "0 <= ri && 0 <= rn && ri+rn <= r.size()", kBadSubrange,
              {[&](S&, ssize_t i, ssize_t n) { S(r, i, n); },
               [&](S& v, ssize_t i, ssize_t n) { v.assign(r, i, n); },
               [&](S& v, ssize_t i, ssize_t n) { v.append(r, i, n); },
               [&](S& v, ssize_t i, ssize_t n) { v.insert(99, r, i, n); },
               [&](S& v, ssize_t i, ssize_t n) { v.replace(0, 1, r, i, n); },
               [&](S& v, ssize_t i, ssize_t n) { v.compare(0, 1, r, i, n); }});
  ExpectStops(s, kIndexCount, kBadSubrange,
              {[&](S& v, ssize_t i, ssize_t n) { v.erase(i, n); },
               [&](S& v, ssize_t i, ssize_t n) { v.replace(i, n, r); },
               [&](S& v, ssize_t i, ssize_t n) { v.replace(i, n, r, 9, 9); },
               [&](S& v, ssize_t i, ssize_t n) { v.replace(i, n, nullptr, 1); },
               [&](S& v, ssize_t i, ssize_t n) { v.replace(i, n, -1, x); },
               [&](S& v, ssize_t i, ssize_t n) { v.replace(i, n, r.c_str()); },
               [&](S& v, ssize_t i, ssize_t n) { v.compare(i, n, r); },
               [&](S& v, ssize_t i, ssize_t n) { v.compare(i, n, r, 9, 9); },
               [&](S& v, ssize_t i, ssize_t n) { v.compare(i, n, nullptr, 1); }});
  ExpectStops(s, "0 <= d && 0 <= n && d+n <= size()", kBadSubrange,
              {[](S& v, ssize_t i, ssize_t n) { v.move(i, 0, n); }});
  ExpectStops(s, "0 <= s && 0 <= n && s+n <= size()", kBadElement,
              {[](S& v, ssize_t i) { v.move(0, i, 1); }});
  ExpectStops(s, "0 <= i1 && i1 <= i2 && i2 <= size()", kBadIndices,
              {[](S& v, ssize_t i1, ssize_t i2) { v.erase_range(i1, i2); }});
  ExpectStops(s, kIterators, kBadIterators,
              {[](S& v, ssize_t i1, ssize_t i2) { v.erase(v.begin() + i1, v.begin() + i2); },
               [&](S& v, ssize_t i1, ssize_t i2) { v.replace(v.begin() + i1, v.begin() + i2, r); },
               [&](S& v, ssize_t i1, ssize_t i2) { v.replace(v.begin() + i1, v.begin() + i2, nullptr, 1); },
               [&](S& v, ssize_t i1, ssize_t i2) { v.replace(v.begin() + i1, v.begin() + i2, -1, x); }});
}

TYPED_TEST(Precondition, OfIndicesAndCounts) {
  using T = TypeParam;
  using S = basic_xstring<T>;
  const S r = Of<T>("xyz");
  const T* const p = r.data();
  const T* const z = r.c_str();
  const T x = 'x';
  S s = Of<T>("abc");
  ExpectStops(s, kForward, kBadIndex,
              {[&](S& v, ssize_t i) { v.find(x, i); }, [&](S& v, ssize_t i) { v.find(r, i); },
               [&](S& v, ssize_t i) { v.find(z, i); }, [&](S& v, ssize_t i) { v.find_first_of(x, i); },
               [&](S& v, ssize_t i) { v.find_first_of(r, i); },
               [&](S& v, ssize_t i) { v.find_first_not_of(x, i); },
               [&](S& v, ssize_t i) { v.find_first_not_of(r, i); },
               [&](S& v, ssize_t i) { v.contains(p, p, i); }, [&](S& v, ssize_t i) { v.substr(i, 9); }});
  ExpectStops(s, kReverse, kBadReverse,
              {[&](S& v, ssize_t i) { v.rfind(x, i); }, [&](S& v, ssize_t i) { v.rfind(r, i); },
               [&](S& v, ssize_t i) { v.find_last_of(x, i); }, [&](S& v, ssize_t i) { v.find_last_of(r, i); },
               [&](S& v, ssize_t i) { v.find_last_not_of(x, i); },
               [&](S& v, ssize_t i) { v.find_last_not_of(r, i); }});
  ExpectStops(s, kLength, kBadLengthFrom2, {[](S& v, ssize_t n) { v.substr(2, n); }});
  ExpectStops(s, kIndex, kBadIndex,
              {[&](S& v, ssize_t i) { v.insert(i, x); }, [&](S& v, ssize_t i) { v.insert(i, r); },
               [&](S& v, ssize_t i) { v.insert(i, -1, x); }, [&](S& v, ssize_t i) { v.insert(i, p + 1, p); },
               [&](S& v, ssize_t i) { v.insert(i, r, 0, 1); }, [&](S& v, ssize_t i) { v.insert(i, p, 1); },
               [&](S& v, ssize_t i) { v.insert(i, z); }});
  ExpectStops(s, kIndex, One{{-1}, {4}}, {[&](S& v, ssize_t i) { v.insert(v.begin() + i, x); }});
  ExpectStops(s, "begin() <= i && i < end()", One{{-1}, {3}},
              {[](S& v, ssize_t i) { v.erase(v.begin() + i); }});
  ExpectStops(s, kElement, kBadElement,
              {[](S& v, ssize_t i) { v.erase_element(i); }, [&](S& v, ssize_t i) { v[i] = x; },
               [](S& v, ssize_t i) { std::as_const(v)[i]; }});
  ExpectStops(s, kCount, kBadCount,
              {[&](S&, ssize_t n) { S(n, x); }, [&](S&, ssize_t n) { xvector<T>(n, x); },
               [&](S& v, ssize_t n) { v.assign(n, x); }, [&](S& v, ssize_t n) { v.append(n, x); },
               [&](S& v, ssize_t n) { v.insert(1, n, x); },
               [&](S& v, ssize_t n) { v.insert(v.begin(), n, x); },
               [&](S& v, ssize_t n) { v.replace(1, 1, n, x); },
               [&](S& v, ssize_t n) { v.replace(v.begin(), v.end(), n, x); },
               [&](S& v, ssize_t n) { v.push_back(n, p + 1, p); }, [](S& v, ssize_t n) { v *= n; }});
  ExpectStops(s, "size >= 0", kBadCount, {[](S& v, ssize_t n) { v.reserve(n); }});
  ExpectStops(s, "newSize >= 0", kBadCount, {[&](S& v, ssize_t n) { v.resize(n, x); }});
}

TYPED_TEST(Precondition, OfPointersAndRanges) {
  using T = TypeParam;
  using S = basic_xstring<T>;
  const S r = Of<T>("xyz");
  const T* const p = r.data();
  T* const volatile null = nullptr;
  const std::vector<std::tuple<const T*, ssize_t>> badRun = {{null, 1}, {null, kMax}, {p, -1}, {p, kMin}};
  S s = Of<T>("abc");
  ExpectStops(s, kPointer, badRun,
              {[](S&, const T* q, ssize_t n) { S(q, n); },
               [](S& v, const T* q, ssize_t n) { v.assign(q, n); },
               [](S& v, const T* q, ssize_t n) { v.append(q, n); },
               [](S& v, const T* q, ssize_t n) { v.insert(99, q, n); },
               [](S& v, const T* q, ssize_t n) { v.replace(1, 1, q, n); },
               [](S& v, const T* q, ssize_t n) { v.replace(v.begin(), v.end(), q, n); },
               [](S& v, const T* q, ssize_t n) { v.compare(q, n); },
               [](S& v, const T* q, ssize_t n) { v.compare(1, 1, q, n); },
               [](S& v, const T* q, ssize_t n) { v.find(q, 99, n); },
               [](S& v, const T* q, ssize_t n) { v.rfind(q, 99, n); },
               [](S& v, const T* q, ssize_t n) { v.find_first_of(q, 99, n); },
               [](S& v, const T* q, ssize_t n) { v.find_first_not_of(q, 99, n); },
               [](S& v, const T* q, ssize_t n) { v.find_last_of(q, 99, n); },
               [](S& v, const T* q, ssize_t n) { v.find_last_not_of(q, 99, n); }});
  const std::vector<std::tuple<const T*, const T*>> badRange = {{p + 1, p}};
  ExpectStops(s, "r1 <= r2", badRange,
              {[](S&, const T* a, const T* b) { S(a, b); },
               [](S& v, const T* a, const T* b) { v.assign(a, b); },
               [](S& v, const T* a, const T* b) { v.push_back(a, b); },
               [](S& v, const T* a, const T* b) { v.push_back(2, a, b); },
               [](S& v, const T* a, const T* b) { v.insert(0, a, b); },
               [](S& v, const T* a, const T* b) { v.find(a, b); },
               [](S& v, const T* a, const T* b) { v.rfind(a, b); },
               [](S& v, const T* a, const T* b) { v.contains(a, b, 0); },
               [](S& v, const T* a, const T* b) { v.find_first_of(a, b); },
               [](S& v, const T* a, const T* b) { v.find_first_not_of(a, b); },
               [](S& v, const T* a, const T* b) { v.find_last_of(a, b); },
               [](S& v, const T* a, const T* b) { v.find_last_not_of(a, b); }});
  const std::vector<std::tuple<>> once = {{}};
  ExpectStops(s, "size() > 0", once,
              {[](S&) { S().front(); }, [](S&) { S().back(); }, [](S&) { S().pop_front(); },
               [](S&) { S().pop_back(); }, [](S&) { std::as_const(*std::make_unique<S>()).front(); },
               [](S&) { std::as_const(*std::make_unique<S>()).back(); }});
  ExpectStops(s, "p", once,
              {[](S&) { *S().rbegin(); }, [](S&) { S().rbegin().operator->(); }, [](S&) { ++S().rbegin(); },
               [](S&) { std::as_const(*std::make_unique<S>()).rbegin()--; }});
  ExpectStop(s, "r1 >= r2 || r1 != nullptr", [&](S& v) { mirel::p_create(+null, v.begin(), 'x'); });
  const std::vector<std::tuple<T*, const T*, const T*>> badCopy = {
      {s.begin(), p + 1, p}, {s.begin(), null, p}, {null, p, p + 1}};
  ExpectStops(s, "src1 == src2 || (src1 < src2 && src1 != nullptr && dst != nullptr)", badCopy,
              {[](S&, T* dst, const T* src1, const T* src2) { mirel::p_copy(dst, src1, src2); }});
  ExpectStop(s, "src1 == src2 || dst != nullptr", [&](S& v) { mirel::p_copy(+null, v.begin(), v.end()); });
  mirel::p_copy(+null, s.begin(), s.begin()); // nothing to copy
}

TEST(Precondition, OfBuffersConversionsAndStreams) {
  using B = VectorOfByte;
  const uint8_t byte = 1;
  B b{1, 2, 3};
  ExpectStops(b, kElement, kBadElement,
              {[](B& v, ssize_t i) { std::as_const(v)[i]; }, [](B& v, ssize_t i) { v.erase_element(i); }});
  ExpectStops(b, "size_ >= 0", One{{4}, {kMax}}, {[](B& v, ssize_t n) { v.pop_back(n); }});
  ExpectStops(b, kCount, kBadCount,
              {[](B& v, ssize_t n) { v.pop_back(n); }, [](B& v, ssize_t n) { v.growbytes(n); },
               [](B& v, ssize_t n) { v.insert(1, n, 'x'); }});
  ExpectStops(b, "0 <= n", kBadCount,
              {[](B& v, ssize_t n) { v.resize(n); }, [](B& v, ssize_t n) { v.insertbytes(3, n); }});
  ExpectStops(b, kIndex, kBadIndex,
              {[](B& v, ssize_t i) { v.insertbytes(i, 1); }, [](B& v, ssize_t i) { v.insert(i, -1, 'x'); },
               [&](B& v, ssize_t i) { v.insert(i, &byte, &byte); }});
  ExpectStops(b, "0 <= d && 0 <= n && d+n <= size()", kBadSubrange,
              {[](B& v, ssize_t i, ssize_t n) { v.move(i, 0, n); }});
  ExpectStops(b, "0 <= s && 0 <= n && s+n <= size()", kBadElement,
              {[](B& v, ssize_t i) { v.move(0, i, 1); }});
  ExpectStops(b, kIterators, kBadIterators,
              {[](B& v, ssize_t i1, ssize_t i2) { v.erase(v.begin() + i1, v.begin() + i2); }});
  ExpectStops(b, "begin() <= i && i < end()", One{{-1}, {3}},
              {[](B& v, ssize_t i) { v.erase(v.begin() + i); }});
  ExpectStops(b, kIndexCount, kBadSubrange,
              {[](B& v, ssize_t i, ssize_t n) { v.erase(i, n); },
               [](B& v, ssize_t i, ssize_t n) { v.compare(i, n, v); },
               [](B& v, ssize_t i, ssize_t n) { v.compare(i, n, v, 9, 9); },
               [](B& v, ssize_t i, ssize_t n) { v.compare(i, n, nullptr, 1); }});
  ExpectStops(b, "0 <= ri && 0 <= rn && ri+rn <= r.size()", kBadSubrange,
              {[](B& v, ssize_t i, ssize_t n) { v.compare(0, 1, v, i, n); }});
  const std::vector<std::tuple<const uint8_t*, ssize_t>> badRun = {{nullptr, 1}, {&byte, -1}, {&byte, kMin}};
  ExpectStops(b, kPointer, badRun, {[](B& v, const uint8_t* p, ssize_t n) { v.compare(0, 1, p, n); }});
  const std::vector<std::tuple<>> once = {{}};
  ExpectStops(b, "r1 <= r2", once,
              {[](B& v) { v.insert(0, v.end(), v.begin()); }, [](B& v) { v.assign(v.end(), v.begin()); }});
  ExpectStops(b, "size() > 0", once,
              {[](B&) { B().front(); }, [](B&) { B().back(); },
               [](B&) { std::as_const(*std::make_unique<B>()).front(); },
               [](B&) { std::as_const(*std::make_unique<B>()).back(); }});

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
  const std::vector<std::tuple<const char*, ssize_t>> badText = {{nullptr, 1}, {"a", -1}, {"a", kMin}};
  ExpectStops(narrow, kPointer, badText,
              {[&](string8&, const char* p, ssize_t n) { os.put(p, n); },
               [&](string8&, const char* p, ssize_t n) { os.write(p, n); }});
  ExpectStop(narrow, "0 <= indent", [&](string8&) { os.Indent(-1); });
}

} // namespace
