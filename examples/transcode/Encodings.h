// The encodings, and the names that they go by.

#pragma once

#include <string>
#include <string_view>

#include <utils/xchar.h>

namespace transcode {

using mirel::char16;

/// What a code point becomes, apart from the order of bytes.
enum class Form { kUtf8, kUtf16, kUtf32, kLatin1, kAscii };

/// How the bytes of a unit follow each other; units of one byte have no order.
enum class ByteOrder { kNone, kLittle, kBig, kByMark };

struct Encoding {
  const char* name;
  const char* aliases; ///< separated by blanks
  Form form;
  ByteOrder order;

  bool IsByMark() const { return order == ByteOrder::kByMark; }
  /// Whether it has every code point; the others have those below Limit() only.
  bool IsUnicode() const { return form != Form::kLatin1 && form != Form::kAscii; }
  char16 Limit() const { return form == Form::kAscii ? 0x80 : 0x100; }
};

constexpr char16 kByteOrderMark = 0xFEFF;
/// The encoding that is meant where none is given.
extern const Encoding& kDefaultEncoding;

/// The encoding of that name, or null. Case, dashes, underscores and "//" at its end don't count.
const Encoding* FindEncoding(std::string_view name);
/// The names that take the fewest edits to become the given one, in words: "utf-16le or utf-16be". Empty
/// where even these are no likely slips.
std::string NearestNames(std::string_view name);
/// All names, the aliases behind the one that they stand for, a line for each encoding.
std::string ListEncodings();

} // namespace transcode
