/// @file
/// What an integer argument of any type becomes: a count, an index or a code unit.
///
/// It knows integers and code units, neither ranges nor containers.

#pragma once

#include <limits>
#include <type_traits>

#include "BasicTypes.h"

namespace mirel {

namespace detail {

/// Whether N is an integer type or an unscoped enumeration.
template <class N>
constexpr bool kIsInteger = std::is_integral_v<N> || (std::is_enum_v<N> && std::is_convertible_v<N, int>);
template <class... N> constexpr bool kIsEachInteger = (kIsInteger<N> && ...);
/// Lets an overload take part in overload resolution only for integers. An integer argument of any type
/// matches such an overload exactly, which is how a literal 0 stays an index, a count or a unit where a
/// pointer could be meant too.
template <class... N> using IfIntegers = std::enable_if_t<kIsEachInteger<N...>, int>;

/// Lets a template take part in overload resolution only for (pointer, integer). A literal 0 is an integer.
template <class P, class Ptr, class N>
using IfPointerAndCount = std::enable_if_t<
    (std::is_pointer_v<P> || std::is_null_pointer_v<P>)&&std::is_convertible_v<P, Ptr> && kIsInteger<N>, int>;

/// Lets a template take part in overload resolution only for a pointer and an integer, in whatever order.
template <class P, class Q>
using IfPointerAndInteger =
    std::enable_if_t<(std::is_pointer_v<P> && kIsInteger<Q>) || (kIsInteger<P> && std::is_pointer_v<Q>), int>;

/// Converts an integer, an enumerator or a code unit to the unsigned type of its width, which is how every
/// unit of a source is read.
template <class N> constexpr auto UnsignedValue(N x) {
  if constexpr (std::is_enum_v<N>)
    return UnsignedValue(static_cast<std::underlying_type_t<N>>(x));
  else if constexpr (std::is_same_v<N, bool>)
    return static_cast<unsigned char>(x);
  else
    return static_cast<std::make_unsigned_t<N>>(x);
}

/// Returns whether x fits in a T, as a signed or as an unsigned number.
template <class T, class N> constexpr bool HasBitsFor(N x) { // decided at compile time
  using Unsigned = decltype(UnsignedValue(x));
  using Max = std::numeric_limits<std::make_unsigned_t<T>>;
  if constexpr (std::numeric_limits<Unsigned>::digits <= Max::digits) {
    return true;
  } else {
    constexpr Unsigned kLeastNegative = static_cast<Unsigned>(~static_cast<Unsigned>(Max::max() / 2));
    return UnsignedValue(x) <= Max::max() ||                // decided at compile time
           (x < N{} && UnsignedValue(x) >= kLeastNegative); // decided at compile time
  }
}

// The compiler's message about a constant that doesn't fit.
/// @cond
#define MIREL_TOO_MANY_BITS                                                                                  \
  "this constant has more bits than the code unit that it is passed as: cast it if that is meant"
/// @endcond

#ifdef __clang__
// With clang, MIREL_FITS refuses constants that don't fit, at any optimisation level.
template <class T, bool kStored, class N> constexpr void CheckConstant(N) {}
#else
/// Isn't defined: the compilation fails if a call remains after optimisation.
void ConstantDoesNotFit() __attribute__((error(MIREL_TOO_MANY_BITS)));
/// Never inlined, so that the compiler warns of a call that remains after optimisation.
__attribute__((noipa, warning(MIREL_TOO_MANY_BITS))) inline void ConstantIsTruncated() {}

/// Refuses a constant with too many bits that is stored, and warns of one that is searched for, if the
/// compiler optimises. Nothing is checked at run time. The compiler also takes a variable for a constant
/// where it knows the value: n, for example, within `if (n == 256) {...}`. To search for such a variable is
/// no mistake, so a search only gets a warning.
template <class T, bool kStored, class N>
[[gnu::always_inline]] inline void CheckConstant([[maybe_unused]] N x) {
#ifdef __OPTIMIZE__
  if (__builtin_constant_p(x) && !HasBitsFor<T>(x))         // decided at compile time
    kStored ? ConstantDoesNotFit() : ConstantIsTruncated(); // decided at compile time
#endif
}
#endif

/// Converts a difference or a count to ssize_t, clamped to the limits of ssize_t where that has fewer bits.
template <class N> constexpr ssize_t Saturated(N n) {
  if constexpr (sizeof(N) > sizeof(ssize_t)) { // decided at compile time
    using Limits = std::numeric_limits<ssize_t>;
    return n < Limits::min() ? Limits::min() : n > Limits::max() ? Limits::max() : static_cast<ssize_t>(n);
  } else {
    return static_cast<ssize_t>(n);
  }
}

/// Converts an argument to a count or an index. A 64-bit value saturates where ssize_t has 32 bits, so that
/// it can't wrap around to a valid one.
template <class N> constexpr ssize_t Count(N n) {
  if constexpr (sizeof(N) == sizeof(int64))
    return Saturated(static_cast<int64>(n));
  else
    return static_cast<ssize_t>(n);
}

/// Converts an argument to a code unit by its unsigned value: the char E9 is the char16 00E9 on every
/// processor.
template <class T, class X> [[gnu::always_inline]] inline T Unit(X x) {
  CheckConstant<T, true>(x);
  return static_cast<T>(UnsignedValue(x));
}

/// Converts an argument to the code unit that is searched for. kMore integers follow it in the call. If there
/// are two, they are an offset and a needle's length, and the argument was meant as a null pointer: such a
/// call doesn't compile.
template <class T, int kMore, class X> [[gnu::always_inline]] inline T UnitToFind(X x) {
  static_assert(kMore <= 1,
                "an empty needle is (nullptr, offset, 0): a literal 0 is a unit, never a pointer");
  CheckConstant<T, false>(x);
  return static_cast<T>(UnsignedValue(x));
}

} // namespace detail

} // namespace mirel

/// Stands after the parameters of an overload that takes a code unit x. With clang it refuses a constant x
/// that has too many bits, at any optimisation level. With g++, CheckConstant() refuses it, or warns if it
/// is searched for, but only where the compiler optimises.
#ifdef __clang__
#define MIREL_FITS(T, x)                                                                                     \
  _Pragma("clang diagnostic push") _Pragma("clang diagnostic ignored \"-Wgcc-compat\"")                      \
      __attribute__((diagnose_if(!::mirel::detail::HasBitsFor<T>(x), MIREL_TOO_MANY_BITS, "error")))         \
      _Pragma("clang diagnostic pop")
#else
#define MIREL_FITS(T, x)
#endif
