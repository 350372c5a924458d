/// @file
/// The ways in which a UTF-8 or UTF-16 sequence can be malformed, as values and in words.

#pragma once

#include "BasicTypes.h"

namespace mirel {

/// Why a sequence isn't well-formed.
enum class MalformedReason {
  kNone,                   ///< It is well-formed.
  kTruncated,              ///< The end of the text, or a non-continuation byte, cuts the sequence off.
  kUnexpectedContinuation, ///< A byte 80 to BF that continues no sequence, as after a malformed one.
  kOverlong,               ///< A longer sequence than the code point needs; C0 and C1 begin nothing else.
  kSurrogate,              ///< A surrogate, D800 to DFFF, encoded in UTF-8.
  kBeyondUnicode,          ///< A value above U+10FFFF: F4 followed by 90 to BF.
  kInvalidByte,            ///< A byte F5 to FF, which UTF-8 never has.
  kUnpairedSurrogate,      ///< A UTF-16 surrogate that isn't part of a surrogate pair.
};

/// Returns the reason as a noun phrase for a message, "overlong sequence" for example.
MIREL_API const char* Describe(MalformedReason reason);

/// A malformed sequence in a text.
/// @snippet examples/reference.cpp checking
struct MalformedText {
  int64 offset;           ///< The index of its first unit.
  ssize_t length;         ///< The number of units that one U+FFFD replaces.
  MalformedReason reason; ///< What is wrong with it.
};

/// What a conversion in pieces does with malformed text.
enum class OnMalformed {
  kStop,   ///< Stops at the first malformed sequence and converts nothing from there on.
  kReplace ///< Replaces each maximal subpart with U+FFFD.
};

} // namespace mirel
