// The exported functions of a shared library that hides everything else. They pass strings, sinks and
// exceptions.

#pragma once

#include <vector>

#include <utils/xostream.h>
#include <utils/xstring.h>

#define MIDDLE_API __attribute__((visibility("default")))

/// Splits a text at single spaces.
MIDDLE_API std::vector<mirel::string16> Words(const mirel::string8& text);

/// Writes a text to the sink; exceptions of the sink pass through.
MIDDLE_API void Print(mirel::IOutputStream& sink, const mirel::string16& text);
