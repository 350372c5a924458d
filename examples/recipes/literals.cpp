// u"..." literals and std::u16string, in and out. char16_t is a different type from char16, and a pointer to
// one may not be used as a pointer to the other; members that take iterators convert unit by unit.

#include <cstdio>
#include <string>
#include <string_view>

#include <utils/Std.h>

using mirel::string16;

int main() {
  string16 text = mirel::ToString16(u"Grüße, Jürgen");

  // Searches and edits take the iterators of a literal as they are; single units need nothing.
  constexpr std::u16string_view name = u"Jürgen", other = u"Zoë";
  const auto at = text.find(name.begin(), name.end());
  text.erase(at, text.size() - at);
  text.insert(at, other.begin(), other.end());
  text += u'!';

  const std::u16string standard = mirel::ToU16String(text);
  std::printf("%d %d\n", standard == u"Grüße, Zoë!", mirel::ToString16(standard) == text);
}

/* Prints:
1 1
*/
