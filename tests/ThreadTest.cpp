// Threads may use different objects at the same time, and read one object that no thread changes.
#include "Support.h"

#include <thread>
#include <vector>

namespace {

template <class F> void InFourThreads(const F& work) {
  std::vector<std::thread> threads;
  for (int i = 0; i < 4; ++i)
    threads.emplace_back(work);
  for (std::thread& thread : threads)
    thread.join();
}

TEST(Thread, UsesItsOwnObjects) {
  InFourThreads([] {
    mirel::string16 wide;
    mirel::string8 text;
    for (int i = 0; i < 2000; ++i) {
      text.append("a\u20AC\U0001F600").c_str();
      ASSERT_TRUE(mirel::Utf16FromUtf8(wide, text.data(), text.size()));
      wide.insert(0, 3, u'b');
      ASSERT_TRUE(mirel::Utf8FromUtf16(text, wide.data(), wide.size()));
      ASSERT_EQ(text.FindAndErase('b'), 3);
      if (i % 50 == 0)
        text.erase();
    }
  });
}

TEST(Thread, ReadsASharedObject) {
  const mirel::string8 text = "never \u20AC changed";
  const mirel::string16 wide = Of<char16>("never changed");
  InFourThreads([&] {
    for (int i = 0; i < 2000; ++i) {
      mirel::string16 converted;
      ASSERT_TRUE(mirel::Utf16FromUtf8(converted, text.data(), text.size()));
      ASSERT_EQ(text.find("chan"), 10);
      ASSERT_EQ(text.rfind('n'), 13);
      ASSERT_EQ(text.compare(text), 0);
      ASSERT_EQ(wide.find_first_of(wide.begin() + 3, wide.end()), 0);
      ASSERT_TRUE(wide._Eq(mirel::string16(wide)));
      ASSERT_EQ(wide.substr(2, 5).size(), 5);
      ASSERT_EQ(wide[0], 'n');
      ASSERT_EQ(*wide.rbegin(), 'd');
    }
  });
}

} // namespace
