// Makes the same edits of a string and a standard string, and compares them. Numbers choose the edits: random
// ones in the tests, the bytes of an input under a fuzzer.

#pragma once

#include <algorithm>

#include "Support.h"

/// Makes text of a few different units, so that searches find some.
template <class T, class Numbers> class TextMaker {
public:
  using S = basic_xstring<T>;
  using Model = std::basic_string<T>;

  explicit TextMaker(Numbers& numbers) : m_numbers(numbers) {}

  /// A number from 0 to max.
  ssize_t Number(ssize_t max) { return m_numbers(max); }
  T Unit() { return static_cast<T>(kAlphabet[Number(3)]); }
  Model Text(ssize_t max) {
    Model text;
    for (ssize_t n = Number(max); n > 0; --n)
      text.push_back(Unit());
    return text;
  }

private:
  static constexpr unsigned kAlphabet[] = {'a', 'b', 0,
                                           sizeof(T) == 1 ? 0xE9 : 0x61E9}; // the low byte is E9 in both
  Numbers& m_numbers;
};

/// Text as a message shows it. GoogleTest shows 32 units of a basic_string<char16>, and all of a u16string.
inline std::string Quoted(const std::string& text) { return testing::PrintToString(text); }
inline std::string Quoted(const std::basic_string<char16>& text) {
  return testing::PrintToString(std::u16string(text.begin(), text.end()));
}

/// Names an edit by its call, makes it, and replaces len elements at pos of the model with some text.
#define EDIT(NUMBER, CALL, ...)                                                                              \
  case NUMBER:                                                                                               \
    edit = #CALL;                                                                                            \
    CALL;                                                                                                    \
    becomes(__VA_ARGS__);                                                                                    \
    break

