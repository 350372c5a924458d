// Views of our strings, and strings from views: what other interfaces take and give.

#include <cstdio>
#include <string>
#include <string_view>
#include <version>
#if defined(__cpp_lib_span)
#include <span>
#endif

#include <utils/xstring.h>

using mirel::char16;
using mirel::string16;
using mirel::string8;

// A string8 is seen through a string_view. The view is good until the string may move its storage.
std::string_view View(const string8& text) { return {text.data(), static_cast<std::size_t>(text.size())}; }

// A string16 is seen through a span, or before C++20 through the two pointers that a span stands for. A
// u16string_view may not look at it: its units are uint16_t, which may not be read through a char16_t*,
// another type. Nor is there a basic_string_view of uint16_t: the standard has character traits for character
// types only.
#if defined(__cpp_lib_span)
int Sum(std::span<const char16> units) {
  int sum = 0;
  for (const char16 unit : units)
    sum += unit;
  return sum;
}
int Sum(const string16& text) { return Sum(std::span<const char16>(text)); }
#else
int Sum(const string16& text) {
  int sum = 0;
  for (const char16* p = text.data(); p != text.data_end(); ++p)
    sum += *p;
  return sum;
}
#endif

int main() {
  const string8 line = "key = value";

  std::string_view name = View(line);
  name.remove_suffix(name.size() - name.find(' '));

  const string8 copy(name.data(), name.size()); // a string from a view, with all its zeros
  string8 reused;
  reused.assign(name.begin(), name.end()); // the same in storage that is there already

  const std::string standard(line.begin(), line.end());
  const string8 back(standard.data(), standard.size());

  const char16 units[] = {1, 2, 3};
  const string16 wide(units, 3);

  std::printf("%s, %s, %s, %d\n", copy.c_str(), reused.c_str(), back.c_str(), Sum(wide));
}

/* Prints:
key, key, key = value, 6
*/
