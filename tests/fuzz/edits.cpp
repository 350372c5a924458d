// Fuzzes edits and searches: each byte is a number that chooses an edit or one of its arguments.
#include "../Edits.h"

namespace {

struct Bytes {
  /// The next number up to max, 0 at the end of the input.
  ssize_t operator()(ssize_t max) { return p == end ? 0 : *p++ % (max + 1); }
  const unsigned char *p, *end;
};

template <class T> void Run(Bytes bytes) {
  Edits<T, Bytes> edits(bytes);
  Searches<T, Bytes> searches(bytes);
  while (bytes.p != bytes.end) {
    edits.Step();
    if (bytes(7) == 0)
      searches.Step(200);
  }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const unsigned char* data, std::size_t size) {
  GTEST_FLAG_SET(throw_on_failure, true);
  const Bytes bytes{data, data + size};
  Run<char8>(bytes);
  Run<char16>(bytes);
  return 0;
}
