// Text as code units, and as the bytes that they are.

#pragma once

#include <string>
#include <string_view>

#include <utils/Utf.h>

#include "Encodings.h"

namespace transcode {

using mirel::ssize_t;
using mirel::string16;
using mirel::string8;

/// The bytes of a code unit.
ssize_t UnitSize(Form form);
/// The bytes that units of UTF-16 take in a form.
ssize_t EncodedSize(Form form, const char16* p, ssize_t n);
/// How many of n units stand before the first that is at the limit or above.
ssize_t LengthBelow(char16 limit, const char16* p, ssize_t n);

/// Sets units to those that n bytes hold, of two bytes or of four; the part of a unit at the end is left out.
/// The order is little or big.
void ReadUnits(string16& units, const char* p, ssize_t n, ByteOrder order);
void ReadUnits(std::u32string& units, const char* p, ssize_t n, ByteOrder order);

std::string_view BytesOf(const string8& s);
std::string_view BytesOf(const string16& s);

/// Where the bytes of a text are put, if its units aren't these bytes already.
struct Room {
  string16 units;
  string8 bytes;
};
/// The bytes of a text of which the form has every code point. They stand in the text or in the room.
std::string_view Encode(const string16& text, Form form, ByteOrder order, Room& room);

} // namespace transcode
