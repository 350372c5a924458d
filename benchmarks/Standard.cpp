// The operators, hashes and movable strings that the standard library's containers use.
#include "Cases.h"

#include <algorithm>
#include <memory>
#include <random>
#include <string_view>
#include <unordered_map>
#include <vector>

#include <utils/Std.h>

namespace {

template <class T> using StdView = std::basic_string_view<typename Width<T>::Std>;

/// Registers hashes and comparisons of texts that are equal or differ in their last unit.
template <class T> void RegisterComparing(ssize_t size) {
  const auto usize = static_cast<std::size_t>(size);
  // The cases live as long as the program, and so do their texts.
  auto* const texts = new std::vector<StdString<T>>(3, StdString<T>(usize, 'x'));
  texts->back().back() = 'y';
  auto* const ours = new std::vector<mirel::basic_xstring<T>>;
  for (const auto& text : *texts)
    ours->push_back(OurOf<T>(text));
  // Both sides compare bytes at the same addresses, which matter by a few ns.
  auto* const theirs = new std::vector<StdView<T>>(texts->begin(), texts->end());
  if constexpr (sizeof(T) == 1)
    std::transform(ours->begin(), ours->end(), theirs->begin(), [](auto& s) { return mirel::View(s); });
  const std::string peer = std::string(Width<T>::kPeer) + "_view";
  const auto pair = [&](const char* operation, const char* data, auto workWith) {
    Case("Standard library", operation, data, usize, Width<T>::kUnit)
        .Ours([=] { return workWith(*ours); })
        .Against(peer, [=] { return workWith(*theirs); });
  };
  pair("std::hash", "one text",
       [](const auto& s) { return std::hash<std::decay_t<decltype(s[0])>>()(s[0]); });
  pair("==", "equal texts", [](const auto& s) { return s[0] == s[1]; });
  pair("==", "another last unit", [](const auto& s) { return s[0] == s[2]; });
  pair("<", "another last unit", [](const auto& s) { return s[0] < s[2]; });
}

/// Registers benchmarks of standard containers of strings of 16 units, which are too long for a standard
/// string to hold without an allocation.
template <class T> void RegisterContainers() {
  constexpr std::size_t kCount = 1000;
  using Std = StdString<T>;
  static std::vector<Std> theirs;
  static std::vector<mirel::MovableString<T>> ours;
  static std::vector<mirel::basic_xstring<T>> copied;
  for (std::size_t i = 0; i < kCount; ++i) {
    theirs.push_back(StdOf<T>("a word " + std::to_string(1000000 + i * 7919 % kCount) + ".."));
    copied.push_back(OurOf<T>(theirs.back()));
    ours.push_back(copied.back());
  }
  const auto with = [](const char* operation, const char* data) {
    return Case("Standard library", operation, data, kCount, std::string("strings of 16 ") + Width<T>::kUnit);
  };
  const auto grow = [](auto& words) {
    return [&words] {
      std::decay_t<decltype(words)> grown;
      for (const auto& word : words)
        grown.push_back(word);
      return grown.size();
    };
  };
  // The rest changes vectors in place, so only strings that can't move copy text.
  const auto relocate = [](auto& words) {
    return [own = std::make_shared<std::decay_t<decltype(words)>>(words)] {
      auto& changed = *own;
      std::decay_t<decltype(words)> larger;
      larger.reserve(2 * changed.size());
      for (auto& word : changed)
        larger.push_back(std::move(word));
      changed.swap(larger);
      return changed.size();
    };
  };
  const auto eraseAndPush = [](auto& words) {
    return [own = std::make_shared<std::decay_t<decltype(words)>>(words)] {
      auto& changed = *own;
      auto first = std::move(changed.front());
      changed.erase(changed.begin());
      changed.push_back(std::move(first));
      return changed.size();
    };
  };
  const auto shuffleAndSort = [](auto& words) {
    return [own = std::make_shared<std::decay_t<decltype(words)>>(words)] {
      auto& changed = *own;
      std::shuffle(changed.begin(), changed.end(), std::minstd_rand(1));
      std::sort(changed.begin(), changed.end());
      return changed[kCount / 2][10];
    };
  };
  const auto all = [&](const char* operation, const char* data, auto workWith) {
    with(operation, data)
        .Ours(workWith(ours))
        .Against(Width<T>::kPeer, workWith(theirs))
        .Against("strings that copy", workWith(copied));
  };
  all("movable strings: push_back", "std::vector, from empty", grow);
  all("movable strings: growth", "std::vector, to twice its capacity", relocate);
  all("movable strings: erase and push_back", "std::vector, at its ends", eraseAndPush);
  all("movable strings: shuffle and sort", "std::vector", shuffleAndSort);
  const auto lookUp = [](auto& words) {
    using Key = std::decay_t<decltype(words[0])>;
    auto* const counts = new std::unordered_map<Key, int>; // lives as long as the case
    for (const auto& word : words)
      ++(*counts)[word];
    return [&words, counts] {
      int sum = 0;
      for (const auto& word : words)
        sum += counts->find(word)->second;
      return sum;
    };
  };
  with("look-up of keys", "std::unordered_map").Ours(lookUp(copied)).Against(Width<T>::kPeer, lookUp(theirs));
}

} // namespace

void RegisterStandard() {
  for (const ssize_t size : {16, 64, 1000, 1 << 16}) {
    RegisterComparing<char8>(size);
    RegisterComparing<char16>(size);
  }
  RegisterContainers<char8>();
  RegisterContainers<char16>();
}
