// Decodes JSON strings. Their escapes name UTF-16 code units, so the text is built in UTF-16: two surrogates
// become a pair there by themselves, and the conversion to UTF-8 replaces an unpaired one with U+FFFD.

#include <charconv>
#include <iostream>
#include <string_view>

#include <utils/Std.h>
#include <utils/Utf.h>

using mirel::char16;
using mirel::ssize_t;
using mirel::string16;
using mirel::string8;

/// Appends the unit of an escape. rest begins after the backslash; the escape is removed from it.
bool AppendEscape(string16& text, std::string_view& rest) {
  constexpr std::string_view kLetters = "\"\\/bfnrt", kUnits = "\"\\/\b\f\n\r\t";
  const char letter = rest.empty() ? '\0' : rest.front();
  rest.remove_prefix(rest.empty() ? 0 : 1);
  if (const auto i = kLetters.find(letter); i != kLetters.npos) {
    text.push_back(static_cast<char16>(kUnits[i]));
    return true;
  }
  const std::string_view digits = rest.substr(0, 4);
  char16 unit = 0;
  const char* const end = digits.data() + digits.size();
  if (letter != 'u' || digits.size() < 4 || std::from_chars(digits.data(), end, unit, 16).ptr != end)
    return false;
  text.push_back(unit);
  rest.remove_prefix(4);
  return true;
}

/// Sets text to the contents of the quotes. @return the index of the first error in json, or npos
ssize_t Unescape(string8& text, std::string_view json) {
  string16 units;
  std::string_view rest = json;
  const auto here = [&] { return static_cast<ssize_t>(json.size() - rest.size()); };
  if (rest.empty() || rest.front() != '"')
    return here();
  for (rest.remove_prefix(1);;) {
    const std::string_view literal = rest.substr(0, rest.find_first_of("\"\\"));
    if (const ssize_t at = mirel::FindMalformed(literal); at >= 0)
      return here() + at;
    mirel::AppendUtf16(units, literal);
    rest.remove_prefix(literal.size());
    const bool isEscape = !rest.empty() && rest.front() == '\\';
    if (rest.empty() || (!isEscape && rest.size() > 1))
      return here();
    if (!isEscape)
      break;
    rest.remove_prefix(1);
    if (!AppendEscape(units, rest))
      return here();
  }
  mirel::Utf8FromUtf16Lossy(text, units);
  return -1;
}

int main() {
  for (const std::string_view json :
       {R"("a\tb \"quoted\" \u00e9")", R"("Grüße, \uD83D\uDE00 and \ud83d alone")", R"("\u12")", R"("open)",
        "\"\xC3\"", R"("\x")", R"("")"}) {
    string8 text;
    if (const ssize_t at = Unescape(text, json); at >= 0)
      std::cout << json.size() << " bytes, error at byte " << at << '\n';
    else
      std::cout << '<' << text << ">\n";
  }
}

/* Prints:
<a	b "quoted" é>
<Grüße, 😀 and � alone>
6 bytes, error at byte 3
5 bytes, error at byte 5
3 bytes, error at byte 1
4 bytes, error at byte 3
<>
*/
