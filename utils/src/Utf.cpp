// The conversions between UTF-8, UTF-16 and ASCII.
//
// Most of a text is plainly well-formed, and is converted here: ASCII by words and blocks, other letters by
// runs of those that take the same number of bytes. What isn't is left to the traits of Boost, one code point
// at a time.

#include <utils/xstring.h>

#include <algorithm>
#include <type_traits>

#include <boost/locale/utf.hpp>

#include "Words.h"

namespace mirel {

void Utf16FromAscii(string16& dst, const char8* src, ssize_t srcLen) {
  dst.resize(srcLen, 0);
  char16* const pdst = dst.data();
  for (ssize_t i = 0; i < srcLen; ++i) {
    const unsigned char byte = static_cast<unsigned char>(src[i]);
    pdst[i] = byte < 0x80 ? byte : '?';
  }
}

namespace {

namespace utf = boost::locale::utf;

/// So many units of input are converted on the stack before the result is appended in one go: an append of
/// its own for each would ask for room and keep the size in memory every time.
constexpr ssize_t kChunk = 1024;
/// The most units of output for one of input: three bytes for a unit of UTF-16, one unit for a byte.
template <class CharOut> constexpr ssize_t kExpansion = sizeof(CharOut) == 1 ? 3 : 1;

/// Units of ASCII that are converted at once: more than compilers unroll, so that they use wide instructions.
constexpr ssize_t kBlock = 32;

/// A step of a conversion begins before a pointer that is called stop here, and can read so many units from
/// its own beginning on. It may end behind stop, but ends within the text.
constexpr ssize_t kLookahead = 4;
static_assert(kWord<char16> <= kLookahead);

/// The bits that no unit of ASCII has, in a word.
template <class T> constexpr uint64_t kNotAscii = InEach<T>(sizeof(T) == 1 ? 0x80 : 0xFF80);

/// How far a conversion got.
template <class CharOut, class CharIn> struct Progress {
  const CharIn* p;
  CharOut* out;
};

// Below, a block or word that has something other than ASCII in it is written whole, but out goes behind its
// ASCII only.

/// Converts ASCII from p on, up to something else or until less than a block is left. It isn't inlined: there
/// one compiler forgets that out isn't where p is, and takes the blocks apart into single units.
template <class CharOut, class CharIn>
[[gnu::noinline]] Progress<CharOut, CharIn> ConvertBlocks(const CharIn* __restrict p, const CharIn* stop,
                                                          CharOut* __restrict out) {
  for (; stop - p >= kBlock; p += kBlock, out += kBlock) {
    for (ssize_t k = 0; k < kBlock; ++k)
      out[k] = static_cast<CharOut>(Unit(p[k]));
    for (ssize_t k = 0; k < kBlock; k += kWord<CharIn>)
      if (const uint64_t others = LoadWord(p + k) & kNotAscii<CharIn>; others != 0) {
        const ssize_t n = k + UnitsBeforeFirst<CharIn>(others);
        return {p + n, out + n};
      }
  }
  return {p, out};
}

/// Converts a word as if all of it were ASCII.
void ConvertWord(uint64_t word, char16* out) {
  for (ssize_t half = 0; half < 2; ++half) {
    uint64_t units = word >> 32 * half & 0xFFFFFFFF;
    units = (units | units << 16) & 0x0000FFFF0000FFFF;
    units = (units | units << 8) & InEach<char16>(0xFF);
    StoreWord<4>(units, out + 4 * half);
  }
}
void ConvertWord(uint64_t word, char8* out) {
  word = (word | word >> 8) & 0x0000FFFF0000FFFF;
  StoreWord<4>(word | word >> 16, out);
}

/// Converts ASCII from p on, where some stands, up to stop or something else: one or two units, since most
/// runs between other letters are a space, or a comma and a space, then blocks, and words where no block is
/// left.
template <class CharOut, class CharIn>
Progress<CharOut, CharIn> ConvertAscii(const CharIn* p, const CharIn* stop, CharOut* out) {
  for (int k = 0; k < 2; ++k) {
    *out++ = static_cast<CharOut>(*p++);
    if (p == stop || Unit(*p) >= 0x80)
      return {p, out};
  }
  if (stop - p >= kBlock) {
    const auto blocks = ConvertBlocks(p, stop, out);
    p = blocks.p, out = blocks.out;
    if (p != stop && Unit(*p) >= 0x80)
      return {p, out};
  }
  while (stop - p >= kWord<CharIn>) {
    const uint64_t word = LoadWord(p), others = word & kNotAscii<CharIn>;
    ConvertWord(word, out);
    if (others != 0) {
      const ssize_t n = UnitsBeforeFirst<CharIn>(others);
      return {p + n, out + n};
    }
    p += kWord<CharIn>, out += kWord<CharIn>;
  }
  for (; p != stop && Unit(*p) < 0x80; ++p)
    *out++ = static_cast<CharOut>(*p);
  return {p, out};
}

/// The bits that the UTF-8 unit adds to a code point, or more than kTailBits if it can't follow another one.
inline unsigned TailBits(char8 unit) { return Unit(unit) ^ 0x80u; }
constexpr unsigned kTailBits = 0x3F;

constexpr bool IsSurrogate(unsigned unit) { return (unit & 0xF800) == 0xD800; }

/// The code unit that two bytes stand for, or 0 if they aren't well-formed.
unsigned DecodePair(const char8* p) {
  const unsigned b = TailBits(p[1]), unit = (unsigned(Unit(p[0])) - 0xC0) << 6 | b;
  return b > kTailBits || unit < 0x80 || unit > 0x7FF ? 0 : unit;
}

/// Whether a word of bytes is four well-formed pairs.
bool ArePairs(uint64_t word) {
  // The leads C0 and C1 would be overlong. For all others the sum has the highest bit.
  const uint64_t sums = (word & InEach<char16>(0x1F)) + InEach<char16>(0x7FFE);
  return (word & InEach<char16>(0xC0E0)) == InEach<char16>(0x80C0) &&
         (sums & InEach<char16>(0x8000)) == InEach<char16>(0x8000);
}

/// Converts sequences of two bytes from p on, where one may begin: most stand in runs.
Progress<char16, char8> ConvertPairs(const char8* p, const char8* stop, char16* out) {
  const auto convertOne = [&] {
    const unsigned unit = DecodePair(p);
    if (unit == 0)
      return false;
    *out++ = static_cast<char16>(unit);
    p += 2;
    return p < stop && Unit(*p) >= 0xC0 && Unit(*p) < 0xE0; // sooner known than from the next pair
  };
  if (!convertOne())
    return {p, out};
  for (; stop - p >= kWord<char8>; p += kWord<char8>, out += kWord<char16>) {
    const uint64_t word = LoadWord(p);
    if (!ArePairs(word))
      break;
    StoreWord<4>((word & InEach<char16>(0x1F)) << 6 | (word >> 8 & InEach<char16>(kTailBits)), out);
  }
  while (p < stop && convertOne()) {
  }
  return {p, out};
}

/// Converts sequences of three bytes whose lead leaves nothing else to check, which are nearly all.
Progress<char16, char8> ConvertTriples(const char8* p, const char8* stop, char16* out) {
  for (; p < stop; p += 3) {
    const unsigned a = Unit(p[0]), b = TailBits(p[1]), c = TailBits(p[2]);
    if (a < 0xE1 || a == 0xED || a > 0xEF || (b | c) > kTailBits)
      break;
    *out++ = static_cast<char16>((a & 0x0F) << 12 | b << 6 | c);
  }
  return {p, out};
}

// ConvertPlain, for either direction, converts what is plainly well-formed, until something else comes or
// stop is reached. It isn't inlined: that leaves its variables in registers, which in the caller have
// addresses that are taken.

[[gnu::noinline]] Progress<char16, char8> ConvertPlain(const char8* p, const char8* stop, char16* out) {
  while (p < stop) {
    unsigned a = Unit(p[0]);
    if (a < 0x80) {
      const auto ascii = ConvertAscii(p, stop, out);
      p = ascii.p, out = ascii.out;
      if (p == stop)
        break;
      a = Unit(p[0]); // not ASCII
    }
    if (a < 0xE0) {
      const auto pairs = ConvertPairs(p, stop, out);
      if (pairs.p == p)
        break;
      p = pairs.p, out = pairs.out;
    } else if (a < 0xF0) {
      const auto triples = ConvertTriples(p, stop, out);
      if (triples.p == p) {
        const unsigned b = TailBits(p[1]), c = TailBits(p[2]), unit = (a & 0x0F) << 12 | b << 6 | c;
        if ((b | c) > kTailBits || unit < 0x800 || IsSurrogate(unit))
          break;
        *out++ = static_cast<char16>(unit);
        p += 3;
      } else {
        p = triples.p, out = triples.out;
      }
    } else {
      const unsigned b = TailBits(p[1]), c = TailBits(p[2]), d = TailBits(p[3]);
      const unsigned codePoint = (a & 0x0F) << 18 | b << 12 | c << 6 | d;
      if ((b | c | d) > kTailBits || codePoint < 0x10000 || codePoint > 0x10FFFF)
        break;
      *out++ = static_cast<char16>(0xD7C0 + (codePoint >> 10));
      *out++ = static_cast<char16>(0xDC00 + (codePoint & 0x3FF));
      p += 4;
    }
  }
  return {p, out};
}

char8 Tail(unsigned bits) { return static_cast<char8>(0x80 | (bits & kTailBits)); }

constexpr bool IsPair(unsigned unit) { return unit >= 0x80 && unit < 0x800; }
constexpr bool IsTriple(unsigned unit) { return unit >= 0x800 && !IsSurrogate(unit); }

char8* EncodePair(unsigned unit, char8* out) {
  out[0] = static_cast<char8>(0xC0 | unit >> 6);
  out[1] = Tail(unit);
  return out + 2;
}

/// Converts units that take two bytes from p on, where one stands.
Progress<char8, char16> ConvertPairs(const char16* p, const char16* stop, char8* out) {
  out = EncodePair(*p++, out);
  if (p >= stop || !IsPair(*p))
    return {p, out};
  for (; p < stop; p += 4, out += 8) {
    const uint64_t word = LoadWord(p);
    // A unit below 0x80 makes the difference borrow from the next one, but has high bits in it itself.
    if (((word | (word - InEach<char16>(0x80))) & InEach<char16>(0xF800)) != 0)
      break;
    StoreWord<8>(InEach<char16>(0x80C0) | (word >> 6 & InEach<char16>(0x1F)) |
                     (word & InEach<char16>(kTailBits)) << 8,
                 out);
  }
  for (; p < stop && IsPair(*p); ++p)
    out = EncodePair(*p, out);
  return {p, out};
}

/// Converts units that take three bytes from p on, where one stands, in steps of two, which one branch
/// decides: two made Japanese a tenth slower.
Progress<char8, char16> ConvertTriples(const char16* p, const char16* stop, char8* out) {
  out[0] = static_cast<char8>(0xE0 | *p >> 12);
  out[1] = Tail(*p >> 6);
  out[2] = Tail(*p);
  out += 3;
  for (++p; p < stop && (int(IsTriple(p[0])) & int(IsTriple(p[1]))) != 0; p += 2, out += 6) {
    const uint64_t both = p[0] | uint64_t(p[1]) << 24;
    // Eight bytes are written at once, of which six count.
    StoreWord<8>(0x8080E08080E0 | (both >> 12 & 0x00000F00000F) | (both << 2 & 0x003F00003F00) |
                     (both << 16 & 0x3F00003F0000),
                 out);
  }
  return {p, out};
}

[[gnu::noinline]] Progress<char8, char16> ConvertPlain(const char16* p, const char16* stop, char8* out) {
  while (p < stop) {
    unsigned a = p[0];
    if (a < 0x80) {
      const auto ascii = ConvertAscii(p, stop, out);
      p = ascii.p, out = ascii.out;
      if (p == stop)
        break;
      a = p[0]; // not ASCII
    }
    if (IsPair(a)) {
      const auto pairs = ConvertPairs(p, stop, out);
      p = pairs.p, out = pairs.out;
    } else if (IsTriple(a)) {
      const auto triples = ConvertTriples(p, stop, out);
      p = triples.p, out = triples.out;
    } else {
      const unsigned b = p[1];
      if (a >= 0xDC00 || (b & 0xFC00) != 0xDC00)
        break;
      const unsigned codePoint = 0x10000 + ((a & 0x3FF) << 10) + (b & 0x3FF);
      out[0] = static_cast<char8>(0xF0 | codePoint >> 18);
      out[1] = Tail(codePoint >> 12);
      out[2] = Tail(codePoint >> 6);
      out[3] = Tail(codePoint);
      out += 4;
      p += 2;
    }
  }
  return {p, out};
}

/// The code point at p, which goes behind it, or what Boost has for malformed and for cut off ones.
template <class CharIn> utf::code_point Decode(const CharIn*& p, const CharIn* end) {
  // As unsigned units: with char the traits convert negative values without saying so.
  using Unsigned = std::make_unsigned_t<CharIn>;
  const Unsigned* q = reinterpret_cast<const Unsigned*>(p);
  const utf::code_point c = utf::utf_traits<Unsigned>::decode(q, reinterpret_cast<const Unsigned*>(end));
  p = reinterpret_cast<const CharIn*>(q);
  return c;
}

} // namespace

template <class CharOut, class CharIn>
bool UtfToUtf(basic_xstring<CharOut>& result, const CharIn* src, ssize_t srcLen) {
  MIREL_ASSERT(srcLen >= 0);
  result.clear();
  result.reserve(srcLen);
  const CharIn* const end = src + srcLen;
  bool isWellFormed = true;
  for (const CharIn* p = src; p != end && isWellFormed;) {
    // A step may end behind chunkEnd, and a store be wider than what counts of it.
    CharOut chunk[kExpansion<CharOut> * (kChunk + kLookahead)];
    CharOut* out = chunk;
    const CharIn* const chunkEnd = end - p < kChunk ? end : p + kChunk;
    const CharIn* const stop = end - p < kLookahead ? p : std::min(chunkEnd, end - (kLookahead - 1));
    const auto plain = ConvertPlain(p, stop, out);
    p = plain.p, out = plain.out;
    // The traits are the judges of what that didn't take, and of the last few units.
    while (p < chunkEnd && isWellFormed) {
      const utf::code_point c = Decode(p, end);
      isWellFormed = c != utf::illegal && c != utf::incomplete;
      if (isWellFormed)
        out = utf::utf_traits<CharOut>::encode(c, out);
    }
    result.append(chunk, out - chunk);
  }
  return isWellFormed;
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
