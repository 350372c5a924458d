// A program without exceptions and RTTI. With an argument, it asks for more memory than exists.

#include <cstdint>
#include <cstdio>

#include <utils/BasicTypes.h>
#include <utils/xostream.h>
#include <utils/xstring.h>

#ifndef OWN_BASIC_TYPES
#error "The program's own header isn't the one that it includes"
#endif

namespace {

struct Sink : mirel::IOutputStream {
  void WriteStream(const void* address, mirel::ssize_t count) override {
    text.append(static_cast<const char*>(address), count);
  }
  void FlushStream() override {}

  mirel::string8 text;
};

} // namespace

int main(int argc, char**) {
  Sink sink;
  mirel::xostream stream(sink);
  mirel::string16 units(2, u'a');
  units += u'\u00E4';
  mirel::string8 text;
  if (!mirel::Utf8FromUtf16(text, units.data(), units.size()))
    return 1;
  stream << text;
  stream.put(text.rfind("\xC3"));
  if (argc > 1)
    text.reserve(INTPTR_MAX);
  std::printf("%s\n", sink.text.c_str());
}
