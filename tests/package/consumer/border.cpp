// Passes strings, sinks and exceptions between a program, a shared library and the library.

#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <list>
#include <new>
#include <stdexcept>

#include <utils/Version.h>

#include "middle.h"

#if MIREL_VERSION < 100
#error "The version isn't a number that a program can compare"
#endif

namespace {

void Expect(bool condition, const char* what) {
  if (!condition) {
    std::fprintf(stderr, "not so: %s\n", what);
    std::exit(1);
  }
}

struct Full : std::runtime_error {
  using runtime_error::runtime_error;
};

struct SmallSink : mirel::IOutputStream {
  void WriteStream(const void* address, mirel::ssize_t count) override {
    if (text.size() + count > 4)
      throw Full("no more than four bytes");
    text.append(static_cast<const char*>(address), count);
  }
  void FlushStream() override {}

  mirel::string8 text;
};

} // namespace

int main() {
  Expect(std::strcmp(MIREL_VERSION_STRING, VERSION) == 0, "the header has the package's version");

  const std::list<char> units{'\xC3', '\xA4', ' ', 'b', 'c', 'd'};
  mirel::string8 text;
  text.assign(units.begin(), units.end()); // a template that the library has no instance of
  const std::vector<mirel::string16> words = Words(text);
  Expect(words.size() == 2, "the text has two words");
  Expect(words[0].size() == 1, "the first word has one unit");
  Expect(words[0][0] == 0xE4, "the first word is U+00E4");

  SmallSink sink;
  Print(sink, words[0]);
  try {
    Print(sink, words[1]);
    Expect(false, "the sink's exception gets through two libraries");
  } catch (const Full&) {
    Expect(sink.text._Eq("\xC3\xA4"), "the sink has what came before");
  }
  try {
    text.reserve(INTPTR_MAX);
    Expect(false, "the library throws");
  } catch (const std::bad_alloc&) {
  }
}
