// What a shared library that hides everything else offers: strings, streams and exceptions cross its border.

#pragma once

#include <vector>

#include <utils/xostream.h>
#include <utils/xstring.h>

#define MIDDLE_API __attribute__((visibility("default")))

/// The words of a text, which are separated by single spaces.
MIDDLE_API std::vector<mirel::string16> Words(const mirel::string8& text);

/// Writes a text to the sink, and passes on what that throws.
MIDDLE_API void Print(mirel::IOutputStream& sink, const mirel::string16& text);
