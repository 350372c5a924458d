// The conversions between UTF-8, UTF-16 and ASCII.
//
// Most of a text is plainly well-formed, and is converted here: ASCII by words and blocks, other letters by
// runs of those that take the same number of bytes, some at a time. What isn't is left to the traits of
// Boost, one code point at a time.

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

/// A step of a conversion begins before a pointer that is called stop here, and may read so many units from
/// its own beginning on. It may end past stop, but never past the end of the text.
constexpr ssize_t kLookahead = 4;
static_assert(kWord<char16> >= kLookahead); // or ConvertRun() could take a step where none may begin

/// The bits that no unit of ASCII has, in a word.
template <class T> constexpr uint64_t kNotAscii = InEach<T>(sizeof(T) == 1 ? 0x80 : 0xFF80);

/// How far a conversion got.
template <class CharOut, class CharIn> struct Progress {
  const CharIn* p;
  CharOut* out;
};

// Below, a block or word that has something other than ASCII in it is written whole, but out goes behind its
// ASCII only.

/// Converts ASCII from p on, up to something else or until less than a block is left. It isn't inlined:
/// where it was, one compiler didn't see that out and p are apart, and took the blocks apart into units.
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
constexpr char8 Tail(unsigned bits) { return static_cast<char8>(0x80 | (bits & kTailBits)); }

constexpr bool IsSurrogate(unsigned unit) { return (unit & 0xF800) == 0xD800; }

// The code points that take two, three and four bytes in UTF-8, called letters whatever they are, to be
// converted to units of CharOut:
//
// - kIn, kOut: how many units one takes in the input and in the output,
// - Convert(): converts the one at p; false if none that is well-formed stands there.
//
// Those of two and three bytes stand in runs, and have in addition
//
// - IsAtMost(): whether no letter that begins with the unit, which isn't ASCII, takes more bytes,
// - MayBegin(): whether one of this kind may begin with the unit,
// - ConvertSome(): Convert() for kSome of them at once, where a word can be read.

template <class CharOut> struct TwoBytes;
template <class CharOut> struct ThreeBytes;
template <class CharOut> struct FourBytes;

template <> struct TwoBytes<char16> {
  static constexpr ssize_t kIn = 2, kOut = 1, kSome = 4;

  static constexpr bool IsAtMost(unsigned unit) { return unit < 0xE0; }
  static constexpr bool MayBegin(unsigned unit) { return unit >= 0xC2 && unit < 0xE0; }

  static bool Convert(const char8* p, char16* out) {
    const unsigned b = TailBits(p[1]), unit = (unsigned(Unit(p[0])) - 0xC0) << 6 | b;
    if (b > kTailBits || unit < 0x80 || unit > 0x7FF)
      return false;
    *out = static_cast<char16>(unit);
    return true;
  }

  static bool ConvertSome(const char8* p, char16* out) {
    const uint64_t bits = LoadWord(p) ^ InEach<char16>(0x80C0);
    // The leads C0 and C1 would be overlong. They make the difference borrow, which leaves high bits in it.
    if (((bits | (bits - InEach<char16>(2))) & InEach<char16>(0xC0E0)) != 0)
      return false;
    StoreWord<4>((bits << 6 & InEach<char16>(0x07C0)) | (bits >> 8 & InEach<char16>(kTailBits)), out);
    return true;
  }
};

template <> struct TwoBytes<char8> {
  static constexpr ssize_t kIn = 1, kOut = 2, kSome = 4;

  static constexpr bool IsAtMost(unsigned unit) { return unit < 0x800; }
  static constexpr bool MayBegin(unsigned unit) { return unit >= 0x80 && unit < 0x800; }

  static bool Convert(const char16* p, char8* out) {
    if (!MayBegin(p[0]))
      return false;
    out[0] = static_cast<char8>(0xC0 | p[0] >> 6);
    out[1] = Tail(p[0]);
    return true;
  }

  static bool ConvertSome(const char16* p, char8* out) {
    const uint64_t word = LoadWord(p), tails = word & InEach<char16>(kTailBits), leads = (word ^ tails) >> 6;
    // Leads below 2 make the difference borrow, which leaves high bits in it.
    if (((leads | (leads - InEach<char16>(2))) & InEach<char16>(0xFFE0)) != 0)
      return false;
    StoreWord<8>(InEach<char16>(0x80C0) | leads | tails << 8, out);
    return true;
  }
};

