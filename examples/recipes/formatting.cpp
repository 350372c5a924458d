// Text in formatted output: printf, and std::format or the fmt library.

#include <cstdio>
#include <string_view>
#include <version>
#if defined(__cpp_lib_format)
#include <format>
namespace formatting = std;
#else
#include <fmt/format.h>
namespace formatting = fmt;
#endif

#include <utils/xstring.h>

using mirel::string8;

// Formats a string8 as the string_view over it, with all its options.
template <> struct formatting::formatter<string8> : formatting::formatter<std::string_view> {
  auto format(const string8& text, formatting::format_context& context) const {
    const std::string_view view(text.data(), static_cast<std::size_t>(text.size()));
    return formatting::formatter<std::string_view>::format(view, context);
  }
};

int main() {
  string8 name = "Ada Lovelace";

  // printf counts in int. With a count it needs no terminator and prints up to the first zero, if there is
  // one.
  std::printf("<%.*s> <%.3s>\n", static_cast<int>(name.size()), name.data(), name.c_str());

  std::puts(formatting::format("<{}> <{:_>16}> <{:.3}>", name, name, name).c_str());
}

/* Prints:
<Ada Lovelace> <Ada>
<Ada Lovelace> <____Ada Lovelace> <Ada>
*/
