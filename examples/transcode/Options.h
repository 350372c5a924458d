// The command line.

#pragma once

#include <stdexcept>
#include <string>

#include "Blocks.h"

namespace transcode {

extern const char kUsage[];
extern const char kHelp[];

struct UsageError : std::runtime_error {
  using std::runtime_error::runtime_error;
};

struct Options {
  Encoding from = Encoding::kUtf8;
  Encoding to = Encoding::kUtf8;
  std::string input = "-";
  std::string output; ///< empty when not given
  Mode mode = Mode::kConvert;
  bool report = false;
  bool quiet = false;
  bool help = false;
  bool version = false;
};

/// An encoding as it is called on the command line.
const char* Name(Encoding encoding);

/// @throw UsageError with what is wrong, or without words when the parser has printed them
Options ParseOptions(int argc, char** argv);

} // namespace transcode
