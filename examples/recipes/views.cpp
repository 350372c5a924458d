// Views of our strings, and strings made from views.

#include <cstdio>
#include <string>
#include <string_view>
#include <version>
#if defined(__cpp_lib_span)
#include <span>
#endif

#include <utils/Std.h>

using mirel::char16;
using mirel::string16;
using mirel::string8;

// Pass a string16 as a span, or before C++20 as a pair of pointers. A u16string_view can't refer to it: its
// units are uint16_t, which may not be read through a char16_t*. Nor is there a basic_string_view of
// uint16_t: the standard has character traits for character types only.
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

  // The view is valid until the next change of the string, c_str() included.
  std::string_view name = mirel::View(line);
  name.remove_suffix(name.size() - name.find(' '));

  const string8 copy = mirel::ToString8(name); // nulls included
  string8 reused;
  reused.assign(name.begin(), name.end()); // keeps storage that is large enough

  const std::string standard = mirel::ToString(line);
  const string8 back = mirel::ToString8(standard);

  const char16 units[] = {1, 2, 3};
  const string16 wide(units, 3);

  std::printf("%s, %s, %d, %d\n", copy.c_str(), reused.c_str(), back == standard, Sum(wide));
}

/* Prints:
key, key, 1, 6
*/
