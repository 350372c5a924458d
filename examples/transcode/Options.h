// The command line.

#pragma once

#include <stdexcept>
#include <string>
#include <vector>

#include "Outgoing.h"

namespace transcode {

extern const char kUsage[];
extern const char kHelp[];

struct UsageError : std::runtime_error {
  using std::runtime_error::runtime_error;
};

struct Options {
  const Encoding* from = &kDefaultEncoding;
  const Encoding* to = &kDefaultEncoding;
  std::vector<std::string> inputs;
  std::string output; ///< empty when not given
  Mode mode = Mode::kConvert;
  Mark mark = Mark::kKeep;
  LineEnds lineEnds = LineEnds::kKeep;
  bool report = false;
  bool quiet = false;
  bool list = false;
  bool help = false;
  bool version = false;
};

/// Parses the command line. @throw UsageError that says what is wrong, or is empty if the parser has said it
Options ParseOptions(int argc, char** argv);

} // namespace transcode
