// Strings as keys of maps. There is no == or <, so a map is told how to compare, by _Eq and _Lt.

#include <cstdio>
#include <map>
#include <string_view>
#include <unordered_map>

#include <utils/xstring.h>

using mirel::string16;
using mirel::string8;

struct Less {
  template <class String> bool operator()(const String& a, const String& b) const { return a._Lt(b); }
};

struct Equal {
  template <class String> bool operator()(const String& a, const String& b) const { return a._Eq(b); }
};

// Of the bytes of the units. Any object may be read as bytes, those of a string16 too.
struct Hash {
  template <class String> std::size_t operator()(const String& text) const {
    const auto* const first = reinterpret_cast<const char*>(text.data());
    const auto* const last = reinterpret_cast<const char*>(text.data_end());
    return std::hash<std::string_view>()({first, static_cast<std::size_t>(last - first)});
  }
};

int main() {
  std::map<string8, int, Less> ordered;
  for (const char* const word : {"pear", "fig", "apple", "fig"})
    ++ordered[word];
  for (const auto& [word, count] : ordered)
    std::printf("%s %d\n", word.c_str(), count);

  std::unordered_map<string16, int, Hash, Equal> lengths;
  string16 wide;
  mirel::Utf16FromUtf8(wide, "Äpfel");
  lengths[wide] = 5;
  wide.push_back(u'!');
  std::printf("%zu with, %zu without\n", lengths.count(wide), lengths.count(wide.substr(0, 5)));
}

/* Prints:
apple 1
fig 2
pear 1
0 with, 1 without
*/
