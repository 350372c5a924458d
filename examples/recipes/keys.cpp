// Strings as keys of maps. With Less, or Hash and Equal, a map is searched by a literal, a view, or one of
// our or the standard's strings, without making a key.

#include <cstdio>
#include <map>
#include <string_view>
#include <unordered_map>

#include <utils/Std.h>

using mirel::string16;
using mirel::string8;

int main() {
  std::map<string8, int, mirel::Less> ordered;
  for (const char* const word : {"pear", "fig", "apple", "fig"})
    ++ordered[word];
  for (const auto& [word, count] : ordered)
    std::printf("%s %d\n", word.c_str(), count);

  constexpr std::string_view line = "fig jam";
  std::printf("%zu, %zu\n", ordered.count("pear"), ordered.count(line.substr(0, 3)));

  // The defaults, std::hash and ==, take keys only.
  std::unordered_map<string16, int> lengths;
  string16 wide = mirel::ToString16(u"Äpfel");
  lengths[wide] = 5;
  wide.push_back(u'!');
  std::printf("%zu with, %zu without\n", lengths.count(wide), lengths.count(wide.substr(0, 5)));

  // From C++20 on, an unordered map is searched like the ordered one.
  std::unordered_map<string8, int, mirel::Hash, mirel::Equal> colours = {{"red", 1}};
#if defined(__cpp_lib_generic_unordered_lookup)
  std::printf("%zu\n", colours.count("red"));
#else
  std::printf("%zu\n", colours.count(string8("red")));
#endif
}

/* Prints:
apple 1
fig 2
pear 1
1, 1
0 with, 1 without
1
*/
