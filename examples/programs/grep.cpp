// Prints the lines of a file that contain a text, with the lines around them, and the column at which the
// text begins. Columns count code points.

#include <algorithm>
#include <charconv>
#include <cstdlib>
#include <fstream>
#include <iostream>
#include <string_view>
#include <vector>

#include <utils/Std.h>
#include <utils/Utf.h>

using mirel::ssize_t;
using mirel::string8;

int main(int argc, char** argv) {
  int context = 0;
  std::ifstream file(argc == 4 ? argv[3] : "", std::ios::binary);
  if (!file ||
      std::from_chars(argv[1], argv[1] + std::string_view(argv[1]).size(), context).ec != std::errc()) {
    std::cerr << "usage: grep CONTEXT TEXT FILE\n";
    return EXIT_FAILURE;
  }
  const std::string_view needle = argv[2];
  string8 text;
  while (mirel::FillFrom(text, 65536, [&](char* p, ssize_t n) { return file.read(p, n).gcount(); }) > 0)
    ;

  // Each line begins where the one before it ends.
  std::vector<ssize_t> begins = {0};
  for (ssize_t end = 0; (end = text.find('\n', end)) >= 0;)
    begins.push_back(++end);
  if (begins.back() < text.size())
    begins.push_back(text.size());
  const auto line = [&](std::size_t i) {
    const auto begin = static_cast<std::size_t>(begins[i]), end = static_cast<std::size_t>(begins[i + 1]);
    const std::string_view withEnd = mirel::View(text).substr(begin, end - begin);
    return withEnd.substr(0, withEnd.find('\n'));
  };

  const std::size_t lines = begins.size() - 1, around = static_cast<std::size_t>(context);
  std::size_t printed = 0; // the lines before this one are done
  for (std::size_t i = 0; i < lines; ++i) {
    if (line(i).find(needle) == std::string_view::npos)
      continue;
    const std::size_t first = std::max(printed, i - std::min(i, around)),
                      last = std::min(lines - 1, i + around);
    if (printed > 0 && first > printed)
      std::cout << "--\n";
    for (std::size_t k = first; k <= last; ++k) {
      const auto at = line(k).find(needle);
      if (k > i && at != std::string_view::npos)
        break; // it has a context of its own
      std::cout << k + 1;
      if (at != std::string_view::npos)
        std::cout << ':' << mirel::CountCodePoints(line(k).substr(0, at)) + 1 << ':' << line(k) << '\n';
      else
        std::cout << '-' << line(k) << '\n';
      printed = k + 1;
    }
  }
}

/* Prints:
2-Über dem Hafen kreisen Möwen,
3:9:Schöne, graue Vögel, eine graue
4:5:ist graue Eminenz.
5-
--
7-Zwei Boote,
8:1:graue Boote
*/
