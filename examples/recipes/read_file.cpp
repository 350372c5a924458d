// A whole file in a string, in one read.

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <memory>
#include <system_error>

#include <utils/xstring.h>

using mirel::ssize_t;
using mirel::string8;

string8 ReadFile(const char* name) {
  const std::size_t size = std::filesystem::file_size(name);
  const std::unique_ptr<FILE, int (*)(FILE*)> file(std::fopen(name, "rb"), std::fclose);
  if (!file)
    throw std::system_error(errno, std::generic_category(), name);
  string8 bytes;
  bytes.resize(static_cast<ssize_t>(size), 0);
  const std::size_t got = std::fread(bytes.data(), 1, size, file.get());
  if (std::ferror(file.get()))
    throw std::system_error(errno, std::generic_category(), name);
  bytes.resize(static_cast<ssize_t>(got), 0); // less where the file was cut meanwhile
  return bytes;
}

int main(int argc, char** argv) {
  if (argc != 2)
    return EXIT_FAILURE;
  const string8 text = ReadFile(argv[1]);
  std::printf("%td bytes, %td lines\n", text.size(), std::count(text.begin(), text.end(), '\n'));
}

/* Prints:
36 bytes, 3 lines
*/
