// Reads a whole file into a string. FillFrom() lets the reader write directly into the string's storage,
// which isn't filled with zeros first.

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <memory>
#include <system_error>

#include <utils/Std.h>

using mirel::ssize_t;
using mirel::string8;

// Reads a C stream. The file's size says how much storage it takes. A descriptor's read() is used likewise.
string8 ReadFile(const char* name) {
  const std::unique_ptr<FILE, int (*)(FILE*)> file(std::fopen(name, "rb"), std::fclose);
  if (!file)
    throw std::system_error(errno, std::generic_category(), name);
  string8 bytes;
  mirel::FillFrom(bytes, std::filesystem::file_size(name), [&](char* p, ssize_t n) {
    const std::size_t got = std::fread(p, 1, static_cast<std::size_t>(n), file.get());
    if (std::ferror(file.get()))
      throw std::system_error(errno, std::generic_category(), name); // the string stays as it was
    return got; // less if the file was truncated meanwhile
  });
  return bytes;
}

// Reads a standard stream of unknown length, block by block. The storage grows as with any other edits.
string8 ReadStream(std::istream& stream) {
  string8 bytes;
  while (mirel::FillFrom(bytes, 65536, [&](char* p, ssize_t n) { return stream.read(p, n).gcount(); }) > 0)
    ;
  return bytes;
}

int main(int argc, char** argv) {
  if (argc != 2)
    return EXIT_FAILURE;
  const string8 text = ReadFile(argv[1]);
  std::printf("%td bytes, %td lines\n", text.size(), std::count(text.begin(), text.end(), '\n'));
  std::ifstream stream(argv[1], std::ios::binary);
  std::puts(ReadStream(stream) == text ? "the same" : "other bytes");
}

/* Prints:
36 bytes, 3 lines
the same
*/
