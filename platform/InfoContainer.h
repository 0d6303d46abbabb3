// InfoContainer: the lines of a diagnostic dump, in the order they were
// added. Each line is (level, detail, key, value): level is the depth in the
// dump's outline, detail how fine-grained the line is. Deciding which lines
// to add (the maxLevel and maxDetail filter) belongs to the dumping objects,
// not here.
#pragma once

#include "Export.h"

#include <cstddef>

#include "String.h"
#include "Vector.h"

class LS_EXPORT InfoContainer {
 public:
  struct Line {
    unsigned int level;
    unsigned int detail;
    String key;
    // Empty for a heading line.
    String value;
  };
  using const_iterator = Vector<Line>::const_iterator;

  void add(unsigned int level, unsigned int detail, String const& key, String const& value);

  size_t size() const { return m_lines.size(); }
  bool isEmpty() const { return m_lines.isEmpty(); }
  // index below size().
  Line const& operator[](size_t index) const { return m_lines[index]; }
  const_iterator begin() const { return m_lines.begin(); }
  const_iterator end() const { return m_lines.end(); }

  // The dump for people, one text line per line, each ending in "\n": two
  // blanks of indentation per level, then "key: value", or just "key" when
  // the value is empty. Detail is not shown.
  String toText() const;

 private:
  Vector<Line> m_lines;
};
