// Counts, finds and replaces in a text.

#include <cstdio>

#include <utils/Utf.h>

int main() {
  mirel::string8 text = "Grüße an alle, 世界!";
  std::printf("%td bytes, %td code points\n", text.size(), mirel::CountCodePoints(text));

  const mirel::ssize_t at = text.find("alle");
  if (at == mirel::string8::npos)
    return 1;
  text.replace(at, 4, "jeden");
  std::printf("%s\n", text.c_str());
}

/* Prints:
24 bytes, 18 code points
Grüße an jeden, 世界!
*/
