// The program of debugger_test.py: valid objects, corrupt ones, and a function to stop in.

#include <cstdlib>

#include <utils/MovableString.h>

namespace {

template <class T> void Break(T& object, const void* buffer, mirel::ssize_t size, mirel::ssize_t capacity) {
  void* const memory = &object;
  static_cast<mirel::VectorOfByte*>(memory)->m_buffer = static_cast<mirel::uint8*>(const_cast<void*>(buffer));
  static_cast<mirel::VectorOfByte*>(memory)->size_ = size;
  static_cast<mirel::VectorOfByte*>(memory)->m_capacity = capacity;
}

[[gnu::noinline]] void Stop(const void*) { std::_Exit(0); }

} // namespace

int main() {
  const char utf8[] = u8"Grüße\t\"\U0001f600\u202e";
  const mirel::string8 text(utf8);
  mirel::string16 wide;
  mirel::Utf16FromUtf8(wide, utf8);
  mirel::xvector<char> malformed{'a', '\xff', '\xed', '\xa0', '\x80', 'z', '\xe2', '\x82'};
  const mirel::xvector<mirel::char16> lone{'a', 0xdc00, 'b', 0xd83d};
  const mirel::VectorOfByte bytes{0, '1', 27};
  const mirel::xstring& alias = text;
  mirel::string8 empty;
  mirel::mstring16 movable(wide);
  mirel::string16 long_text(1000, 0x20ac);
  long_text.reserve(5000);
  mirel::string8 negative, above, nowhere, unreadable, wrapping, huge;
  mirel::string16 odd;
  Break(negative, utf8, -1, 8);
  Break(above, utf8, 9, 8);
  Break(odd, utf8, 3, 8);
  Break(nowhere, nullptr, 3, 8);
  Break(unreadable, reinterpret_cast<void*>(16), 3, 8);
  Break(wrapping, reinterpret_cast<void*>(-2), 3, 8);
  Break(huge, utf8, mirel::ssize_t(1) << 62, mirel::ssize_t(1) << 62);
  Stop(&alias);
}
