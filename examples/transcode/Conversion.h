// The whole run: the text of all files from the input to the output.

#pragma once

#include <string>

#include "Options.h"

namespace transcode {

/// What there is to say of a run that has come to its end.
struct Result {
  bool isWell = true;   ///< whether no file that was checked has a fault
  std::string messages; ///< lines for standard error
  std::string reports;  ///< lines for standard output
};

/// @throw std::runtime_error with the first fault, unless files are only checked; the file that was to be
/// written is left alone then
Result Convert(const Options& options);

} // namespace transcode