template <class T, class Numbers> class Edits : TextMaker<T, Numbers> {
public:
  using typename TextMaker<T, Numbers>::S;
  using M = typename TextMaker<T, Numbers>::Model;
  using TextMaker<T, Numbers>::TextMaker;

  /// Makes one edit of both, and compares them.
  void Step() {
    if (v.size() > 80) {
      S().swap(v);
      m.clear();
    }
    const M before = m;
    const ssize_t size = v.size(), i = this->Number(size), n = this->Number(size - i),
                  count = this->Number(4);
    const ssize_t ri = this->Number(size), rn = this->Number(size - ri), k = std::min(n, rn);
    const M text = this->Text(9), own = m.substr(size_t(ri), size_t(rn));
    const S r(text.data(), static_cast<ssize_t>(text.size()));
    const M upToNull = m.substr(size_t(ri), std::min(m.find(T(0), size_t(ri)), m.size()) - size_t(ri));
    const T x = this->Unit(), own1 = n > 0 ? m[size_t(i)] : x;
    const T& x1 =
        n > 0 ? v[i] : x; // p and x1 refer to the vector; own and own1 are copies of the same elements
    const T* const p = v.data() + ri;
    auto at = v.begin() + i;
    ssize_t erased = kNpos; // the result of an edit that returns how many it has erased
    const char* edit = "";
    const auto becomes = [&](ssize_t pos, ssize_t len, const M& with) {
      m.replace(size_t(pos), size_t(len), with);
    };
    const auto without = [&](T c) { return M(m.begin(), std::remove(m.begin(), m.end(), c)); };
    const auto times = [](ssize_t copies, T c) { return M(size_t(copies), c); };
    switch (this->Number(40)) {
      EDIT(0, v.push_back(x1), size, 0, {own1});
      EDIT(1, v.append(r), size, 0, text);
      EDIT(2, v.append(count, x), size, 0, times(count, x));
      EDIT(3, v.insert(i, r), i, 0, text);
      EDIT(4, v.insert(i, x1), i, 0, {own1});
      EDIT(5, v.insert(i, count, x1), i, 0, times(count, own1));
      EDIT(6, at = v.insert(at, x1), at - v.begin(), 0, {own1});
      EDIT(7, v.replace(i, n, r), i, n, text);
      EDIT(8, v.replace(i, n, count, x1), i, n, times(count, own1));
      EDIT(9, v.replace(at, at + n, r), i, n, text);
      EDIT(10, v.replace(at, at + n, count, x), i, n, times(count, x));
      EDIT(11, v.replace(at, at + n, p, rn), i, n, own);
      EDIT(12, v.erase(i, n), i, n, {});
      EDIT(13, v.erase_range(i, i + n), i, n, {});
      EDIT(14, v.resize(i, x), i, size - i, {});
      EDIT(15, v.resize(size + count, x1), size, 0, times(count, own1));
      EDIT(16, v.assign(count, x1), 0, size, times(count, own1));
      EDIT(17, v.assign(v, ri, rn), 0, size, own);
      EDIT(18, v = v + r, size, 0, text);
      EDIT(19, v.append(p, rn), size, 0, own);
      EDIT(20, v.append(v, ri, rn), size, 0, own);
      EDIT(21, v.insert(i, p, rn), i, 0, own);
      EDIT(22, v.insert(i, v, ri, rn), i, 0, own);
      EDIT(23, v.replace(i, n, p, rn), i, n, own);
      EDIT(24, v.replace(i, n, v, ri, rn), i, n, own);
      EDIT(25, v.push_back(2, p, p + rn), size, 0, own + own);
      EDIT(26, v += v, size, 0, before);
      EDIT(27, v.insert(i, v.begin(), v.end()), i, 0, before);
      EDIT(28, erased = v.FindAndErase(x1), 0, size, without(own1));
      EDIT(29, v *= 2, size, 0, before);
      EDIT(30, (n > 0 ? at = v.erase(at) : at), at - v.begin(), n > 0, {});
      EDIT(31, erased = v.FindAndEraseFirst(x), ssize_t(std::min(m.rfind(x), m.size())), 1, {});
      EDIT(32, v.append(v.c_str() + ri), size, 0, upToNull);
      EDIT(33, v.assign(v.c_str() + ri), 0, size, upToNull);
      EDIT(34, v.insert(i, v.c_str() + ri), i, 0, upToNull);
      EDIT(35, v.replace(i, n, v.c_str() + ri), i, n, upToNull);
      EDIT(36, v.move(i, ri, k), i, k, own.substr(0, size_t(k)));
      EDIT(37, v.append(v.c_str() + ri, size - ri + 1), size, 0, M(m, size_t(ri)) + T(0));
      EDIT(38, v.push_front(x1), 0, 0, {own1});
      EDIT(39, size > 0 ? v.pop_front() : void(), 0, 1, {});
      EDIT(40, size > 0 ? v.pop_back() : void(), size - (size > 0), 1, {});
    }
    SCOPED_TRACE(edit);
    ASSERT_EQ(Std(v), m) << "from " << Quoted(before) << " to " << Quoted(Std(v)) << ", not " << Quoted(m)
                         << ", with i " << i << ", n " << n << ", ri " << ri << ", rn " << rn << ", count "
                         << count << ", x " << ssize_t(x) << ", r " << Quoted(text);
    ASSERT_THAT(erased, testing::AnyOf(kNpos, size - v.size()));
    ASSERT_LE(v.size(), v.capacity());
    ASSERT_EQ(v.end() - v.begin(), ssize_t(m.size()));
    ASSERT_EQ(v.empty(), m.empty());
    if (!m.empty()) {
      ASSERT_EQ(v.front(), m.front());
      ASSERT_EQ(std::as_const(v).back(), m.back());
      ASSERT_EQ(std::as_const(v)[v.size() / 2], m[m.size() / 2]);
    }
    if (this->Number(3) == 0)
      return S(v).swap(v); // leaves no unused capacity, so that the next edit must move the storage
    const T* const z = v.c_str();
    ASSERT_EQ(z, v.data());
    ASSERT_EQ(z[v.size()], 0);
    ASSERT_GT(v.capacity(), v.size());
    ASSERT_EQ(Std(v), m);
  }

private:
  S v;
  M m;
};
#undef EDIT

