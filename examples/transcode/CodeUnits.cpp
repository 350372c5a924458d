#include "CodeUnits.h"

#include <algorithm>
#include <cstring>

namespace transcode {

namespace {

bool IsMachineOrder(ByteOrder order) {
  const char16 unit = 1;
  char firstByte;
  std::memcpy(&firstByte, &unit, 1);
  return (firstByte == 1) == (order == ByteOrder::kLittle);
}

void SwapBytes(string16& units) {
  for (char16& unit : units)
    unit = static_cast<char16>(unit << 8 | unit >> 8);
}

void Utf32FromUtf16(string8& dst, const string16& text, ByteOrder order) {
  dst.resize(4 * mirel::CountCodePoints(text), '\0');
  char* p = dst.data();
  for (const char32_t c : mirel::CodePoints(text))
    for (int i = 0; i < 4; ++i)
      *p++ = static_cast<char>(c >> 8 * (order == ByteOrder::kLittle ? i : 3 - i) & 0xFF);
}

void NarrowUnits(string8& dst, const string16& text) {
  dst.resize(text.size(), '\0');
  std::transform(text.begin(), text.end(), dst.data(), [](char16 unit) { return static_cast<char>(unit); });
}

} // namespace

ssize_t UnitSize(Form form) { return form == Form::kUtf32 ? 4 : form == Form::kUtf16 ? 2 : 1; }

ssize_t EncodedSize(Form form, const char16* p, ssize_t n) {
  switch (form) {
  case Form::kUtf8: return mirel::Utf8Length(p, n);
  case Form::kUtf16: return 2 * n;
  case Form::kUtf32: return 4 * mirel::CountCodePoints(p, n);
  case Form::kLatin1:
  case Form::kAscii: break;
  }
  return n;
}

ssize_t LengthBelow(char16 limit, const char16* p, ssize_t n) {
  constexpr ssize_t kAtOnce = 64; // compilers vectorise the loop over these
  const auto isBelow = [limit](const char16* begin) {
    char16 all = 0; // the limit is a power of two
    for (ssize_t i = 0; i < kAtOnce; ++i)
      all = static_cast<char16>(all | begin[i]);
    return all < limit;
  };
  ssize_t below = 0;
  while (n - below >= kAtOnce && isBelow(p + below))
    below += kAtOnce;
  return std::find_if(p + below, p + n, [limit](char16 unit) { return unit >= limit; }) - p;
}

void ReadUnits(string16& units, const char* p, ssize_t n, ByteOrder order) {
  units.resize(n / 2, 0);
  if (!units.empty())
    std::memcpy(units.data(), p, 2 * static_cast<std::size_t>(units.size()));
  if (!IsMachineOrder(order))
    SwapBytes(units);
}

void ReadUnits(std::u32string& units, const char* p, ssize_t n, ByteOrder order) {
  units.resize(static_cast<std::size_t>(n / 4));
  for (char32_t& unit : units) {
    for (int i = 0; i < 4; ++i)
      unit = unit << 8 | static_cast<unsigned char>(p[order == ByteOrder::kLittle ? 3 - i : i]);
    p += 4;
  }
}

std::string_view BytesOf(const string8& s) { return {s.data(), static_cast<std::size_t>(s.size())}; }

std::string_view BytesOf(const string16& s) {
  return {reinterpret_cast<const char*>(s.data()), 2 * static_cast<std::size_t>(s.size())};
}

std::string_view Encode(const string16& text, Form form, ByteOrder order, Scratch& scratch) {
  switch (form) {
  case Form::kUtf8: mirel::Utf8FromUtf16(scratch.bytes, text); break;
  case Form::kUtf16:
    if (IsMachineOrder(order))
      return BytesOf(text);
    scratch.units = text;
    SwapBytes(scratch.units);
    return BytesOf(scratch.units);
  case Form::kUtf32: Utf32FromUtf16(scratch.bytes, text, order); break;
  case Form::kLatin1:
  case Form::kAscii: NarrowUnits(scratch.bytes, text); break;
  }
  return BytesOf(scratch.bytes);
}

} // namespace transcode
