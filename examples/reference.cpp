// The examples of the reference: one for each class and each group of members, named as in the headers.

#undef NDEBUG
#include <cassert>
#include <cstdio>
#include <map>
#include <unordered_map>
#include <vector>

#include <utils/Kernels.h>
#include <utils/Std.h>
#include <utils/Utf.h>
#include <utils/xostream.h>

using namespace mirel;

void Buffers() {
  // [VectorOfByte]
  VectorOfByte bytes;
  bytes.push_back(uint16(7)); // the two bytes of a number
  bytes.insert(bytes.end(), 3, 0xFF);
  assert(bytes.size() == 5 && bytes.back() == 0xFF);
  // [VectorOfByte]

  // [bytes construction]
  VectorOfByte b = {1, 2, 3};
  VectorOfByte zeros(8, 0);
  b.swap(zeros);
  // [bytes construction]
  assert(b.size() == 8);

  // [bytes capacity]
  b.reserve(100);
  b.growbytes(2); // to be overwritten
  b.clear();
  assert(b.empty() && b.capacity() == 100);
  // [bytes capacity]

  // [bytes access]
  b = {1, 2, 3};
  b[0] = b.back();
  for (uint8& byte : b)
    byte += 1;
  // [bytes access]
  assert((b == VectorOfByte{4, 3, 4}));

  // [bytes assigning]
  const uint8 more[] = {5, 6};
  b.assign(more, more + 2);
  b += b;
  b.pop_back(1);
  assert((b == VectorOfByte{5, 6, 5}));
  // [bytes assigning]

  // [bytes inserting]
  b.insert(1, 2, 0); // before offset 1, two zeros
  b.insert(0, more, more + 2);
  // [bytes inserting]
  assert((b == VectorOfByte{5, 6, 5, 0, 0, 6, 5}));

  // [bytes moving]
  b.move(0, 5, 2); // 6, 5 to the beginning
  b.erase(2, 4);
  assert((b == VectorOfByte{6, 5, 5}));
  // [bytes moving]

  // [bytes comparison]
  assert(b.compare(1, 1, more, 1) == 0); // one byte from offset 1 on
  // [bytes comparison]

  // [bytes relations]
  assert((VectorOfByte{1, 2} < VectorOfByte{1, 2, 0}));
  // [bytes relations]
}

void Ranges() {
  const std::string_view text = "one two", needle = "two";
  // [comparing ranges]
  assert(IsPrefix(text.begin(), text.end(), needle.begin(), needle.end()) == false);
  assert(LexicographicalCompareX(text.begin(), text.end(), needle.begin(), needle.end()) < 0);
  // [comparing ranges]

  // [searching ranges]
  const char* const end = text.data() + text.size();
  assert(Find(text.data(), end, 'w') == text.data() + 5);
  assert(FindFirstSubSequence(text.begin(), text.end(), needle.begin(), needle.end()) == text.begin() + 4);
  // [searching ranges]

  // [element ranges]
  char16 units[4];
  p_create(units, units + 4, char16(u'x'));
  p_copy(units, &units[2], &units[3]);
  p_del(units, units + 4);
  // [element ranges]
}

void Vectors() {
  // [xvector]
  xvector<char16> v = {1, 2, 3};
  v.insert(1, 2, 9); // before index 1, two elements of value 9
  assert(v.size() == 5 && v[2] == 9);
  // [xvector]

  // [types]
  xvector<char16>::size_type i = v.find(7); // signed
  assert(i == xvector<char16>::npos);
  // [types]

  // [construction]
  xvector<char16> tail(v, 3, 2); // two elements from index 3 on
  xvector<char16> nines(4, 9);
  tail.swap(nines);
  // [construction]
  assert(tail.size() == 4);

  // [capacity]
  v.reserve(100);
  v.resize(7, 0); // two zeros are added
  assert(v.capacity() == 100 && v.back() == 0);
  // [capacity]

  // [access]
  v[0] = 5;
  assert(v.front() == 5 && v.data() + v.size() == v.data_end());
  // [access]

  // [iterators]
  for (char16& x : v)
    x = static_cast<char16>(x + 1);
  assert(*v.rbegin() == 1);
  // [iterators]

  // [reverse iterators]
  for (auto it = v.rbegin(); it != v.rend(); ++it)
    *it = 0; // from the last element to the first
  // [reverse iterators]
  assert(v.front() == 0);

  // [assignment]
  const char list[] = {1, 2, 3};
  v.assign(list, list + 3); // any iterators
  v.assign(v, 1, 2);
  assert(v.size() == 2 && v[0] == 2);
  // [assignment]

  // [appending]
  v.push_back(4);
  v.append(2, 5);
  v += v; // an argument may be the vector itself
  v *= 2;
  // [appending]
  assert(v.size() == 20);

  // [moving]
  v.move(0, 2, 3); // three elements from index 2 to index 0
  // [moving]
  assert(v[0] == 4);

  // [inserting]
  v.insert(0, 7);
  v.insert(v.begin() + 1, 8);
  v.insert(2, list, list + 3);
  // [inserting]
  assert(v[4] == 3);

  // [replacing]
  v.replace(0, 5, 1, 6); // five elements with one of value 6
  // [replacing]
  assert(v[0] == 6);

  // [erasing]
  v.erase_element(0);
  v.erase(0, 3);
  const ssize_t fives = v.FindAndErase(5);
  // [erasing]
  assert(fives == 8);

  // [comparison]
  assert(v._Eq(xvector<char16>(v)) && v.compare(0, 1, v) < 0);
  // [comparison]

  // [search]
  const xvector<char16> w = {1, 2, 3, 2, 1}, set = {3, 2};
  assert(w.find(2) == 1 && w.rfind(2) == 3 && w.find(2, 2) == 3);
  assert(w.find(set) == 2 && w.find_last_of(set) == 3);
  // [search]
}

