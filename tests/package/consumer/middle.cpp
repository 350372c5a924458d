#include "middle.h"

std::vector<mirel::string16> Words(const mirel::string8& text) {
  std::vector<mirel::string16> words(1);
  mirel::string16 units;
  if (!mirel::UtfToUtf<mirel::char16, mirel::char8>(units, text.data(), text.size()))
    return {};
  for (const mirel::char16 unit : units) {
    if (unit == ' ')
      words.emplace_back();
    else
      words.back().push_back(unit);
  }
  return words;
}

void Print(mirel::IOutputStream& sink, const mirel::string16& text) {
  mirel::string8 bytes;
  mirel::Utf8FromUtf16(bytes, text.data(), text.size());
  mirel::xostream stream(sink);
  stream << bytes;
}
