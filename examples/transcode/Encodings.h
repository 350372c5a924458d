// The encodings and their names.

#pragma once

#include <string>
#include <string_view>

#include <utils/xchar.h>

namespace transcode {

using mirel::char16;

/// How code points are encoded, apart from the byte order.
enum class Form { kUtf8, kUtf16, kUtf32, kLatin1, kAscii };

/// The order of the bytes in a unit; units of one byte have none.
enum class ByteOrder { kNone, kLittle, kBig, kByMark };

struct Encoding {
  const char* name;
  const char* aliases; ///< separated by blanks
  Form form;
  ByteOrder order;

  bool IsByMark() const { return order == ByteOrder::kByMark; }
  /// Returns whether it has every code point; other encodings have only those below Limit().
  bool IsUnicode() const { return form != Form::kLatin1 && form != Form::kAscii; }
  char16 Limit() const { return form == Form::kAscii ? 0x80 : 0x100; }
};

constexpr char16 kByteOrderMark = 0xFEFF;
/// The encoding of input and output by default.
extern const Encoding& kDefaultEncoding;

/// Finds the encoding of a name, or returns null. Case, dashes, underscores and "//" at its end don't count.
const Encoding* FindEncoding(std::string_view name);
/// Finds the names that are the fewest edits away from the given one: "utf-16le or utf-16be". The result is
/// empty if none is close enough to be a typing error.
std::string NearestNames(std::string_view name);
/// Returns a line for each encoding: its name, then its aliases.
std::string ListEncodings();

} // namespace transcode
