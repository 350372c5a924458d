/// @file
/// Calls that vectors and strings don't offer, declared as deleted. In the compiler's message, the return
/// type or the type of a parameter Hint names what to write instead.
///
/// The operators take their arguments by user-defined conversions, so overload resolution prefers whatever
/// operator a program or another header declares for such arguments, those of utils/Std.h included. Deleted
/// members are declared in their classes, after the other public members.

#pragma once

#include <iosfwd>
#include <type_traits>

#include "Integers.h"
#include "xchar.h"

namespace mirel {

// Clang takes the visibility from the first declaration that it sees.
template <class T> class MIREL_API xvector;

namespace detail {

template <class T> std::true_type IsVector(const xvector<T>*);
std::false_type IsVector(...);

/// Any vector or string converts to it.
struct AnyVector {
  template <class T> AnyVector(const xvector<T>&);
};

/// Any non-const vector or string converts to it.
struct NonConstVector {
  template <class T> NonConstVector(xvector<T>&);
};

/// Vectors and strings of T convert to it.
template <class T> struct VectorOf { VectorOf(const xvector<T>&); };

/// Everything converts to it.
struct Anything {
  template <class X> Anything(const X&);
};

/// Everything but a vector or a string converts to it.
struct NoVector {
  template <class X, std::enable_if_t<!decltype(IsVector(static_cast<X*>(nullptr)))::value, int> = 0>
  NoVector(const X&);
};

/// Nothing converts to it, so only {} makes a std::initializer_list of it.
class NoUnit {
  NoUnit();
};

struct AppendToACopyInstead {};
struct ConvertToStringOfItsWidthFirst {};
struct ConvertToUtf16First {};
struct ConvertToUtf8First {};
struct IncludeStdAndWriteToString16 {};
struct IncludeStdAndWriteToString8 {};
struct IncludeStdOrWrite_Eq {};
struct IncludeStdOrWrite_Lt {};
struct IncludeStdOrWriteCStr {};
struct ReverseIteratorsOnlyStep {};
struct WriteAssignOfOneUnit {};
struct WriteEraseElement {};
struct WriteNullptrOrInsertCopies {};
struct WriteNullptrOrPointerAndCount {};
struct WritePointerAndCount {};
struct WritePushBack {};
struct WriteRangeOfTheSet {};
struct WriteTwoPointers {};

struct ReversePointer;

/// The code unit of X if X is text: the value_type of a class that has npos, as strings and string views do,
/// or the type that a pointer points to; void for other types.
template <class X, class = void> struct TextUnit { typedef void type; };
template <class X> struct TextUnit<X, std::void_t<decltype(X::npos), typename X::value_type>> {
  typedef std::remove_cv_t<typename X::value_type> type;
};
template <class C> struct TextUnit<C*> { typedef std::remove_cv_t<C> type; };
template <class U, class... C> constexpr bool kIsOneOf = (std::is_same_v<U, C> || ...);

/// The hint for an argument of type X where text of T is expected. It is defined only for text of other
/// units, for standard strings and string views, and for reverse iterators, which would be taken for the
/// pointers that they convert to.
template <class T, class X, class U = typename TextUnit<std::decay_t<X>>::type, class = void>
struct InPlaceOf {};
template <class T, class X>
struct InPlaceOf<T, X, void, std::enable_if_t<std::is_base_of_v<ReversePointer, X>>> {
  typedef ReverseIteratorsOnlyStep type;
};
template <class T, class X, class U>
struct InPlaceOf<T, X, U,
                 std::enable_if_t<kIsOneOf<U, char, decltype(u8' '), char16, char16_t, char32_t, wchar_t> &&
                                  !std::is_convertible_v<const X&, const T*> &&
                                  !std::is_convertible_v<const X&, xvector<T>>>> {
  typedef std::conditional_t<sizeof(T) == 1, IncludeStdAndWriteToString8, IncludeStdAndWriteToString16> Copy;
  typedef std::conditional_t<sizeof(T) == 1, ConvertToUtf8First, ConvertToUtf16First> Conversion;
  typedef std::conditional_t<sizeof(T) == sizeof(U), Copy, Conversion> type;
};
/// The hint for X, if nothing but integers follows it. It is the default of a deleted template's parameter,
/// so that compilers print it.
template <class T, class X, class... N>
using Instead = std::enable_if_t<kIsEachInteger<N...>, typename InPlaceOf<T, X>::type>;

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
detail::ConvertToStringOfItsWidthFirst operator+=(detail::NonConstVector, detail::Anything) = delete;
template <class C, class Traits>
detail::IncludeStdOrWriteCStr operator<<(std::basic_ostream<C, Traits>&, detail::VectorOf<char8>) = delete;
template <class C, class Traits>
detail::ConvertToUtf8First operator<<(std::basic_ostream<C, Traits>&, detail::VectorOf<char16>) = delete;

/// @endcond

} // namespace mirel
