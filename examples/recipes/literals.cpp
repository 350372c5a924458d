// u"..." literals and std::u16string, in and out. char16_t is another type than char16, and a pointer to one
// may not be used as a pointer to the other; what takes iterators converts unit by unit.

#include <cstdio>
#include <string>
#include <string_view>

#include <utils/xstring.h>

using mirel::string16;

string16 Text(std::u16string_view units) {
  string16 text;
  text.assign(units.begin(), units.end());
  return text;
}

int main() {
  string16 text = Text(u"Grüße, Jürgen");

  // Searches and edits take the iterators of a literal as they are; single units need nothing.
  constexpr std::u16string_view name = u"Jürgen", other = u"Zoë";
  const auto at = text.find(name.begin(), name.end());
  text.erase(at, text.size() - at);
  text.insert(at, other.begin(), other.end());
  text += u'!';

  const std::u16string standard(text.begin(), text.end());
  std::printf("%d %d\n", standard == u"Grüße, Zoë!", Text(standard)._Eq(text));
}

/* Prints:
1 1
*/
