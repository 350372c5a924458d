#include <utils/xstring.h>

#include <utils/xostream.h>

namespace mirel {

template class xvector<char8>;
template class basic_xstring<char8>;
template class xvector<char16>;
template class basic_xstring<char16>;

void HackToForcexstringIntoUtilsDll() {
  string8 s1;
  string16 s2;
}

xostream& operator<<(xostream& os, const string8& v) {
  os.write(v.data(), v.size());
  return os;
}

} // namespace mirel
