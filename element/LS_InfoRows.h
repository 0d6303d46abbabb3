// LS_InfoRows: the rule every diagnostic dump of the library follows when it
// adds a row: a row at some level goes in only when that level is within
// maxLevel and the call's detail within maxDetail, so a dump cut at a level
// leaves out everything deeper, headings included. Which rows an object
// shows, and in what order, belongs to the object.
#pragma once

#include "Export.h"

#include "InfoContainer.h"
#include "String.h"

class LS_EXPORT LS_InfoRows {
 public:
  LS_InfoRows(InfoContainer& info, unsigned int maxLevel, unsigned int maxDetail, unsigned int detail)
      : m_info(info), m_maxLevel(maxLevel), m_maxDetail(maxDetail), m_detail(detail) {}

  bool accepts(unsigned int level) const { return level <= m_maxLevel && m_detail <= m_maxDetail; }
  void add(unsigned int level, String const& key, String const& value) const {
    if (accepts(level))
      m_info.add(level, m_detail, key, value);
  }

 private:
  InfoContainer& m_info;
  unsigned int m_maxLevel;
  unsigned int m_maxDetail;
  unsigned int m_detail;
};