/// The bits in the place of each of two letters of three bytes.
constexpr uint64_t InTwo(uint64_t bits) { return bits | bits << 24; }

template <> struct ThreeBytes<char16> {
  static constexpr ssize_t kIn = 3, kOut = 1, kSome = 2;

  static constexpr bool IsAtMost(unsigned unit) { return unit < 0xF0; }
  static constexpr bool MayBegin(unsigned unit) { return unit >= 0xE0 && unit < 0xF0; }

  static bool Convert(const char8* p, char16* out) {
    const unsigned a = Unit(p[0]) ^ 0xE0u, b = TailBits(p[1]), c = TailBits(p[2]),
                   unit = a << 12 | b << 6 | c;
    if (a > 0xF || (b | c) > kTailBits || unit < 0x800 || IsSurrogate(unit))
      return false;
    *out = static_cast<char16>(unit);
    return true;
  }

  static bool ConvertSome(const char8* p, char16* out) {
    const uint64_t word = LoadWord(p);
    const uint64_t units =
        (word << 12 & InTwo(0xF000)) | (word >> 2 & InTwo(0x0FC0)) | (word >> 16 & InTwo(kTailBits));
    // Where the highest bits are 0 the sequence is overlong, where they are 0x1B it stands for a surrogate.
    // For all others both sums have the next bit.
    const uint64_t high = units >> 11 & InTwo(0x1F);
    const uint64_t sums = (high + InTwo(0x1F)) & ((high ^ InTwo(0x1B)) + InTwo(0x1F));
    if ((word & InTwo(0xC0C0F0)) != InTwo(0x8080E0) || (sums & InTwo(0x20)) != InTwo(0x20))
      return false;
    out[0] = static_cast<char16>(units);
    out[1] = static_cast<char16>(units >> 24);
    return true;
  }
};

template <> struct ThreeBytes<char8> {
  static constexpr ssize_t kIn = 1, kOut = 3, kSome = 2;

  static constexpr bool IsAtMost(unsigned unit) { return !IsSurrogate(unit); }
  static constexpr bool MayBegin(unsigned unit) { return unit >= 0x800 && !IsSurrogate(unit); }

  static bool Convert(const char16* p, char8* out) {
    if (!MayBegin(p[0]))
      return false;
    out[0] = static_cast<char8>(0xE0 | p[0] >> 12);
    out[1] = Tail(p[0] >> 6);
    out[2] = Tail(p[0]);
    return true;
  }

  static bool ConvertSome(const char16* p, char8* out) {
    // One branch: two made Japanese a tenth slower.
    if ((int(MayBegin(p[0])) & int(MayBegin(p[1]))) == 0)
      return false;
    const uint64_t both = p[0] | uint64_t(p[1]) << 24;
    // Eight bytes are written at once, of which six count.
    StoreWord<8>(InTwo(0x8080E0) | (both >> 12 & InTwo(0x0F)) | (both << 2 & InTwo(0x3F00)) |
                     (both << 16 & InTwo(0x3F0000)),
                 out);
    return true;
  }
};

template <> struct FourBytes<char16> {
  static constexpr ssize_t kIn = 4, kOut = 2;

  static bool Convert(const char8* p, char16* out) {
    const unsigned a = Unit(p[0]) ^ 0xF0u, b = TailBits(p[1]), c = TailBits(p[2]), d = TailBits(p[3]);
    const unsigned codePoint = a << 18 | b << 12 | c << 6 | d;
    if ((b | c | d) > kTailBits || codePoint < 0x10000 || codePoint > 0x10FFFF)
      return false;
    out[0] = static_cast<char16>(0xD7C0 + (codePoint >> 10));
    out[1] = static_cast<char16>(0xDC00 + (codePoint & 0x3FF));
    return true;
  }
};

