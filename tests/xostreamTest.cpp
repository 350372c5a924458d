#include "Support.h"

#include <locale>
#include <stdexcept>

#include <utils/xostream.h>

using namespace mirel;

namespace {

struct Sink : IOutputStream {
  void WriteStream(const void* address, ssize_t count) override {
    if (broken)
      throw std::runtime_error("full");
    text.append(static_cast<const char*>(address), static_cast<std::size_t>(count));
  }
  void FlushStream() override { ++flushes; }
  std::string text;
  int flushes = 0;
  bool broken = false;
};

TEST(XOStream, WritesStringsAsTheyAre) {
  Sink sink;
  xostream os(sink);
  os.width(20);
  os << string8() << string8("a\0b", 3) << "c";
  os.write(nullptr, 0), os.writebytes(nullptr, 0), os.writebytes(reinterpret_cast<const uint8*>("\0\xFF"), 2);
  EXPECT_EQ(sink.text, std::string("a\0bc\0\xFF", 6));
  EXPECT_EQ(os.width(0), 20);
}

TEST(XOStream, FormatsValues) {
  Sink sink;
  xostream os(sink);
  const auto put = [&](auto... x) {
    sink.text.clear();
    os.put(x...);
    return sink.text;
  };
  os.width(4);
  EXPECT_EQ(put(42), "  42");
  EXPECT_EQ(put(true) + put('c') + put(-7L) + put(8ULL) + put(short(9)) + put(int8_t('d')), "1c-789d");
  EXPECT_EQ(put(uint8_t('e')) + put(uint16_t(1)) + put(2u) + put(3ul) + put(-4ll), "e123-4");
  EXPECT_EQ(os.precision(3) + os.precision(), 9);
  EXPECT_EQ(put(3.14159) + put(2.5f) + put(1e30L), "3.142.51e+30");
  EXPECT_EQ(put("text") + put("text", 2) + put(reinterpret_cast<const void*>(0x1A)), "textte0x1a");
  EXPECT_EQ(put(L'\u00E9') + put(u'\u20AC') + put(U'\U0001F600'), "\u00E9\u20AC\U0001F600");
  for (const char32_t c : {0xD800u, 0x110000u, 0x4010000u, 0xFFFFFFFFu})
    EXPECT_EQ(put(c) + put(static_cast<wchar_t>(c)), "\uFFFD\uFFFD");
  os.width(3);
  EXPECT_EQ(put("a", 1), "  a");
  os.put("b", 1), os.put_internal("ab", 2, 5), os.put(nullptr, 0);
  EXPECT_EQ(sink.text, "  ab   ab");
}

TEST(XOStream, KeepsToTheClassicLocale) {
  struct Grouped : std::numpunct<char> {
    std::string do_grouping() const override { return "\3"; }
  };
  Sink sink;
  const std::locale before = std::locale::global({std::locale::classic(), new Grouped});
  xostream(sink).put(1234567);
  std::locale::global(before);
  EXPECT_EQ(sink.text, "1234567");
}

TEST(XOStream, IndentsAndCloses) {
  Sink sink;
  xostream os(sink);
  os.Indent(18);
  os << "a\nb\n";
  EXPECT_EQ(os.GetIndent(), 18);
  os.Indent(1);
  os.put(5), os.endl(), os.ends();
  os << [](xostream& o) -> xostream& { return o.Indent(0), o; };
  const std::string spaces(18, ' ');
  EXPECT_EQ(sink.text, "a\n" + spaces + "b\n 5\n " + std::string(1, '\0'));
  EXPECT_EQ(sink.flushes, 1);
  sink.broken = true;
  EXPECT_THROW(os << "x", std::runtime_error);
  EXPECT_THROW(os.put(1), std::runtime_error);
  sink.broken = false;
  os.put(2);
  EXPECT_EQ(sink.text.back(), '2');
  Sink other;
  xostream closed(other);
  closed.close();
  closed << "x";
  closed.endl();
  EXPECT_TRUE(other.text.empty() && other.flushes == 1);
}

} // namespace
