#include <utils/xstring.h>

#include <iterator>

#include <boost/locale/utf.hpp>

#include <utils/xostream.h>

namespace mirel {

template class xvector<char8>;
template class basic_xstring<char8>;
template class xvector<char16>;
template class basic_xstring<char16>;

void HackToForcexstringIntoUtilsDll() {
  string8 s1;
  string16 s2;
}

xostream& operator<<(xostream& os, const string8& v) {
  os.write(v.data(), v.size());
  return os;
}

void Utf16FromAscii(string16& dst, const char8* src, ssize_t srcLen) {
  dst.resize(srcLen, 0);
  char16* pdst = dst.data();
  for (const char8* const pend = src + srcLen; src != pend; ++src) {
    const unsigned char byte = static_cast<unsigned char>(*src);
    *pdst++ = byte < 0x80 ? byte : '?';
  }
}

template <class CharOut, class CharIn>
bool UtfToUtf(basic_xstring<CharOut>& result, const CharIn* src, ssize_t srcLen) {
  namespace utf = boost::locale::utf;
  MIREL_ASSERT(srcLen >= 0);
  const CharIn* begin = src;
  const CharIn* const end = src + srcLen;
  result.clear();
  result.reserve(end - begin);
  auto inserter = std::back_inserter(result);
  while (begin != end) {
    const utf::code_point c = utf::utf_traits<CharIn>::decode(begin, end);
    if (c == utf::illegal || c == utf::incomplete)
      return false;
    inserter = utf::utf_traits<CharOut>::encode(c, inserter);
  }
  return true;
}

template bool UtfToUtf<char16, char8>(string16& result, const char8* src, ssize_t srcLen);
template bool UtfToUtf<char8, char16>(string8& result, const char16* src, ssize_t srcLen);

bool Utf16FromUtf8(string16& dst, const char8* src, ssize_t srcLen) {
  return UtfToUtf<char16, char8>(dst, src, srcLen);
}

bool Utf16FromUtf8(string16& dst, const char8* src) {
  MIREL_ASSERT(src);
  return UtfToUtf<char16, char8>(dst, src, GetStringLength(src));
}

bool Utf8FromUtf16(string8& dst, const char16* src, ssize_t srcLen) {
  return UtfToUtf<char8, char16>(dst, src, srcLen);
}

bool Utf8FromUtf16(string8& dst, const char16* src) {
  MIREL_ASSERT(src);
  return UtfToUtf<char8, char16>(dst, src, GetStringLength(src));
}

} // namespace mirel
