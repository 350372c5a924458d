// Building, copying and changing strings and vectors.
#include "Cases.h"

#include <algorithm>
#include <map>
#include <vector>

#ifdef HAVE_ABSEIL
#include <absl/strings/str_cat.h>
#endif

namespace {

/// Registers count appends to an empty container of each kind.
template <class T> void RegisterBuilding(ssize_t count) {
  using Std = typename Width<T>::Std;
  const auto pushBack = [count](auto make, auto unit) {
    return [=] {
      auto s = make();
      for (ssize_t i = 0; i < count; ++i)
        s.push_back(unit);
      return s.size();
    };
  };
  const auto ours = [] { return mirel::basic_xstring<T>(); };
  const auto theirs = [] { return StdString<T>(); };
  const auto vector = [] { return std::vector<Std>(); };
  const auto edits = [count](const char* operation, const char* data) {
    return Case("Building", operation, data, static_cast<std::size_t>(count),
                std::string("edits, ") + Width<T>::kUnit);
  };
  edits("push_back", "from empty")
      .Ours(pushBack(ours, T('x')))
      .Against(Width<T>::kPeer, pushBack(theirs, Std('x')))
      .Against("std::vector", pushBack(vector, Std('x')));

  static const auto theirRange = StdOf<T>("seventeen units..");
  static const auto ourRange = OurOf<T>(theirRange);
  const auto append = [count](auto make, auto add) {
    return [=] {
      auto s = make();
      for (ssize_t i = 0; i < count; ++i)
        add(s);
      return s.size();
    };
  };
  Case appends = edits("append of 17 units", "from empty");
  appends.Ours(append(ours, [](auto& s) { s.append(ourRange); }))
      .Against(Width<T>::kPeer, append(theirs, [](auto& s) { s.append(theirRange); }))
      .Against("std::vector",
               append(vector, [](auto& v) { v.insert(v.end(), theirRange.begin(), theirRange.end()); }));
#ifdef HAVE_ABSEIL
  if constexpr (sizeof(T) == 1)
    appends.Against("absl::StrAppend", append(theirs, [](auto& s) { absl::StrAppend(&s, theirRange); }));
#endif
  if (count > 1000)
    return;
  const auto appendAndRead = [](auto& range) {
    return [&range](auto& s) {
      s.append(range);
      benchmark::DoNotOptimize(s.c_str());
    };
  };
  edits("append and c_str()", "in turn, 17 units")
      .Ours(append(ours, appendAndRead(ourRange)))
      .Against(Width<T>::kPeer, append(theirs, appendAndRead(theirRange)));
}

template <class T> void RegisterChanging(ssize_t size) {
  const auto usize = static_cast<std::size_t>(size);
  std::string text;
  while (text.size() < usize)
    text += "the change of text in place ";
  text.resize(usize);
  // The cases live as long as the program, and so do their texts.
  const auto& theirs = *new StdString<T>(StdOf<T>(text));
  const auto& ours = *new mirel::basic_xstring<T>(OurOf<T>(theirs));
  auto& ourTarget = *new mirel::basic_xstring<T>(ours);
  auto& theirTarget = *new StdString<T>(theirs);
  const auto pair = [&](const char* operation, const char* data, auto ourWork, auto theirWork) {
    Case("Editing", operation, data, usize, Width<T>::kUnit)
        .Ours(ourWork)
        .Against(Width<T>::kPeer, theirWork);
  };
  pair(
      "copy", "construction", [&] { return mirel::basic_xstring<T>(ours).size(); },
      [&] { return StdString<T>(theirs).size(); });
  pair(
      "substr", "all but two units", [&, size] { return ours.substr(1, size - 2).size(); },
      [&, usize] { return theirs.substr(1, usize - 2).size(); });
  pair(
      "assignment", "into storage",
      [&] {
        ourTarget = ours;
        return ourTarget.size();
      },
      [&] {
        theirTarget = theirs;
        return theirTarget.size();
      });
  pair(
      "insertion and erasure", "of a unit at the front",
      [&] {
        ourTarget.insert(0, 'x');
        ourTarget.erase(0, 1);
        return ourTarget.size();
      },
      [&] {
        theirTarget.insert(theirTarget.begin(), 'x');
        theirTarget.erase(0, 1);
        return theirTarget.size();
      });
  // Both restore the contents first, by the same copy.
  auto& ourErased = *new mirel::basic_xstring<T>(ours);
  auto& theirErased = *new StdString<T>(theirs);
  pair(
      "FindAndErase", "frequent unit",
      [&] {
        ourErased = ours;
        ourErased.FindAndErase('e');
        return ourErased.size();
      },
      [&] {
        theirErased = theirs;
        theirErased.erase(std::remove(theirErased.begin(), theirErased.end(), 'e'), theirErased.end());
        return theirErased.size();
      });
}

/// Registers benchmarks of strings of 10 units; standard strings hold 10 bytes without an allocation.
template <class T> void RegisterShortStrings() {
  static const auto theirs = StdOf<T>("ten units.");
  static const auto ours = OurOf<T>(theirs);
  const auto pair = [](const char* operation, const char* data, std::size_t count, auto ourWork,
                       auto theirWork) {
    Case("Short strings", operation, data, count, std::string("strings of 10 ") + Width<T>::kUnit)
        .Ours(ourWork)
        .Against(Width<T>::kPeer, theirWork);
  };
  const auto each = [pair](const char* operation, auto workWith) {
    pair(
        operation, "of one, and destruction", 1, [workWith] { return workWith(ours); },
        [workWith] { return workWith(theirs); });
  };
  each("construction", [](auto& s) {
    std::decay_t<decltype(s)> made(s.data(), s.size());
    benchmark::DoNotOptimize(made);
    return made.size();
  });
  each("copy construction", [](auto& s) {
    std::decay_t<decltype(s)> made(s);
    benchmark::DoNotOptimize(made);
    return made.size();
  });
  each("copy and c_str()", [](auto& s) {
    std::decay_t<decltype(s)> made(s);
    benchmark::DoNotOptimize(made.c_str());
    return made.size();
  });
  each("substr of 5 units", [](auto& s) {
    auto made = s.substr(2, 5);
    benchmark::DoNotOptimize(made);
    return made.size();
  });

  // 1,000 strings that differ in the middle, unsorted.
  constexpr std::size_t kCount = 1000;
  static std::vector<StdString<T>> theirWords;
  static std::vector<mirel::basic_xstring<T>> ourWords;
  for (std::size_t i = 0; i < kCount; ++i) {
    theirWords.push_back(StdOf<T>("w" + std::to_string(1000000 + i * 7919 % kCount) + ".."));
    ourWords.push_back(OurOf<T>(theirWords.back()));
  }
  const auto less = [](const auto& a, const auto& b) {
    if constexpr (std::is_same_v<decltype(a), const StdString<T>&>)
      return a < b;
    else
      return a._Lt(b);
  };
  const auto grow = [](auto& words) {
    std::decay_t<decltype(words)> grown;
    for (const auto& word : words)
      grown.push_back(word);
    return grown.size();
  };
  const auto sort = [less](auto& words) {
    auto sorted = words;
    std::sort(sorted.begin(), sorted.end(), less);
    return sorted[kCount / 2][7];
  };
  const auto insert = [less](auto& words) {
    std::map<std::decay_t<decltype(words[0])>, int, decltype(less)> counts(less);
    for (const auto& word : words)
      ++counts[word];
    return counts.size();
  };
  const auto all = [pair](const char* operation, const char* data, auto workWith) {
    pair(
        operation, data, kCount, [workWith] { return workWith(ourWords); },
        [workWith] { return workWith(theirWords); });
  };
  all("push_back of strings", "std::vector, from empty", grow);
  all("copy and sort", "std::vector", sort);
  all("insertion of keys", "std::map, from empty", insert);
}

} // namespace

void RegisterEdits() {
  RegisterShortStrings<char8>();
  RegisterShortStrings<char16>();
  for (const ssize_t count : {1000, 200000}) {
    RegisterBuilding<char8>(count);
    RegisterBuilding<char16>(count);
  }
  for (const ssize_t size : {200, 1 << 16, 4 << 20}) {
    RegisterChanging<char8>(size);
    RegisterChanging<char16>(size);
  }
}
