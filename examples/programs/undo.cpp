// A text buffer in UTF-16 for an editor: every edit can be undone and redone, and backspace erases a code
// point, not half of a surrogate pair.

#include <iostream>
#include <utility>
#include <vector>

#include <utils/Std.h>
#include <utils/Utf.h>

using mirel::mstring16;
using mirel::ssize_t;
using mirel::string16;
using mirel::string8;

class Buffer {
public:
  const string16& Text() const { return m_text; }

  /// Replaces n units from index i on with a text.
  void Replace(ssize_t i, ssize_t n, const string16& by) {
    m_undone.clear();
    m_done.push_back(Exchange({i, by, n}));
  }
  void Append(const string16& text) { Replace(m_text.size(), 0, text); }

  void Backspace() {
    const auto points = mirel::CodePoints(m_text);
    if (points.empty())
      return;
    auto last = points.end();
    --last;
    Replace(last.position(), m_text.size() - last.position(), {});
  }

  bool Undo() { return Step(m_done, m_undone); }
  bool Redo() { return Step(m_undone, m_done); }

private:
  /// Replaces n units from index i on with a text. Vectors of edits grow without copying text.
  struct Edit {
    ssize_t i;
    mstring16 text;
    ssize_t n;
  };

  /// Makes an edit and returns the one that undoes it.
  Edit Exchange(const Edit& edit) {
    Edit reverse = {edit.i, m_text.substr(edit.i, edit.n), edit.text.size()};
    m_text.replace(edit.i, edit.n, edit.text);
    return reverse;
  }
  bool Step(std::vector<Edit>& from, std::vector<Edit>& to) {
    if (from.empty())
      return false;
    to.push_back(Exchange(from.back()));
    from.pop_back();
    return true;
  }

  string16 m_text;
  std::vector<Edit> m_done, m_undone;
};

int main() {
  Buffer buffer;
  const auto show = [&](const char* what) {
    string8 utf8;
    mirel::Utf8FromUtf16Lossy(utf8, buffer.Text());
    std::cout << what << ": <" << utf8 << "> " << buffer.Text().size() << " units\n";
  };
  buffer.Append(mirel::ToString16(u"Tiere: 🐟🐙"));
  show("append");
  buffer.Backspace();
  show("backspace");
  buffer.Replace(0, 5, mirel::ToString16(u"Fische"));
  show("replace");
  while (buffer.Undo())
    show("undo");
  buffer.Redo();
  buffer.Redo();
  show("redo twice");
  buffer.Append(mirel::ToString16(u"!"));
  std::cout << (buffer.Redo() ? "redone\n" : "nothing to redo\n");
  show("append");
}

/* Prints:
append: <Tiere: 🐟🐙> 11 units
backspace: <Tiere: 🐟> 9 units
replace: <Fische: 🐟> 10 units
undo: <Tiere: 🐟> 9 units
undo: <Tiere: 🐟🐙> 11 units
undo: <> 0 units
redo twice: <Tiere: 🐟> 9 units
nothing to redo
append: <Tiere: 🐟!> 10 units
*/
