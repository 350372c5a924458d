// Runs of random operations beside the standard containers, both ways of looking at the same text.
#include "Support.h"

#include <algorithm>
#include <functional>
#include <random>
#include <string>
#include <vector>

namespace {

template <class T> class XVector : public testing::Test {
protected:
  using S = basic_xstring<T>;
  using Model = std::basic_string<T>;

  ssize_t Number(ssize_t max) { return std::uniform_int_distribution<ssize_t>(0, max)(random); }
  T Unit() { return static_cast<T>(kAlphabet[Number(3)]); }
  Model Text(ssize_t max) {
    Model text;
    for (ssize_t n = Number(max); n > 0; --n)
      text.push_back(Unit());
    return text;
  }

  static constexpr unsigned kAlphabet[] = {'a', 'b', 0,
                                           sizeof(T) == 1 ? 0xE9 : 0x61E9}; // both bytes of one are units too
  std::mt19937 random{20240229};
};
TYPED_TEST_SUITE(XVector, CodeUnits);

TYPED_TEST(XVector, EditsLikeAString) {
  using T = TypeParam;
  using M = typename TestFixture::Model;
  typename TestFixture::S v;
  M m;
  for (int step = 0; step < 60000; ++step) {
    if (v.size() > 80)
      v.clear(), m.clear();
    const ssize_t size = v.size(), i = this->Number(size), n = this->Number(size - i),
                  count = this->Number(4);
    const ssize_t ri = this->Number(size), rn = this->Number(size - ri);
    const M text = this->Text(9), own = m.substr(size_t(ri), size_t(rn));
    const typename TestFixture::S r(text.data(), text.size());
    const T x = this->Unit(), own1 = n > 0 ? m[size_t(i)] : x;
    const T& x1 = n > 0 ? v[i] : x; // own and own1 are copies of what p and x1 stand for in the vector
    const T* const p = v.data() + ri;
    const auto at = v.begin() + i;
    // Every edit replaces len elements at pos with some text.
    const auto becomes = [&](ssize_t pos, ssize_t len, const M& with) {
      m.replace(size_t(pos), size_t(len), with);
    };
    const auto without = [&](T c) { return M(m.begin(), std::remove(m.begin(), m.end(), c)); };
    const auto times = [](ssize_t k, T c) { return M(size_t(k), c); };
    const ssize_t what = this->Number(31);
    switch (what) {
    case 0: v.push_back(x1), becomes(size, 0, {own1}); break;
    case 1: v.append(r), becomes(size, 0, text); break;
    case 2: v.append(count, x), becomes(size, 0, times(count, x)); break;
    case 3: v.insert(i, r), becomes(i, 0, text); break;
    case 4: v.insert(i, x1), becomes(i, 0, {own1}); break;
    case 5: v.insert(i, count, x1), becomes(i, 0, times(count, own1)); break;
    case 6: becomes(v.insert(at, x1) - v.begin(), 0, {own1}); break;
    case 7: v.replace(i, n, r), becomes(i, n, text); break;
    case 8: v.replace(i, n, count, x1), becomes(i, n, times(count, own1)); break;
    case 9: v.replace(at, at + n, r), becomes(i, n, text); break;
    case 10: v.replace(at, at + n, count, x), becomes(i, n, times(count, x)); break;
    case 11: v.replace(at, at + n, p, rn), becomes(i, n, own); break;
    case 12: v.erase(i, n), becomes(i, n, {}); break;
    case 13: v.erase_range(i, i + n), becomes(i, n, {}); break;
    case 14: v.resize(i, x), becomes(i, size - i, {}); break;
    case 15: v.resize(size + count, x1), becomes(size, 0, times(count, own1)); break;
    case 16: v.assign(count, x1), becomes(0, size, times(count, own1)); break;
    case 17: v.assign(v, ri, rn), becomes(0, size, own); break;
    case 18: v = v + r, becomes(size, 0, text); break;
    case 19: v.append(p, rn), becomes(size, 0, own); break;
    case 20: v.append(v, ri, rn), becomes(size, 0, own); break;
    case 21: v.insert(i, p, rn), becomes(i, 0, own); break;
    case 22: v.insert(i, v, ri, rn), becomes(i, 0, own); break;
    case 23: v.replace(i, n, p, rn), becomes(i, n, own); break;
    case 24: v.replace(i, n, v, ri, rn), becomes(i, n, own); break;
    case 25: v.push_back(2, p, p + rn), becomes(size, 0, own + own); break;
    case 26: v += v, becomes(size, 0, M(m)); break;
    case 27: v.insert(i, v.begin(), v.end()), becomes(i, 0, M(m)); break;
    case 28:
      ASSERT_EQ(v.FindAndErase(x1), std::count(m.begin(), m.end(), own1));
      becomes(0, size, without(own1));
      break;
    case 29: v.resize(i, x), m.resize(size_t(i)), v *= 2, becomes(i, 0, M(m)); break;
    case 30:
      if (n > 0)
        becomes(v.erase(at) - v.begin(), 1, {}), v.push_front(x), v.pop_front();
      break;
    case 31:
      EXPECT_EQ(v.FindAndEraseFirst(x), m.rfind(x) != m.npos);
      m.erase(std::min(m.rfind(x), m.size()), 1);
      break;
    }
    ASSERT_EQ(Std(v), m) << "step " << step << " edit " << what;
    const T* const z = v.c_str();
    ASSERT_TRUE(z == v.data() && z[v.size()] == 0 && v.capacity() > v.size() && v.empty() == m.empty());
  }
}

TYPED_TEST(XVector, SearchesAndComparesLikeAString) {
  const auto sign = [](int x) { return (x > 0) - (x < 0); };
  for (int step = 0; step < 40000; ++step) {
    const auto text = this->Text(step % 100 == 0 ? 300 : 12);
    const auto pattern = this->Text(3);
    typename TestFixture::S v(text.data(), static_cast<ssize_t>(text.size()));
    typename TestFixture::S r(pattern.data(), static_cast<ssize_t>(pattern.size()));
    const ssize_t forward = this->Number(v.size());
    const ssize_t reverse = v.empty() ? kNpos : this->Number(v.size()) - 1;
    const auto uf = static_cast<std::size_t>(forward), ur = static_cast<std::size_t>(reverse);
    const TypeParam c = this->Unit();
    const auto is = [](ssize_t ours, std::size_t theirs) { return ours == static_cast<ssize_t>(theirs); };
    ASSERT_PRED2(is, v.find(c, forward), text.find(c, uf));
    ASSERT_PRED2(is, v.find(r, forward), text.find(pattern, uf));
    ASSERT_PRED2(is, v.rfind(c, reverse), text.rfind(c, ur));
    ASSERT_PRED2(is, v.rfind(r, reverse), text.rfind(pattern, ur));
    ASSERT_PRED2(is, v.find_first_of(r, forward), text.find_first_of(pattern, uf));
    ASSERT_PRED2(is, v.find_first_not_of(r, forward), text.find_first_not_of(pattern, uf));
    ASSERT_PRED2(is, v.find_first_not_of(c, forward), text.find_first_not_of(c, uf));
    ASSERT_PRED2(is, v.find_last_of(r, reverse), text.find_last_of(pattern, ur));
    ASSERT_PRED2(is, v.find_last_not_of(r, reverse), text.find_last_not_of(pattern, ur));
    ASSERT_PRED2(is, v.find_last_not_of(c, reverse), text.find_last_not_of(c, ur));
    ASSERT_EQ(v.contains(r.begin(), r.end(), forward), text.compare(uf, pattern.size(), pattern) == 0);
    ASSERT_EQ(Std(v.substr(forward, kNpos)), text.substr(uf));
    const auto other = std::basic_string<TypeParam>(this->Text(12));
    const typename TestFixture::S o(other.data(), static_cast<ssize_t>(other.size()));
    const auto u = [](TypeParam x) { return static_cast<std::make_unsigned_t<TypeParam>>(x); };
    const auto less = [&](TypeParam a, TypeParam b) { return u(a) < u(b); };
    const bool before =
        std::lexicographical_compare(text.begin(), text.end(), other.begin(), other.end(), less);
    const int expected = before ? -1 : text != other;
    ASSERT_EQ(sign(v.compare(o)), expected);
    ASSERT_EQ(sign(v.compare(0, v.size(), o, 0, o.size())), expected);
    ASSERT_EQ(sign(v.compare(o.data(), o.size())), expected);
    ASSERT_TRUE(v._Eq(o) == (expected == 0) && v._Lt(o) == (expected < 0));
    ASSERT_TRUE(sizeof(TypeParam) == 1 || v.compare(o) == expected);
  }
}

TYPED_TEST(XVector, ReverseIteratorsHoldThePlaceBehind) {
  auto v = Of<TypeParam>("abc");
  const auto& cv = v;
  EXPECT_EQ(std::basic_string<TypeParam>(cv.rbegin(), cv.rend()), Std(Of<TypeParam>("cba")));
  auto it = v.rbegin();
  EXPECT_TRUE(it == cv.rbegin() && static_cast<TypeParam*>(it) == v.end() &&
              static_cast<TypeParam*>(v.rend()) == v.begin());
  EXPECT_EQ(*it++, 'c');
  *it = 'x';
  EXPECT_TRUE(*it.operator->() == 'x' && v[1] == 'x' && it != v.rend());
  EXPECT_EQ(*--it, 'c');
  EXPECT_EQ(*it--, 'c');
  const auto* const data = v.data();
  typename TestFixture::S w;
  v.swap(w);
  EXPECT_TRUE(w.data() == data && v.data() == nullptr && v.rbegin() == v.rend());
}

} // namespace
