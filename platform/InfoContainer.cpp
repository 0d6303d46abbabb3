#include "InfoContainer.h"

void InfoContainer::add(unsigned int level, unsigned int detail, String const& key, String const& value) {
  m_lines.add(Line{level, detail, key, value});
}

String InfoContainer::toText() const {
  String text;
  for (Line const& line : m_lines) {
    for (unsigned int i = 0; i < line.level; ++i)
      text.append("  ");
    text.append(line.key);
    if (!line.value.isEmpty())
      text.append(": ").append(line.value);
    text.append("\n");
  }
  return text;
}
