// Conversions between UTF-8 and UTF-16. Each party converts into what its users hold the result in; whoever
// can use storage again does.
#include "Cases.h"
#include "Texts.h"

#include <boost/locale/encoding_utf.hpp>
#include <iconv.h>
#include <unicode/ustring.h>
#include <utf8.h>

#ifdef HAVE_QT
#include <QString>
#endif

namespace {

/// A conversion by the C library, into a buffer that is large enough.
class Iconv {
public:
  Iconv(const char* to, const char* from) : m_handle(iconv_open(to, from)) {}
  template <class In> std::size_t operator()(const std::basic_string<In>& text, std::string& buffer) const {
    char* in = reinterpret_cast<char*>(const_cast<In*>(text.data()));
    std::size_t inLeft = text.size() * sizeof(In), outLeft = buffer.size();
    char* out = buffer.data();
    iconv(m_handle, &in, &inLeft, &out, &outLeft);
    return buffer.size() - outLeft;
  }

private:
  iconv_t m_handle;
};

void RegisterConversion(const Language& language, std::size_t size) {
  // The cases live as long as the program, and so do their texts and buffers.
  const auto& utf8 = *new std::string(TextIn(language, size));
  const auto& utf16 = *new std::u16string(boost::locale::conv::utf_to_utf<char16_t>(utf8));
  const auto size8 = static_cast<ssize_t>(utf8.size()), size16 = static_cast<ssize_t>(utf16.size());
  auto& buffer = *new std::string(4 * utf8.size(), '\0');
  auto& std16 = *new std::u16string;
  auto& std8 = *new std::string;
  auto& our16 = *new mirel::string16;
  auto& our8 = *new mirel::string8;
  const auto label = static_cast<ssize_t>(size);

  static const Iconv to16("UTF-16LE", "UTF-8");
  Case to(CaseName("UTF-8 to UTF-16", language.name, label, "8-bit"), [&, size8] {
    mirel::Utf16FromUtf8(our16, utf8.data(), size8);
    return our16.size();
  });
  to.Against("Boost", [&] { return boost::locale::conv::utf_to_utf<char16_t>(utf8).size(); });
  to.Against("ICU", [&, size8] {
    int32_t length = 0;
    UErrorCode error = U_ZERO_ERROR;
    u_strFromUTF8(reinterpret_cast<UChar*>(buffer.data()), int32_t(buffer.size() / 2), &length, utf8.data(),
                  int32_t(size8), &error);
    return length;
  });
  to.Against("utfcpp", [&] {
    std16.clear();
    utf8::utf8to16(utf8.begin(), utf8.end(), std::back_inserter(std16));
    return std16.size();
  });
  to.Against("iconv", [&] { return to16(utf8, buffer) / 2; });

  static const Iconv to8("UTF-8", "UTF-16LE");
  Case from(CaseName("UTF-16 to UTF-8", language.name, label, "16-bit"), [&, size16] {
    mirel::Utf8FromUtf16(our8, reinterpret_cast<const char16*>(utf16.data()), size16);
    return our8.size();
  });
  from.Against("Boost", [&] { return boost::locale::conv::utf_to_utf<char>(utf16).size(); });
  from.Against("ICU", [&, size16] {
    int32_t length = 0;
    UErrorCode error = U_ZERO_ERROR;
    u_strToUTF8(buffer.data(), int32_t(buffer.size()), &length, utf16.data(), int32_t(size16), &error);
    return length;
  });
  from.Against("utfcpp", [&] {
    std8.clear();
    utf8::utf16to8(utf16.begin(), utf16.end(), std::back_inserter(std8));
    return std8.size();
  });
  from.Against("iconv", [&] { return to8(utf16, buffer); });
#ifdef HAVE_QT
  to.Against("Qt", [&, size8] { return QString::fromUtf8(utf8.data(), size8).size(); });
  from.Against("Qt", [&, size16] { return QStringView(utf16.data(), size16).toUtf8().size(); });
#endif
}

void RegisterWidening(ssize_t size) {
  const auto& ascii = *new std::string(TextIn(Languages()[0], static_cast<std::size_t>(size)));
  auto& ours = *new mirel::string16;
  auto& theirs = *new std::u16string;
  Case(CaseName("Utf16FromAscii", "ASCII", size, "8-bit"), [&] {
    mirel::Utf16FromAscii(ours, ascii.data(), static_cast<ssize_t>(ascii.size()));
    return ours.size();
  }).Against("a widening loop", [&] {
    theirs.resize(ascii.size());
    for (std::size_t i = 0; i < ascii.size(); ++i)
      theirs[i] = static_cast<unsigned char>(ascii[i]) < 0x80 ? char16_t(ascii[i]) : u'?';
    return theirs.size();
  });
}

} // namespace

void RegisterConversions() {
  for (const std::size_t size :
       {std::size_t(12), std::size_t(200), std::size_t(1) << 16, std::size_t(4) << 20})
    for (const Language& language : Languages())
      RegisterConversion(language, size);
  for (const ssize_t size : {200, 1 << 16, 4 << 20})
    RegisterWidening(size);
}
