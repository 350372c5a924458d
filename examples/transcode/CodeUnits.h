// Code units and their bytes.

#pragma once

#include <string>
#include <string_view>

#include <utils/Utf.h>

#include "Encodings.h"

namespace transcode {

using mirel::ssize_t;
using mirel::string16;
using mirel::string8;

/// The number of bytes of a code unit.
ssize_t UnitSize(Form form);
/// The number of bytes that n UTF-16 units take in a form.
ssize_t EncodedSize(Form form, const char16* p, ssize_t n);
/// Counts the units before the first that is at the limit or above. The limit is a power of two.
ssize_t LengthBelow(char16 limit, const char16* p, ssize_t n);

/// Reads units of two or four bytes from n bytes, little-endian or big-endian. Part of a unit at the end is
/// left out.
void ReadUnits(string16& units, const char* p, ssize_t n, ByteOrder order);
void ReadUnits(std::u32string& units, const char* p, ssize_t n, ByteOrder order);

std::string_view BytesOf(const string8& s);
std::string_view BytesOf(const string16& s);

/// Storage for the result of Encode().
struct Scratch {
  string16 units;
  string8 bytes;
};
/// Encodes a text in a form that has all its code points. The result refers to the text or to the scratch.
std::string_view Encode(const string16& text, Form form, ByteOrder order, Scratch& scratch);

} // namespace transcode
