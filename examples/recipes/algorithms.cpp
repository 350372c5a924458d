// The standard algorithms take our containers, whose iterators are pointers.

#include <algorithm>
#include <cstdio>
#include <iterator>
#include <version>

#include <utils/Utf.h>

using mirel::string16;
using mirel::string8;
using mirel::xvector;

int main() {
  string8 letters = "mississippi";

  int found = 0;
  for (const char unit : letters)
    found += unit == 'i';

#if defined(__cpp_lib_ranges)
  std::ranges::sort(letters);
  const auto copies = std::ranges::count(letters, 's');
#else
  std::sort(letters.begin(), letters.end());
  const auto copies = std::count(letters.begin(), letters.end(), 's');
#endif
  letters.erase(std::unique(letters.begin(), letters.end()), letters.end());

  string16 wide;
  std::transform(letters.begin(), letters.end(), std::back_inserter(wide),
                 [](char unit) { return static_cast<mirel::char16>(unit - 'a' + 'A'); });
  string8 upper;
  mirel::Utf8FromUtf16(upper, wide);

  const xvector<mirel::char16> squares = {1, 4, 9, 16};
  const auto at = std::lower_bound(squares.begin(), squares.end(), 9);

  std::printf("%d, %td, %s, %s, %td\n", found, copies, letters.c_str(), upper.c_str(), at - squares.begin());
}

/* Prints:
4, 4, imps, IMPS, 2
*/
