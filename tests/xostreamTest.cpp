#include "Support.h"

#include <algorithm>
#include <locale>
#include <numeric>
#include <random>
#include <stdexcept>
#include <vector>

#include <utils/xostream.h>

using namespace mirel;

namespace {

/// A sink that takes all bytes of a call, or throws and takes none.
struct Sink : IOutputStream {
  void WriteStream(const void* address, ssize_t count) override {
    EXPECT_GT(count, 0);
    if (calls++ == failing)
      throw std::runtime_error("full");
    text.append(static_cast<const char*>(address), static_cast<std::size_t>(count));
  }
  void FlushStream() override { ++flushes; }
  std::string text;
  int calls = 0, failing = -1, flushes = 0;
};

TEST(XOStream, WritesStringsAsTheyAre) {
  Sink sink;
  xostream os(sink);
  os.width(20);
  os << string8() << string8("a\0b", 3) << "c";
  os.write(nullptr, 0);
  os.writebytes(nullptr, 0);
  os.writebytes(reinterpret_cast<const uint8*>("\0\xFF"), 2);
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
  EXPECT_EQ(put(true), "1");
  EXPECT_EQ(put('c'), "c");
  EXPECT_EQ(put(int8_t('d')), "d");
  EXPECT_EQ(put(uint8_t('e')), "e");
  EXPECT_EQ(put(short(9)), "9");
  EXPECT_EQ(put(uint16_t(1)), "1");
  EXPECT_EQ(put(2u), "2");
  EXPECT_EQ(put(-7L), "-7");
  EXPECT_EQ(put(3ul), "3");
  EXPECT_EQ(put(-4ll), "-4");
  EXPECT_EQ(put(8ULL), "8");
  EXPECT_EQ(os.precision(3), 6);
  EXPECT_EQ(os.precision(), 3);
  EXPECT_EQ(put(3.14159), "3.14");
  EXPECT_EQ(put(2.5f), "2.5");
  EXPECT_EQ(put(1e30L), "1e+30");
  EXPECT_EQ(put(u8'x'), "x");
  EXPECT_EQ(put(u8"text"), "text");
  EXPECT_EQ(put("text", 2), "te");
  EXPECT_EQ(put(reinterpret_cast<const void*>(0x1A)), "0x1a");
  EXPECT_EQ(put(L'\u00E9'), "\u00E9");
  EXPECT_EQ(put(u'\u20AC'), "\u20AC");
  EXPECT_EQ(put(U'\U0001F600'), "\U0001F600");
  EXPECT_EQ(put(L'\uFFFF'), "\uFFFF");
  EXPECT_EQ(put(u'\uFFFF'), "\uFFFF");
  for (const char32_t c : {0xFFFFu, 0xD800u, 0x110000u, 0x4010000u, 0xFFFFFFFFu}) {
    EXPECT_EQ(put(c), c == 0xFFFF ? "\uFFFF" : "\uFFFD");
    EXPECT_EQ(put(static_cast<wchar_t>(c)), c == 0xFFFF ? "\uFFFF" : "\uFFFD");
  }
  os.width(3);
  EXPECT_EQ(put("a", 1), "  a");
  os.put("b", 1);
  os.put_internal("ab", 2, 5);
  os.put(nullptr, 0);
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

TEST(XOStream, IndentsWhatFollowsANewline) {
  Sink sink;
  xostream os(sink);
  os.Indent(18);
  os << "a\nb\n";
  EXPECT_EQ(os.GetIndent(), 18);
  os.Indent(1);
  os.put(5);
  os.endl();
  os.ends();
  os << [](xostream& o) -> xostream& {
    o.Indent(0);
    return o;
  };
  const std::string spaces(18, ' ');
  EXPECT_EQ(sink.text, "a\n" + spaces + "b\n 5\n " + std::string(1, '\0'));
  EXPECT_EQ(sink.flushes, 1);
}

TEST(XOStream, WritesNothingOnceClosed) {
  Sink sink;
  xostream os(sink);
  os.close();
  os.close();
  EXPECT_EQ(os.width(), 0);
  os.Indent(ssize_t(1) << 30);
  os.width(1 << 30); // padding and indent of such a size would take seconds
  os << "x\nx";
  os.put("x");
  os.endl();
  EXPECT_EQ(sink.text, "");
  EXPECT_EQ(sink.flushes, 1);
}

TEST(XOStream, CallsTheSinkSeldom) {
  const auto line = [](std::size_t size) { return std::string(size, 'x') + '\n'; };
  std::string lines;
  for (int i = 0; i < 20000; ++i)
    lines += line(4);
  const struct {
    std::string text;
    ssize_t indent, width;
    int calls;
  } rows[] = {{lines, 0, 0, 1},
              {lines, 3, 0, (20000 * 8 - 3) / 512 + 1},
              {line(100000), 3, 0, 1},
              {"a\nb\nc", 3, 0, 1},
              {line(600) + line(600), 3, 0, 3},
              {"a", 0, 300, 1},
              {line(400), 0, 511, 1},
              {line(400), 0, 600, 2},
              {"", 3, 0, 0}};
  for (const auto& [text, indent, width, calls] : rows) {
    Sink sink;
    xostream os(sink);
    os.Indent(indent);
    os.put_internal(text.data(), ssize_t(text.size()), width);
    EXPECT_EQ(sink.calls, calls) << text.substr(0, 9) << " indented by " << indent << ", in " << width;
  }
}

/// Returns text, which has no spaces, as the stream should indent it.
std::string Indented(const std::string& text, std::size_t indent) {
  std::string result;
  for (const char c : text)
    result.append(!result.empty() && result.back() == '\n' ? indent : 0, ' ') += c;
  return result;
}

TEST(XOStream, IndentsEachLineOnceWhicheverCallThrows) {
  std::mt19937 random(7);
  const std::size_t indents[] = {0, 1, 4, 17, 511, 512, 513, 1500}, sizes[] = {1, 3, 40, 600, 2000};
  for (int round = 0; round < 200; ++round) {
    std::vector<std::string> texts(1 + random() % 5);
    for (auto& text : texts)
      for (auto lines = random() % 6; lines > 0; --lines)
        text += std::string(random() % sizes[random() % 5], 'x') + (random() % 4 == 0 ? "" : "\n");
    const std::size_t indent = indents[random() % 8];
    const std::string all = std::accumulate(texts.begin(), texts.end(), std::string());
    for (int failing = 0, calls = 0; failing <= calls; ++failing) { // no call throws in the last round
      Sink sink;
      sink.failing = failing;
      xostream os(sink);
      os.Indent(ssize_t(indent));
      for (const auto& text : texts)
        try {
          os.put(text.data(), ssize_t(text.size()));
        } catch (const std::runtime_error&) {
        }
      calls = sink.calls;
      sink.failing = -1;
      os << "end";
      std::string taken = sink.text;
      taken.erase(std::remove(taken.begin(), taken.end(), ' '), taken.end());
      ASSERT_EQ(sink.text, Indented(taken, indent)) << "call " << failing << " threw";
      ASSERT_EQ(taken == all + "end", failing == calls) << taken << "\nof\n" << all;
    }
  }
}

TEST(XOStream, GoesOnAfterAnException) {
  Sink sink;
  xostream os(sink);
  for (const ssize_t width : {0, 600}) { // the longer number fails in the middle
    sink.failing = sink.calls;
    os.width(width);
    EXPECT_THROW(os.put(1), std::runtime_error);
    os.width(0);
    os.put(2);
    os << "x";
  }
  EXPECT_EQ(sink.text, "2x2x");
}

} // namespace
