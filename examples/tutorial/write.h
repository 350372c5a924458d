// Writes text files in the encoding in which they were read.

#pragma once

#include <filesystem>

#include "read.h"

inline mirel::string8 Encode(const TextFile& file) {
  const Encoding& encoding = *file.encoding;
  mirel::string8 bytes = mirel::ToString8(encoding.mark);
  const auto put = [&](char32_t unit) {
    for (int k = 0; k < encoding.width; ++k)
      bytes += static_cast<char>(unit >> 8 * (encoding.isBigEndian ? encoding.width - 1 - k : k) & 0xFF);
  };
  if (encoding.width == 1) {
    bytes += file.text;
  } else if (encoding.width == 2) {
    mirel::string16 wide;
    mirel::Utf16FromUtf8(wide, file.text);
    for (const mirel::char16 unit : wide)
      put(unit);
  } else {
    for (const char32_t codePoint : mirel::CodePoints(file.text))
      put(codePoint);
  }
  return bytes;
}

// Writes a new file and renames it, so that the old one is there until the new one is complete.
inline void Write(const std::string& name, const TextFile& file) {
  const mirel::string8 bytes = Encode(file);
  const std::string newName = name + ".new";
  std::ofstream stream(newName, std::ios::binary);
  stream.write(bytes.data(), bytes.size());
  stream.close();
  if (!stream)
    throw std::runtime_error(newName + " can't be written");
  std::filesystem::rename(newName, name);
}
