// Converts the text of all files from input to output.

#pragma once

#include <string>

#include "Options.h"

namespace transcode {

/// The outcome of a run that has reached its end.
struct Result {
  bool isWell = true;   ///< whether each file checked could be read and is well-formed
  std::string messages; ///< lines for standard error
  std::string reports;  ///< lines for standard output
};

/// Converts the files that the options name.
/// @throw std::runtime_error with the first fault, unless files are only checked; the output file is then as
/// it was
Result Convert(const Options& options);

} // namespace transcode
