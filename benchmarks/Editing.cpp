// Building, copying and changing strings and vectors.
#include "Cases.h"

#include <algorithm>
#include <vector>

#ifdef HAVE_ABSEIL
#include <absl/strings/str_cat.h>
#endif

namespace {

/// Building count times something, from an empty container of each kind.
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
  Case(CaseName("push_back", "from empty", count, Width<T>::kBits), pushBack(ours, T('x')))
      .Against(Width<T>::kPeer, pushBack(theirs, Std('x')))
      .Against("std::vector", pushBack(vector, Std('x')));

  static const auto ourRun = OurOf<T>("seventeen units..");
  static const auto theirRun = StdOf<T>("seventeen units..");
  const auto append = [count](auto make, auto add) {
    return [=] {
      auto s = make();
      for (ssize_t i = 0; i < count; ++i)
        add(s);
      return s.size();
    };
  };
  auto appends = Case(CaseName("append of 17 units", "from empty", count, Width<T>::kBits),
                      append(ours, [](auto& s) { s.append(ourRun); }));
  appends.Against(Width<T>::kPeer, append(theirs, [](auto& s) { s.append(theirRun); }))
      .Against("std::vector",
               append(vector, [](auto& v) { v.insert(v.end(), theirRun.begin(), theirRun.end()); }));
#ifdef HAVE_ABSEIL
  if constexpr (sizeof(T) == 1)
    appends.Against("absl::StrAppend", append(theirs, [](auto& s) { absl::StrAppend(&s, theirRun); }));
#endif
  if (count > 1000)
    return;
  const auto appendAndRead = [](auto& run) {
    return [&run](auto& s) {
      s.append(run);
      benchmark::DoNotOptimize(s.c_str());
    };
  };
  Case(CaseName("append and c_str()", "in turn, 17 units", count, Width<T>::kBits),
       append(ours, appendAndRead(ourRun)))
      .Against(Width<T>::kPeer, append(theirs, appendAndRead(theirRun)));
}

template <class T> void RegisterChanging(ssize_t size) {
  const auto usize = static_cast<std::size_t>(size);
  std::string text;
  while (text.size() < usize)
    text += "the change of text in place ";
  text.resize(usize);
  // The cases live as long as the program, and so do their texts.
  const auto& ours = *new mirel::basic_xstring<T>(OurOf<T>(text));
  const auto& theirs = *new StdString<T>(StdOf<T>(text));
  auto& ourTarget = *new mirel::basic_xstring<T>(ours);
  auto& theirTarget = *new StdString<T>(theirs);
  const auto pair = [&](const char* work, const char* data, auto ourWork, auto theirWork) {
    Case(CaseName(work, data, size, Width<T>::kBits), ourWork).Against(Width<T>::kPeer, theirWork);
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
  // Both restore the contents first, which is the same copy.
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

} // namespace

void RegisterEdits() {
  for (const ssize_t count : {1000, 200000}) {
    RegisterBuilding<char8>(count);
    RegisterBuilding<char16>(count);
  }
  for (const ssize_t size : {200, 1 << 16, 4 << 20}) {
    RegisterChanging<char8>(size);
    RegisterChanging<char16>(size);
  }
}
