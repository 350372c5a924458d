// The work of this library in the cases in which an earlier version may take part too.

#pragma once

#include "Cases.h"

/// A search in a haystack for a needle, for a single unit, or for the members of a set. Splitting finds one
/// member of the set after the other.
enum class Op { kFindUnit, kRfindUnit, kFind, kRfind, kFirstOf, kLastOf, kFirstNotOf, kLastNotOf, kSplit };

/// Searches in our strings or in standard ones, which live as long as the program.
template <class String> Contender Searching(Op op, const String& s, const String& needle) {
  using Size = decltype(s.size());
  constexpr Size kLast = static_cast<Size>(-1);
  switch (op) {
  case Op::kFindUnit: return Of([&s, unit = needle[0]] { return s.find(unit); });
  case Op::kRfindUnit: return Of([&s, unit = needle[0]] { return s.rfind(unit); });
  case Op::kFind: return Of([&s, &needle] { return s.find(needle); });
  case Op::kRfind: return Of([&s, &needle] { return s.rfind(needle); });
  case Op::kFirstOf: return Of([&s, &needle] { return s.find_first_of(needle.data(), 0, needle.size()); });
  case Op::kLastOf: return Of([&s, &needle] { return s.find_last_of(needle.data(), kLast, needle.size()); });
  case Op::kFirstNotOf:
    return Of([&s, &needle] { return s.find_first_not_of(needle.data(), 0, needle.size()); });
  case Op::kLastNotOf:
    return Of([&s, &needle] { return s.find_last_not_of(needle.data(), kLast, needle.size()); });
  case Op::kSplit: break;
  }
  return Of([&s, &needle] {
    long long words = 0;
    for (Size at = 0; (at = s.find_first_of(needle.data(), at, needle.size())) != kLast; ++at)
      ++words;
    return words;
  });
}

/// The parts of a malformed text that begin at the given indices and reach to its end.
struct Malformed {
  std::string text;
  std::vector<std::size_t> starts;
};

/// Counts the parts that a conversion, given a pointer and a size, reports as malformed.
template <class IsMalformed> Contender Reporting(const Malformed& malformed, IsMalformed isMalformed) {
  return Of([&malformed, isMalformed] {
    const std::string& text = malformed.text;
    int reports = 0;
    for (const std::size_t start : malformed.starts)
      reports += isMalformed(text.data() + start, text.size() - start);
    return reports;
  });
}

/// One version of the library. The arguments of its functions live as long as the program. A conversion
/// reuses its destination, or converts into a fresh string and calls c_str().
struct Library {
  Contender (*search8)(Op op, const std::string& text, const std::string& needle);
  Contender (*search16)(Op op, const std::u16string& text, const std::u16string& needle);
  Contender (*toUtf16)(const std::vector<std::string>& texts, bool isFresh);
  Contender (*toUtf8)(const std::vector<std::u16string>& texts, bool isFresh);
  Contender (*reportMalformed)(const Malformed& malformed);
};

extern const Library kOurs;
#ifdef HAVE_BEFORE
extern const Library kBefore;
#endif

/// Adds this library to a case, and if withEarlierVersion the earlier version.
template <class Make> Case& AddLibrary(Case& to, bool withEarlierVersion, Make make) {
  to.Against("ours", make(kOurs));
#ifdef HAVE_BEFORE
  if (withEarlierVersion)
    to.Against("earlier version", make(kBefore));
#else
  static_cast<void>(withEarlierVersion);
#endif
  return to;
}