void Strings() {
  // [basic_xstring]
  string8 text = "Grüße";
  text += " an alle";
  text.replace(text.find("alle"), 4, "dich");
  std::printf("%s has %td bytes\n", text.c_str(), text.size());
  // [basic_xstring]

  // [string construction]
  string8 part(text, 0, 7), line(20, '-'), bytes("a\0b", 3);
  // [string construction]
  assert(part.size() + line.size() + bytes.size() == 30);

  // [string assignment]
  line = "short"; // keeps the storage
  string8(line).swap(line);
  assert(line.capacity() == 5); // now it has no more than it needs
  // [string assignment]

  // [null termination]
  std::puts(line.c_str()); // valid until the next change
  // [null termination]

  // [string edits]
  line.append(" and ").append("long");
  line.insert(0, "not ");
  line.replace(4, 5, "too");
  // [string edits]
  assert(line._Eq("not too and long"));

  // [string comparison]
  assert(line.compare(0, 3, "not") == 0 && line._Lt("z"));
  // [string comparison]

  // [string search]
  const ssize_t space = line.find_first_of(" \t");
  assert(line.substr(space + 1, 3)._Eq("too"));
  assert(line.find("short") == string8::npos);
  // [string search]

  // [MovableString]
  std::vector<mstring8> words; // grows and sorts without copying text
  words.push_back(mstring8("two"));
  words.push_back(line.substr(0, 3));
  // [MovableString]
  assert(words[1] == "not");
}

void Text() {
  // [conversions]
  string16 wide;
  if (!Utf16FromUtf8(wide, "Grüße"))
    std::puts("malformed"); // and wide holds what precedes it
  string8 text;
  Utf8FromUtf16(text, wide.data(), wide.size());
  // [conversions]
  assert(text == "Grüße");

  const std::string_view input = "caf\xC3\xA9 \xC0\xAF";
  // [checking]
  const ssize_t at = FindMalformed(input);
  assert(at == 6 && !IsWellFormed(input));
  const MalformedText fault = ExplainMalformed(input, at);
  std::printf("%s at byte %jd\n", Describe(fault.reason), fault.offset);
  // [checking]

  // [counting]
  assert(CountCodePoints("Grüße") == 5 && Utf16Length("Grüße") == 5 && Utf8Length(wide) == 7);
  // [counting]

  // [strict conversions]
  assert(Utf16FromUtf8(wide, input) == false && wide.size() == 5);
  // [strict conversions]

  // [appending conversions]
  AppendUtf16(wide, "Grüße");
  AppendUtf8(text, wide);
  // [appending conversions]

  // [lossy conversions]
  assert(Utf16FromUtf8Lossy(wide, input) == 2); // C0 and AF have become U+FFFD
  // [lossy conversions]

  // [code points]
  for (const char32_t c : CodePoints(wide))
    AppendCodePoint(text, c);
  // [code points]

  // [code point iterators]
  const auto points = CodePoints(input);
  for (auto it = points.begin(); it != points.end(); ++it)
    if (it.isMalformed())
      std::printf("malformed at unit %td\n", it.position());
  // [code point iterators]

  // [streams]
  Utf8Stream stream(OnMalformed::kReplace);
  string16 received;
  stream.Append(received, "Gr\xC3"); // a piece may end within a sequence
  stream.Append(received, "\xBC\xC3\x9F");
  assert(stream.Finish(received) && received.size() == 4);
  // [streams]
}

void Standard() {
  string8 text = "b";
  // [operators]
  assert(text == "b" && text < std::string_view("c") && "a" != text);
  // [operators]

  // [keys]
  std::map<string8, int, Less> counts;
  ++counts[text];
  assert(counts.count("b") == 1); // searched without making a string
  std::unordered_map<string8, int, Hash, Equal> unordered;
  ++unordered[text];
  // [keys]

  // [views]
  const std::string standard = ToString(text);
  text = ToString8(standard);
  assert(View(text) == "b" && ToString16(u"ß").size() == 1);
  // [views]
}

// [sinks]
struct StringSink : IOutputStream {
  void WriteStream(const void* address, ssize_t count) override {
    text.append(static_cast<const char*>(address), count);
  }
  void FlushStream() override {}
  string8 text;
};
// [sinks]

void Streams() {
  // [xostream]
  StringSink sink;
  xostream os(sink);
  os << string8("n = ");
  os.put(42);
  os.endl();
  assert(sink.text == "n = 42\n");
  // [xostream]

  // [writing bytes]
  os.write("a\0b", 3);
  // [writing bytes]

  // [writing values]
  os.width(6); // of the next value
  os.put(1.5);
  os.put(U'ß');
  // [writing values]

  // [line ends]
  os.endl();
  os.flush();
  // [line ends]

  // [format]
  os.Indent(2);
  os.put("one\ntwo");
  // [format]
  assert(sink.text == string8("n = 42\na\0b   1.5ß\n  one\n  two", 30));

  // [closing]
  os.close();
  os.put("nothing is written any more");
  // [closing]
  assert(sink.text.size() == 30);
}

int main() {
  Buffers();
  Ranges();
  Vectors();
  Strings();
  Text();
  Standard();
  Streams();
  std::printf("%s\n", KernelName());
}
