// Text in formatted output: printf, standard streams, and std::format or the fmt library.

#include <cstdio>
#include <iomanip>
#include <iostream>

#include <utils/Format.h>

#if defined(__cpp_lib_format)
namespace formatting = std;
#else
namespace formatting = fmt;
#endif

using mirel::string16;
using mirel::string8;

int main() {
  string8 name = "Ada Lovelace";

  // printf counts in int. With a count it needs no terminator, and prints up to the first null if there is
  // one.
  std::printf("<%.*s> <%.3s>\n", static_cast<int>(name.size()), name.data(), name.c_str());
  std::fflush(stdout);

  std::cout << '<' << name << "> <" << std::setw(16) << std::setfill('_') << name << ">\n";

  std::cout << formatting::format("<{}> <{:_>16}> <{:.3}>\n", name, name, name);

  // A string16 is written as UTF-8, with U+FFFD in place of malformed text.
  string16 wide = mirel::ToString16(u"Zoë");
  wide.push_back(0xD800);
  std::cout << formatting::format("<{}> <{:*^8.3}>\n", wide, wide);
}

/* Prints:
<Ada Lovelace> <Ada>
<Ada Lovelace> <____Ada Lovelace>
<Ada Lovelace> <____Ada Lovelace> <Ada>
<Zoë�> <**Zoë***>
*/
