// Reads a table of comma-separated values, sorts its rows by a column, and looks some up by their first
// field.

#include <algorithm>
#include <cstdlib>
#include <fstream>
#include <iomanip>
#include <iostream>
#include <map>
#include <utility>
#include <vector>

#include <utils/Std.h>

using mirel::mstring8;
using mirel::ssize_t;
using mirel::string8;

using Row = std::vector<mstring8>; // its fields move, so a table grows and is sorted without copying text

/// Parses a table whose lines end with a newline. As in RFC 4180, quoted fields may have commas, line ends
/// and doubled quotes.
std::vector<Row> Parse(const string8& text) {
  std::vector<Row> rows;
  Row row;
  mstring8 field;
  bool isQuoted = false;
  for (ssize_t i = 0; i < text.size(); ++i) {
    const char unit = text[i];
    if (isQuoted && unit == '"' && i + 1 < text.size() && text[i + 1] == '"') {
      field += text[++i];
    } else if (unit == '"') {
      isQuoted = !isQuoted;
    } else if (isQuoted || (unit != ',' && unit != '\n')) {
      field += unit;
    } else {
      row.push_back(std::exchange(field, {}));
      if (unit == '\n')
        rows.push_back(std::exchange(row, {}));
    }
  }
  return rows;
}

void Print(const Row& row) {
  for (const mstring8& field : row)
    std::cout << std::setw(16) << field;
  std::cout << '\n';
}

int main(int argc, char** argv) {
  std::ifstream file(argc > 2 ? argv[1] : "", std::ios::binary);
  string8 text;
  while (mirel::FillFrom(text, 65536, [&](char* p, ssize_t n) { return file.read(p, n).gcount(); }) > 0)
    ;
  std::vector<Row> rows = Parse(text);
  if (rows.empty()) {
    std::cerr << "usage: csv FILE COLUMN [KEY...]\n";
    return EXIT_FAILURE;
  }

  const Row header = std::move(rows.front());
  rows.erase(rows.begin());
  const auto column =
      static_cast<std::size_t>(std::find(header.begin(), header.end(), argv[2]) - header.begin());
  const auto isOther = [&](const Row& row) { return row.size() != header.size(); };
  if (column == header.size() || std::any_of(rows.begin(), rows.end(), isOther)) {
    std::cerr << "there is no such column in each row\n";
    return EXIT_FAILURE;
  }

  std::stable_sort(rows.begin(), rows.end(),
                   [&](const Row& a, const Row& b) { return a[column] < b[column]; });
  Print(header);
  for (const Row& row : rows)
    Print(row);

  std::map<mstring8, const Row*, mirel::Less> byFirst;
  for (const Row& row : rows)
    byFirst.emplace(row.front(), &row);
  for (int i = 3; i < argc; ++i) {
    const auto found = byFirst.find(argv[i]);
    std::cout << "-> ";
    if (found != byFirst.end())
      Print(*found->second);
    else
      std::cout << argv[i] << " isn't there\n";
  }
}

/* Prints:
            name            town           berth
        Seestern   "Alt" Hamburg              12
        Albatros            Kiel               3
           Möwe      Kiel, Nord               7
->            Möwe      Kiel, Nord               7
-> Krake isn't there
*/
