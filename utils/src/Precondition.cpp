// The facility behind `assert` is declared only while NDEBUG isn't defined.
#undef NDEBUG
#include <assert.h>

#include <utils/Precondition.h>

namespace mirel {

void AssertionFailed(const char* expression, const char* file, int line, const char* function) {
#ifdef __ANDROID__
  __assert2(file, line, function, expression);
#else
  __assert_fail(expression, file, static_cast<unsigned>(line), function);
#endif
}

} // namespace mirel
