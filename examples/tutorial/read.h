// Reads text files in UTF-8, UTF-16 and UTF-32: a byte order mark tells which, and without one it is UTF-8.

#pragma once

#include <fstream>
#include <stdexcept>
#include <string>
#include <string_view>

#include <utils/Std.h>
#include <utils/Utf.h>

struct Encoding {
  const char* name;
  std::string_view mark;
  int width; // bytes in a code unit
  bool isBigEndian;
};

// UTF-32 comes before UTF-16, since the mark of UTF-32LE begins with that of UTF-16LE. Every file begins with
// the empty mark.
inline const Encoding kEncodings[] = {
    {"UTF-32LE", {"\xFF\xFE\0\0", 4}, 4, false}, {"UTF-32BE", {"\0\0\xFE\xFF", 4}, 4, true},
    {"UTF-16LE", "\xFF\xFE", 2, false},          {"UTF-16BE", "\xFE\xFF", 2, true},
    {"UTF-8", "\xEF\xBB\xBF", 1, false},         {"UTF-8", "", 1, false},
};

struct TextFile {
  const Encoding* encoding;
  mirel::string8 text; // UTF-8
};

// Converts the bytes to UTF-8. Returns false where they are malformed.
inline bool Decode(mirel::string8& text, const mirel::string8& bytes, const Encoding& encoding) {
  const int width = encoding.width;
  if (width == 1) {
    text = bytes;
    return mirel::IsWellFormed(text);
  }
  mirel::string16 wide;
  for (mirel::ssize_t i = 0; i < bytes.size(); i += width) {
    if (bytes.size() - i < width)
      return false;
    char32_t unit = 0;
    for (int k = 0; k < width; ++k)
      unit = unit << 8 | static_cast<unsigned char>(bytes[i + (encoding.isBigEndian ? k : width - 1 - k)]);
    if (width == 2)
      wide += static_cast<mirel::char16>(unit);
    else if (unit > 0x10FFFF || (0xD800 <= unit && unit < 0xE000))
      return false;
    else
      mirel::AppendCodePoint(text, unit);
  }
  return width == 4 || mirel::Utf8FromUtf16(text, wide);
}

inline TextFile Read(const std::string& name) {
  std::ifstream stream(name, std::ios::binary);
  mirel::string8 bytes;
  while (mirel::FillFrom(bytes, 65536, [&](char* p, mirel::ssize_t n) { return stream.read(p, n).gcount(); }))
    ;
  if (!stream.eof())
    throw std::runtime_error(name + " can't be read");

  TextFile file = {kEncodings, {}};
  while (mirel::View(bytes).substr(0, file.encoding->mark.size()) != file.encoding->mark)
    ++file.encoding;
  bytes.erase(0, file.encoding->mark.size());
  if (!Decode(file.text, bytes, *file.encoding))
    throw std::runtime_error(name + " is malformed " + file.encoding->name);
  return file;
}
