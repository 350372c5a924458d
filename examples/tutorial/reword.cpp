// Replaces one text with another in a file in any UTF.

#include <cstdio>
#include <cstdlib>

#include "write.h"

int main(int argc, char** argv) {
  if (argc != 4 || *argv[2] == '\0') {
    std::fprintf(stderr, "usage: reword FILE OLD NEW\n");
    return EXIT_FAILURE;
  }
  try {
    TextFile file = Read(argv[1]);
    const mirel::string8 oldWord = argv[2], newWord = argv[3];

    mirel::string8 result;
    int count = 0;
    mirel::ssize_t from = 0; // the text before it is in the result
    for (mirel::ssize_t at; (at = file.text.find(oldWord, from)) != mirel::string8::npos; ++count) {
      result.append(file.text, from, at - from);
      result += newWord;
      from = at + oldWord.size();
    }
    result.append(file.text, from, file.text.size() - from);
    file.text.swap(result);

    if (!mirel::IsWellFormed(file.text))
      throw std::runtime_error("the new text would be malformed");
    Write(argv[1], file);
    std::printf("%d replaced\n%s", count, file.text.c_str());
  } catch (const std::exception& error) {
    std::fprintf(stderr, "reword: %s\n", error.what());
    return EXIT_FAILURE;
  }
}

/* Prints:
2 replaced
Guten Tag, 世界!
Guten Tag, 🌍!
*/