template <> struct FourBytes<char8> {
  static constexpr ssize_t kIn = 2, kOut = 4;

  static bool Convert(const char16* p, char8* out) {
    const unsigned a = p[0] ^ 0xD800u, b = p[1] ^ 0xDC00u;
    if ((a | b) > 0x3FF)
      return false;
    const unsigned codePoint = 0x10000 + (a << 10 | b);
    out[0] = static_cast<char8>(0xF0 | codePoint >> 18);
    out[1] = Tail(codePoint >> 12);
    out[2] = Tail(codePoint >> 6);
    out[3] = Tail(codePoint);
    return true;
  }
};

/// Converts letters of one kind from p on, and single units of ASCII between them, which mostly are spaces.
template <class Letters, class CharOut, class CharIn>
[[gnu::noinline]] Progress<CharOut, CharIn> ConvertRun(const CharIn* p, const CharIn* stop, CharOut* out) {
  for (;;) {
    // A word may reach past stop, as any step, but not further than kLookahead - 1 units.
    for (; stop - p > kWord<CharIn> - kLookahead;
         p += Letters::kSome * Letters::kIn, out += Letters::kSome * Letters::kOut)
      if (!Letters::ConvertSome(p, out))
        break;
    for (; p < stop && Letters::Convert(p, out); p += Letters::kIn, out += Letters::kOut) {
    }
    if (p >= stop || Unit(p[0]) >= 0x80 || !Letters::MayBegin(Unit(p[1])))
      return {p, out};
    *out++ = static_cast<CharOut>(*p++);
  }
}

/// Converts the letter at p, if it is well-formed, and what follows if that is one of the same kind: many
/// stand alone.
template <class Letters, class CharOut, class CharIn>
Progress<CharOut, CharIn> ConvertLetters(const CharIn* p, const CharIn* stop, CharOut* out) {
  if (!Letters::Convert(p, out))
    return {p, out};
  p += Letters::kIn, out += Letters::kOut;
  if (p >= stop || !Letters::MayBegin(Unit(*p)))
    return {p, out};
  return ConvertRun<Letters>(p, stop, out);
}

/// Converts what is plainly well-formed, until something else comes or stop is reached. It isn't inlined:
/// that leaves its variables in registers, which in the caller have addresses that are taken.
template <class CharOut, class CharIn>
[[gnu::noinline]] Progress<CharOut, CharIn> ConvertPlain(const CharIn* p, const CharIn* stop, CharOut* out) {
  while (p < stop) {
    if (Unit(*p) < 0x80) {
      const auto ascii = ConvertAscii(p, stop, out);
      p = ascii.p, out = ascii.out;
      if (p == stop)
        break;
    }
    if (const unsigned unit = Unit(*p); TwoBytes<CharOut>::IsAtMost(unit)) {
      const auto letters = ConvertLetters<TwoBytes<CharOut>>(p, stop, out);
      if (letters.p == p)
        break;
      p = letters.p, out = letters.out;
    } else if (ThreeBytes<CharOut>::IsAtMost(unit)) {
      const auto letters = ConvertLetters<ThreeBytes<CharOut>>(p, stop, out);
      if (letters.p == p)
        break;
      p = letters.p, out = letters.out;
    } else {
      if (!FourBytes<CharOut>::Convert(p, out))
        break;
      p += FourBytes<CharOut>::kIn, out += FourBytes<CharOut>::kOut;
    }
  }
  return {p, out};
}

/// The code point at p, which is moved past it, or what Boost has for malformed and for cut off ones.
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
    // A step may end past chunkEnd, and a store be wider than what counts of it.
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
