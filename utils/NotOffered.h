/// @file
/// Calls that vectors and strings don't have, and what is written instead, as the compiler names it.
///
/// The operators take their arguments by a conversion that a class defines, which is worse than any other:
/// whatever operator a program or another header declares for such arguments is called in their place, among
/// them those of utils/Std.h. The members are deleted where the others of their name are declared.

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

/// What any vector or string converts to.
struct AnyVector {
  template <class T> AnyVector(const xvector<T>&);
};

/// What those that can be changed convert to.
struct ChangeableVector {
  template <class T> ChangeableVector(xvector<T>&);
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

/// The unit of a class with the members of a string, or that a pointer to text points to; otherwise void.
template <class X, class = void> struct TextUnit { typedef void type; };
template <class X> struct TextUnit<X, std::void_t<decltype(X::npos), typename X::value_type>> {
  typedef std::remove_cv_t<typename X::value_type> type;
};
template <class C> struct TextUnit<C*> { typedef std::remove_cv_t<C> type; };
template <class U, class... C> constexpr bool kIsOneOf = (std::is_same_v<U, C> || ...);

/// What to write in place of X where text of T is taken: defined for text of other units and standard
/// strings, and for reverse iterators, which would be taken for the pointers that they convert to.
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
/// The name of that as a type, where integers follow X: for the last parameter of a deleted template.
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
detail::ConvertToStringOfItsWidthFirst operator+=(detail::ChangeableVector, detail::Anything) = delete;
template <class C, class Traits>
detail::IncludeStdOrWriteCStr operator<<(std::basic_ostream<C, Traits>&, detail::VectorOf<char8>) = delete;
template <class C, class Traits>
detail::ConvertToUtf8First operator<<(std::basic_ostream<C, Traits>&, detail::VectorOf<char16>) = delete;

/// @endcond

} // namespace mirel