template <class T, class Numbers> class Searches : TextMaker<T, Numbers> {
public:
  using typename TextMaker<T, Numbers>::S;
  using TextMaker<T, Numbers>::TextMaker;

  /// Searches a random text of at most `longest` units for a random needle, and compares it with another one.
  void Step(ssize_t longest) {
    const auto sign = [](int x) { return (x > 0) - (x < 0); };
    const auto text = this->Text(longest);
    const auto needle = this->Text(3);
    S v(text.data(), static_cast<ssize_t>(text.size()));
    S r(needle.data(), static_cast<ssize_t>(needle.size()));
    const ssize_t forward = this->Number(v.size());
    const ssize_t reverse = v.empty() ? kNpos : this->Number(v.size()) - 1;
    const auto uf = static_cast<std::size_t>(forward), ur = static_cast<std::size_t>(reverse);
    const T c = this->Unit();
    const int number = std::make_unsigned_t<T>(c);
    const T *const z = r.c_str(), *const p = r.data();
    const ssize_t pn = r.size();
    const auto inputs = [&] { // called only for a message
      return "text " + Quoted(text) + ", needle " + Quoted(needle) + ", unit " + std::to_string(number) +
             ", forward " + std::to_string(forward) + ", reverse " + std::to_string(reverse);
    };
#define SEARCH(NAME, OURS, THEIRS)                                                                           \
  ASSERT_EQ(v.NAME(c, OURS), ssize_t(text.NAME(c, THEIRS))) << inputs();                                     \
  ASSERT_EQ(v.NAME(r, OURS), ssize_t(text.NAME(needle, THEIRS))) << inputs();                                \
  ASSERT_EQ(v.NAME(z, OURS), ssize_t(text.NAME(z, THEIRS))) << inputs();                                     \
  ASSERT_EQ(v.NAME(p, OURS, pn), ssize_t(text.NAME(needle, THEIRS))) << inputs();                            \
  ASSERT_EQ(v.NAME(p, p + pn, OURS), ssize_t(text.NAME(needle, THEIRS))) << inputs();                        \
  ASSERT_EQ(v.NAME(number, OURS), ssize_t(text.NAME(c, THEIRS))) << inputs()
    SEARCH(find, forward, uf);
    SEARCH(find_first_of, forward, uf);
    SEARCH(find_first_not_of, forward, uf);
    SEARCH(rfind, reverse, ur);
    SEARCH(find_last_of, reverse, ur);
    SEARCH(find_last_not_of, reverse, ur);
#undef SEARCH
    ASSERT_EQ(v.contains(r.begin(), r.end(), forward), text.compare(uf, needle.size(), needle) == 0)
        << inputs();
    ASSERT_EQ(Std(v.substr(forward, kNpos)), text.substr(uf)) << inputs();
    const auto second = std::basic_string<T>(this->Text(12));
    const S o(second.data(), static_cast<ssize_t>(second.size()));
    const auto order = [](const std::basic_string<T>& a, const std::basic_string<T>& b) {
      const auto less = [](T x, T y) { return std::make_unsigned_t<T>(x) < std::make_unsigned_t<T>(y); };
      return std::lexicographical_compare(a.begin(), a.end(), b.begin(), b.end(), less) ? -1 : a != b;
    };
    const int expected = order(text, second), expectedUpToNull = order(text, second.c_str());
    const auto both = [&] { return Quoted(text) + " and " + Quoted(second); };
    ASSERT_EQ(sign(v.compare(second.c_str())), expectedUpToNull) << both();
    ASSERT_EQ(v._Eq(second.c_str()), expectedUpToNull == 0) << both();
    ASSERT_EQ(v._Lt(second.c_str()), expectedUpToNull < 0) << both();
    ASSERT_EQ(sign(v.compare(o)), expected) << both();
    ASSERT_EQ(sign(v.compare(0, v.size(), o, 0, o.size())), expected) << both();
    ASSERT_EQ(sign(v.compare(o.data(), o.size())), expected) << both();
    ASSERT_EQ(v._Eq(o), expected == 0) << both();
    ASSERT_EQ(v._Lt(o), expected < 0) << both();
    if (sizeof(T) == 2) { // compare() of 16-bit units returns -1, 0 or 1
      ASSERT_EQ(v.compare(o), expected) << both();
    }
  }
};
