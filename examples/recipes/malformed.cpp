// Text from outside, which may be malformed: find out where and why, replace what is malformed, and walk the
// code points.

#include <cstdio>
#include <string_view>

#include <utils/Utf.h>

using mirel::ssize_t;
using mirel::string16;
using mirel::string8;

int main() {
  const std::string_view input = "caf\xC3\xA9 \xC0\xAF \xF0\x9F\x98\x80\xE2\x82";

  // Say what is wrong.
  if (const ssize_t at = mirel::FindMalformed(input); at >= 0) {
    const mirel::MalformedText fault = mirel::ExplainMalformed(input, at);
    std::printf("%s at byte %jd\n", Describe(fault.reason), fault.offset);
  }

  // Convert, with U+FFFD in place of malformed text. The lengths could be asked for before.
  string16 wide;
  const ssize_t replaced = mirel::Utf16FromUtf8Lossy(wide, input);
  std::printf("%td replaced, %td units, %td code points\n", replaced, wide.size(),
              mirel::CountCodePoints(input));

  // Append one code point after the other to another string.
  string8 spaced;
  for (const char32_t c : mirel::CodePoints(wide)) {
    mirel::AppendCodePoint(spaced, c);
    if (c > 0x7F)
      spaced += '_';
  }
  std::printf("%s\n", spaced.c_str());

  // Convert in pieces, as they arrive from a socket, which may cut the text anywhere.
  mirel::Utf8Stream stream(mirel::OnMalformed::kReplace);
  string16 received;
  for (const char& byte : input)
    stream.Append(received, &byte, 1);
  stream.Finish(received);
  std::printf("%d, the first fault at byte %jd\n", received._Eq(wide), stream.malformed().offset);
}

/* Prints:
overlong sequence at byte 6
3 replaced, 11 units, 10 code points
café_ �_�_ 😀_�_
1, the first fault at byte 6
*/
