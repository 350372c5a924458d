/// @file
/// Operators that vectors and strings don't have, and what is written instead, as the compiler names it.
///
/// They take their arguments by a conversion that a class defines, which is worse than any other: whatever
/// operator a program or another header declares for such arguments is called in their place, among them
/// those of utils/Std.h.

#pragma once

#include <iosfwd>
#include <type_traits>

#include "xchar.h"

namespace mirel {

// Clang takes the visibility from the first declaration that it sees.
template <class T> class MIREL_API xvector;

namespace detail {

template <class T> std::true_type IsVector(const xvector<T>*);
std::false_type IsVector(...);

/// What any vector or string converts to.
struct AnyVector {
  template <class T> AnyVector(const xvector<T>&);
};

/// What vectors and strings of T convert to.
template <class T> struct VectorOf { VectorOf(const xvector<T>&); };

/// What everything converts to.
struct Anything {
  template <class X> Anything(const X&);
};

/// What everything else converts to.
struct NoVector {
  template <class X, std::enable_if_t<!decltype(IsVector(static_cast<X*>(nullptr)))::value, int> = 0>
  NoVector(const X&);
};

/// What nothing converts to.
class NoUnit {
  NoUnit();
};

struct AppendToACopyInstead {};
struct ConvertToUtf8First {};
struct IncludeStdOrWrite_Eq {};
struct IncludeStdOrWrite_Lt {};
struct IncludeStdOrWriteCStr {};
struct ReverseIteratorsOnlyStep {};
struct WriteAssignOfOneUnit {};
struct WriteEraseElement {};
struct WriteNullptr {};

} // namespace detail

/// @cond

detail::AppendToACopyInstead operator+(detail::AnyVector, detail::Anything) = delete;
detail::AppendToACopyInstead operator+(detail::NoVector, detail::AnyVector) = delete;
detail::IncludeStdOrWrite_Eq operator==(detail::AnyVector, detail::Anything) = delete;
detail::IncludeStdOrWrite_Eq operator==(detail::NoVector, detail::AnyVector) = delete;
detail::IncludeStdOrWrite_Eq operator!=(detail::AnyVector, detail::Anything) = delete;
detail::IncludeStdOrWrite_Eq operator!=(detail::NoVector, detail::AnyVector) = delete;
detail::IncludeStdOrWrite_Lt operator<(detail::AnyVector, detail::Anything) = delete;
detail::IncludeStdOrWrite_Lt operator<(detail::NoVector, detail::AnyVector) = delete;
detail::IncludeStdOrWrite_Lt operator>(detail::AnyVector, detail::Anything) = delete;
detail::IncludeStdOrWrite_Lt operator>(detail::NoVector, detail::AnyVector) = delete;
detail::IncludeStdOrWrite_Lt operator<=(detail::AnyVector, detail::Anything) = delete;
detail::IncludeStdOrWrite_Lt operator<=(detail::NoVector, detail::AnyVector) = delete;
detail::IncludeStdOrWrite_Lt operator>=(detail::AnyVector, detail::Anything) = delete;
detail::IncludeStdOrWrite_Lt operator>=(detail::NoVector, detail::AnyVector) = delete;
template <class C, class Traits>
detail::IncludeStdOrWriteCStr operator<<(std::basic_ostream<C, Traits>&, detail::VectorOf<char8>) = delete;
template <class C, class Traits>
detail::ConvertToUtf8First operator<<(std::basic_ostream<C, Traits>&, detail::VectorOf<char16>) = delete;

/// @endcond

} // namespace mirel
