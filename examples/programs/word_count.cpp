// Counts the lines, words and code points of a UTF-8 file, and names its most frequent words.

#include <algorithm>
#include <cstdlib>
#include <fstream>
#include <iostream>
#include <map>
#include <string_view>
#include <vector>

#include <utils/Std.h>
#include <utils/Utf.h>

using mirel::ssize_t;
using mirel::string8;

int main(int argc, char** argv) {
  std::ifstream file(argc == 2 ? argv[1] : "", std::ios::binary);
  string8 text;
  while (mirel::FillFrom(text, 65536, [&](char* p, ssize_t n) { return file.read(p, n).gcount(); }) > 0)
    ;
  if (!file.eof()) {
    std::cerr << "usage: word_count FILE\n";
    return EXIT_FAILURE;
  }
  if (const ssize_t at = mirel::FindMalformed(text); at >= 0) {
    std::cerr << mirel::Describe(mirel::ExplainMalformed(text, at).reason) << " at byte " << at << '\n';
    return EXIT_FAILURE;
  }

  constexpr char kBetweenWords[] = " \t\r\n.,;:!?\"()";
  std::map<string8, int, mirel::Less> counts;
  int words = 0;
  for (ssize_t begin = 0, end = 0; (begin = text.find_first_not_of(kBetweenWords, end)) >= 0; ++words) {
    end = text.find_first_of(kBetweenWords, begin);
    if (end < 0)
      end = text.size();
    std::string_view word = mirel::View(text);
    word = word.substr(static_cast<std::size_t>(begin), static_cast<std::size_t>(end - begin));
    // Only a word that is new is copied.
    if (const auto known = counts.find(word); known != counts.end())
      ++known->second;
    else
      counts.emplace(mirel::ToString8(word), 1);
  }
  std::cout << std::count(text.begin(), text.end(), '\n') << " lines, " << words << " words, "
            << mirel::CountCodePoints(text) << " code points\n";

  std::vector<std::pair<int, std::string_view>> order;
  for (const auto& [word, count] : counts)
    order.emplace_back(-count, mirel::View(word));
  std::sort(order.begin(), order.end());
  for (std::size_t i = 0; i < order.size() && i < 4; ++i)
    std::cout << -order[i].first << ' ' << order[i].second << '\n';
}

/* Prints:
4 lines, 18 words, 94 code points
3 der
2 Fluß
2 und
1 Am
*/
