// Conversions between UTF-8 and UTF-16. Each contender converts into the type in which its users hold text,
// and reuses storage if it can, except in the cases with a fresh string.
#include "Library.h"
#include "Simdutf.h"
#include "Texts.h"

#include <algorithm>

#include <boost/locale/encoding_utf.hpp>
#include <iconv.h>
#include <unicode/ustring.h>
#include <utf8.h>

#ifdef HAVE_QT
#include <QString>
#include <QStringDecoder>
#endif

namespace {

constexpr std::size_t kMaxUnits = std::size_t(4) << 20;

/// A buffer that is large enough for every conversion, for the contenders that write into raw buffers.
char* Buffer8() {
  static auto& buffer = *new std::vector<char>(3 * kMaxUnits + 64);
  return buffer.data();
}
char16_t* Buffer16() {
  static auto& buffer = *new std::vector<char16_t>(kMaxUnits + 64);
  return buffer.data();
}

/// A conversion by the C library.
class Iconv {
public:
  Iconv(const char* to, const char* from) : m_handle(iconv_open(to, from)) {}
  /// Moves out past the end of the result. @return whether the text is well-formed
  template <class In> bool operator()(const In* text, std::size_t size, char*& out) const {
    char* in = reinterpret_cast<char*>(const_cast<In*>(text));
    std::size_t inLeft = size * sizeof(In), outLeft = 3 * kMaxUnits;
    return iconv(m_handle, &in, &inLeft, &out, &outLeft) != std::size_t(-1);
  }

private:
  iconv_t m_handle;
};

const Iconv& IconvTo16() {
  static const Iconv iconv("UTF-16LE", "UTF-8");
  return iconv;
}

bool IcuTo16(const char* text, std::size_t size, int32_t& length) {
  UErrorCode error = U_ZERO_ERROR;
  u_strFromUTF8(reinterpret_cast<UChar*>(Buffer16()), kMaxUnits, &length, text, int32_t(size), &error);
  return U_SUCCESS(error);
}

void RegisterToUtf16(const Language& language, std::size_t size) {
  // The cases live as long as the program, and so do their texts.
  const auto& texts = *new std::vector<std::string>(TextsIn<char>(language, size));
  Case to("Conversions", "UTF-8 to UTF-16", language.name, size, "bytes");
  AddLibrary(to, size <= 64, [&](const Library& library) { return library.toUtf16(texts, false); });
#ifdef HAVE_SIMDUTF
  for (const SimdutfContender& contender : Simdutf())
    to.Against(contender.first, Over(texts, [kernels = contender.second](const std::string& text) {
                 return kernels->convert_utf8_to_utf16le(text.data(), text.size(), Buffer16());
               }));
#endif
  to.Against("Boost", Over(texts, [](const std::string& text) {
               return boost::locale::conv::utf_to_utf<char16_t>(text).size();
             }));
  to.Against("ICU", Over(texts, [](const std::string& text) {
               int32_t length = 0;
               IcuTo16(text.data(), text.size(), length);
               return length;
             }));
  static auto& reused = *new std::u16string;
  to.Against("utfcpp", Over(texts, [](const std::string& text) {
               reused.clear();
               utf8::utf8to16(text.begin(), text.end(), std::back_inserter(reused));
               return reused.size();
             }));
  to.Against("iconv", Over(texts, [](const std::string& text) {
               char* const begin = reinterpret_cast<char*>(Buffer16());
               char* end = begin;
               IconvTo16()(text.data(), text.size(), end);
               return (end - begin) / 2;
             }));
#ifdef HAVE_QT
  to.Against("Qt", Over(texts, [](const std::string& text) {
               return QString::fromUtf8(text.data(), qsizetype(text.size())).size();
             }));
#endif
}

void RegisterToUtf8(const Language& language, std::size_t size) {
  const auto& texts = *new std::vector<std::u16string>(TextsIn<char16_t>(language, size));
  Case to("Conversions", "UTF-16 to UTF-8", language.name, size, "16-bit units");
  AddLibrary(to, size <= 64, [&](const Library& library) { return library.toUtf8(texts, false); });
#ifdef HAVE_SIMDUTF
  for (const SimdutfContender& contender : Simdutf())
    to.Against(contender.first, Over(texts, [kernels = contender.second](const std::u16string& text) {
                 return kernels->convert_utf16le_to_utf8(text.data(), text.size(), Buffer8());
               }));
#endif
  to.Against("Boost", Over(texts, [](const std::u16string& text) {
               return boost::locale::conv::utf_to_utf<char>(text).size();
             }));
  to.Against("ICU", Over(texts, [](const std::u16string& text) {
               int32_t length = 0;
               UErrorCode error = U_ZERO_ERROR;
               u_strToUTF8(Buffer8(), 3 * kMaxUnits, &length, text.data(), int32_t(text.size()), &error);
               return length;
             }));
  static auto& reused = *new std::string;
  to.Against("utfcpp", Over(texts, [](const std::u16string& text) {
               reused.clear();
               utf8::utf16to8(text.begin(), text.end(), std::back_inserter(reused));
               return reused.size();
             }));
  static const Iconv iconvTo8("UTF-8", "UTF-16LE");
  to.Against("iconv", Over(texts, [](const std::u16string& text) {
               char* end = Buffer8();
               iconvTo8(text.data(), text.size(), end);
               return end - Buffer8();
             }));
#ifdef HAVE_QT
  to.Against("Qt", Over(texts, [](const std::u16string& text) {
               return QStringView(text.data(), qsizetype(text.size())).toUtf8().size();
             }));
#endif
}

/// Registers conversions whose result is a new, null-terminated string each time.
void RegisterFresh(const Language& language, std::size_t size) {
  const auto& utf8 = *new std::vector<std::string>(TextsIn<char>(language, size));
  const auto& utf16 = *new std::vector<std::u16string>(TextsIn<char16_t>(language, size));
  Case to("Conversions into a fresh string", "UTF-8 to UTF-16, fresh", language.name, size, "bytes");
  Case from("Conversions into a fresh string", "UTF-16 to UTF-8, fresh", language.name, size, "16-bit units");
  AddLibrary(to, size <= 64, [&](const Library& library) { return library.toUtf16(utf8, true); });
  AddLibrary(from, size <= 64, [&](const Library& library) { return library.toUtf8(utf16, true); });
#ifdef HAVE_SIMDUTF
  for (const SimdutfContender& contender : Simdutf()) {
    to.Against(contender.first, Over(utf8, [kernels = contender.second](const std::string& text) {
                 std::u16string result(kernels->utf16_length_from_utf8(text.data(), text.size()), u'\0');
                 benchmark::DoNotOptimize(result.c_str());
                 return kernels->convert_utf8_to_utf16le(text.data(), text.size(), result.data());
               }));
    from.Against(contender.first, Over(utf16, [kernels = contender.second](const std::u16string& text) {
                   std::string result(kernels->utf8_length_from_utf16le(text.data(), text.size()), '\0');
                   benchmark::DoNotOptimize(result.c_str());
                   return kernels->convert_utf16le_to_utf8(text.data(), text.size(), result.data());
                 }));
  }
#endif
  to.Against("Boost", Over(utf8, [](const std::string& text) {
               return boost::locale::conv::utf_to_utf<char16_t>(text).size();
             }));
  from.Against("Boost", Over(utf16, [](const std::u16string& text) {
                 return boost::locale::conv::utf_to_utf<char>(text).size();
               }));
}

/// Registers conversions of text with an FF, which never occurs in UTF-8, about every `every` bytes. Each
/// contender is called again after every FF, so that it reports all of them.
void RegisterMalformed(const Language& language, const char* data, std::size_t every) {
  auto& malformed = *new Malformed{TextsIn<char>(language, std::size_t(1) << 16)[0], {0}};
  std::string& text = malformed.text;
  for (std::size_t at = every; at < text.size(); at = malformed.starts.back() + every) {
    at = BoundaryNear(text, at);
    text.insert(at, 1, '\xFF');
    malformed.starts.push_back(at + 1);
  }
  malformed.starts.pop_back(); // the text past the last one is well-formed
  Case reports("Malformed text", data, language.name, std::size_t(1) << 16, "bytes");
  AddLibrary(reports, false, [&](const Library& library) { return library.reportMalformed(malformed); });
#ifdef HAVE_SIMDUTF
  for (const SimdutfContender& contender : Simdutf())
    reports.Against(contender.first,
                    Reporting(malformed, [kernels = contender.second](const char* from, std::size_t n) {
                      const auto result = kernels->convert_utf8_to_utf16le_with_errors(from, n, Buffer16());
                      return result.error != simdutf::SUCCESS;
                    }));
#endif
  reports.Against("ICU", Reporting(malformed, [](const char* from, std::size_t n) {
                    int32_t length = 0;
                    return !IcuTo16(from, n, length);
                  }));
  reports.Against("iconv", Reporting(malformed, [](const char* from, std::size_t n) {
                    char* end = reinterpret_cast<char*>(Buffer16());
                    return !IconvTo16()(from, n, end);
                  }));
  reports.Against("Boost", Reporting(malformed, [](const char* from, std::size_t n) {
                    try {
                      const auto stop = boost::locale::conv::stop;
                      benchmark::DoNotOptimize(
                          boost::locale::conv::utf_to_utf<char16_t>(from, from + n, stop));
                      return false;
                    } catch (const boost::locale::conv::conversion_error&) {
                      return true;
                    }
                  }));
  static auto& reused = *new std::u16string;
  reports.Against("utfcpp", Reporting(malformed, [](const char* from, std::size_t n) {
                    try {
                      reused.clear();
                      utf8::utf8to16(from, from + n, std::back_inserter(reused));
                      return false;
                    } catch (const utf8::exception&) {
                      return true;
                    }
                  }));
#ifdef HAVE_QT
  if (malformed.starts.size() == 1) // it always goes on to the end of the text
    reports.Against("Qt", Reporting(malformed, [](const char* from, std::size_t n) {
                      QStringDecoder decode(QStringDecoder::Utf8);
                      const QString result = decode(QByteArrayView(from, qsizetype(n)));
                      benchmark::DoNotOptimize(result.size());
                      return decode.hasError();
                    }));
#endif
}

void RegisterWidening(std::size_t size) {
  const auto& ascii = *new std::string(TextIn(Languages()[0], size).substr(0, size));
  auto& ours = *new mirel::string16;
  auto& theirs = *new std::u16string;
  Case("Conversions", "Utf16FromAscii", "ASCII", size, "bytes")
      .Ours([&] {
        mirel::Utf16FromAscii(ours, ascii.data(), static_cast<ssize_t>(ascii.size()));
        return ours.size();
      })
      .Against("a widening loop", [&] {
        theirs.resize(ascii.size());
        for (std::size_t i = 0; i < ascii.size(); ++i)
          theirs[i] = static_cast<unsigned char>(ascii[i]) < 0x80 ? char16_t(ascii[i]) : u'?';
        return theirs.size();
      });
}

} // namespace

void RegisterConversions() {
  const auto isOneOfSix = [](const Language& language) {
    const std::string names[] = {"ASCII", "German", "Russian", "Chinese", "Thai", "emoji"};
    return std::find(std::begin(names), std::end(names), language.name) != std::end(names);
  };
  for (const std::size_t size :
       {std::size_t(14), std::size_t(64), std::size_t(1000), std::size_t(1) << 16, kMaxUnits}) {
    RegisterWidening(size);
    for (const Language& language : Languages()) {
      RegisterToUtf16(language, size);
      RegisterToUtf8(language, size);
      if (isOneOfSix(language))
        RegisterFresh(language, size);
    }
  }
  for (const Language& language : Languages())
    if (isOneOfSix(language)) {
      RegisterMalformed(language, "a bad byte in the middle", 33000);
      RegisterMalformed(language, "a bad byte every 100 bytes", 100);
    }
}
