#include "Encodings.h"

#include <algorithm>
#include <cctype>
#include <numeric>
#include <vector>

namespace transcode {

namespace {

constexpr Encoding kEncodings[] = {
    {"utf-8", "", Form::kUtf8, ByteOrder::kNone},
    {"utf-16", "", Form::kUtf16, ByteOrder::kByMark},
    {"utf-16le", "", Form::kUtf16, ByteOrder::kLittle},
    {"utf-16be", "", Form::kUtf16, ByteOrder::kBig},
    {"utf-32", "", Form::kUtf32, ByteOrder::kByMark},
    {"utf-32le", "", Form::kUtf32, ByteOrder::kLittle},
    {"utf-32be", "ucs-4", Form::kUtf32, ByteOrder::kBig},
    {"latin1", "iso-8859-1 iso-ir-100 l1 8859_1 cp819 ibm819", Form::kLatin1, ByteOrder::kNone},
    {"ascii", "us-ascii ansi_x3.4-1968 iso646-us us cp367 ibm367", Form::kAscii, ByteOrder::kNone}};

/// iconv lists each name with this suffix, and takes options after it.
constexpr std::string_view kSuffix = "//";

/// Removes from a name what doesn't count: case, dashes and underscores.
std::string Simplify(std::string_view name) {
  std::string simple;
  for (const char c : name)
    if (c != '-' && c != '_')
      simple += static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
  return simple;
}

std::vector<std::string> NamesOf(const Encoding& encoding) {
  std::vector<std::string> names = {encoding.name};
  for (std::string_view rest = encoding.aliases; !rest.empty();) {
    const std::string_view alias = rest.substr(0, rest.find(' '));
    names.emplace_back(alias);
    rest.remove_prefix(std::min(alias.size() + 1, rest.size()));
  }
  return names;
}

/// Returns the Levenshtein distance: how many characters must be inserted, deleted or replaced to turn a into
/// b.
std::size_t EditDistance(const std::string& a, const std::string& b) {
  std::vector<std::size_t> row(b.size() + 1); // the distance of each prefix of b from the current prefix of a
  std::iota(row.begin(), row.end(), std::size_t(0));
  for (std::size_t i = 0; i < a.size(); ++i) {
    std::size_t diagonal = row[0]++;
    for (std::size_t j = 0; j < b.size(); ++j) {
      const std::size_t replaced = diagonal + (a[i] != b[j]);
      diagonal = row[j + 1];
      row[j + 1] = std::min({replaced, row[j] + 1, row[j + 1] + 1});
    }
  }
  return row.back();
}

} // namespace

const Encoding& kDefaultEncoding = kEncodings[0];

const Encoding* FindEncoding(std::string_view name) {
  const bool isAsListed = name.size() > 2 && name.substr(name.size() - 2) == kSuffix;
  const std::string simple = Simplify(isAsListed ? name.substr(0, name.size() - 2) : name);
  for (const Encoding& encoding : kEncodings)
    for (const std::string& known : NamesOf(encoding))
      if (Simplify(known) == simple)
        return &encoding;
  return nullptr;
}

std::string NearestNames(std::string_view name) {
  const std::string simple = Simplify(name.substr(0, name.find(kSuffix)));
  std::size_t least = std::max<std::size_t>(1, simple.size() * 2 / 5); // more is no typing error
  std::vector<std::string> nearest;
  for (const Encoding& encoding : kEncodings) {
    for (const std::string& known : NamesOf(encoding)) {
      const std::size_t distance = EditDistance(simple, Simplify(known));
      if (distance < least)
        nearest.clear();
      if (distance <= least) {
        least = distance;
        nearest.push_back(known);
      }
    }
  }
  std::string words;
  for (std::size_t i = 0; i < nearest.size(); ++i)
    words += (i == 0 ? "" : i + 1 < nearest.size() ? ", " : " or ") + nearest[i];
  return words;
}

std::string ListEncodings() {
  std::string list;
  for (const Encoding& encoding : kEncodings)
    list += std::string(encoding.name) + (*encoding.aliases ? " " : "") + encoding.aliases + "\n";
  return list;
}

} // namespace transcode
