// Text to and from a C interface in UTF-16, such as those of system and database libraries.

#include <cstdint>
#include <cstdio>

#include <utils/Utf.h>

using mirel::ssize_t;
using mirel::string16;
using mirel::string8;

extern "C" {

// The interface: null-terminated text, and a result that is written into the caller's buffer. The length of
// the result is returned even if it doesn't fit.
int CountUnits(const uint16_t* text) {
  int count = 0;
  while (text[count] != 0)
    ++count;
  return count;
}

int CopyUpper(uint16_t* result, int room, const uint16_t* text, int length) {
  for (int i = 0; i < length && i < room; ++i)
    result[i] = text[i] >= 'a' && text[i] <= 'z' ? static_cast<uint16_t>(text[i] - 'a' + 'A') : text[i];
  return length;
}
}

string16 Upper(const string16& text) {
  const int length = static_cast<int>(text.size());
  string16 result;
  result.resize(CopyUpper(nullptr, 0, text.data(), length), 0);
  CopyUpper(result.data(), static_cast<int>(result.size()), text.data(), length);
  return result;
}

int main() {
  string16 text;
  mirel::Utf16FromUtf8(text, "café");
  string8 upper;
  mirel::Utf8FromUtf16(upper, Upper(text));
  std::printf("%d %s\n", CountUnits(text.c_str()), upper.c_str());
}

/* Prints:
4 CAFé
*/
