// Counts the units and code points of a file in any UTF.

#include <cstdio>
#include <cstdlib>

#include "read.h"

int main(int argc, char** argv) {
  if (argc != 2) {
    std::fprintf(stderr, "usage: count FILE\n");
    return EXIT_FAILURE;
  }
  try {
    const TextFile file = Read(argv[1]);
    std::printf("%s: %td code points, %td units of UTF-8, %td of UTF-16\n", file.encoding->name,
                mirel::CountCodePoints(file.text), file.text.size(), mirel::Utf16Length(file.text));
  } catch (const std::exception& error) {
    std::fprintf(stderr, "count: %s\n", error.what());
    return EXIT_FAILURE;
  }
}

/* Prints:
UTF-16LE: 21 code points, 28 units of UTF-8, 22 of UTF-16
*/
