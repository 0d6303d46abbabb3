#include "LS_CInbound.h"

#include "LS_Debug.h"
#include "LS_FaceInfo.h"
#include "LS_ListPosition.h"

namespace {

// Made once: every read looks the key up.
String const& filterKey() {
  static String const key("filter");
  return key;
}

XCode copyOut(Vector<LS_FilterRule> const* list,
              unsigned int index,
              LS_FilterType::Type& type,
              IpAddress& address) {
  if (!list || index >= list->size())
    return XCode::failure();
  type = (*list)[index].type;
  address = (*list)[index].address;
  return XCode::success();
}

unsigned int lengthOf(Vector<LS_FilterRule> const* list) {
  return list ? static_cast<unsigned int>(list->size()) : 0;
}

// "accept any" for the empty address, else "deny 10.0.0.0 255.0.0.0".
String ruleText(LS_FilterType::Type type, IpAddress const& address) {
  if (address.isEmpty())
    return String().format("%s any", LS_FilterType::NAME(type));
  String ipAddress;
  String netMask;
  address.getIpAddrAsString(ipAddress);
  address.getNetMaskAsString(netMask);
  return String().format("%s %s %s", LS_FilterType::NAME(type), ipAddress.c_str(), netMask.c_str());
}

}  // namespace

LS_CInbound::LS_CInbound() {
  LS_DEBUG("LS_CInbound(%p)::LS_CInbound()\n", logAddress());
}

LS_CInbound::~LS_CInbound() {
  LS_DEBUG("LS_CInbound(%p)::~LS_CInbound()\n", logAddress());
}

Vector<LS_FilterRule> const* LS_CInbound::filterRules(LS_Strategy::Type strategy) const {
  return valueIn<Vector<LS_FilterRule>>(filterKey(), strategy);
}

Vector<LS_FilterRule>* LS_CInbound::ownFilterRules() {
  return ownValue<Vector<LS_FilterRule>>(filterKey());
}

unsigned int LS_CInbound::getNumberOfConfigFilterRules() const {
  return lengthOf(filterRules(LS_Strategy::LOCAL_ONLY));
}

XCode LS_CInbound::getConfigFilterRule(unsigned int index,
                                       LS_FilterType::Type& type,
                                       IpAddress& address) const {
  return copyOut(filterRules(LS_Strategy::LOCAL_ONLY), index, type, address);
}

XCode LS_CInbound::modifyConfigFilterRule(unsigned int index,
                                          LS_FilterType::Type type,
                                          IpAddress const& address) {
  Vector<LS_FilterRule>* const list = ownFilterRules();
  if (!list || index >= list->size())
    return XCode::failure();
  (*list)[index] = LS_FilterRule{type, address};
  changeElement(filterKey());
  return XCode::success();
}

XCode LS_CInbound::insertConfigFilterRule(unsigned int index,
                                          LS_FilterType::Type type,
                                          IpAddress const& address) {
  Vector<LS_FilterRule>* const list = ownValueCreated<Vector<LS_FilterRule>>(filterKey());
  if (!list)
    return XCode::failure();
  LS_insertClamped(*list, index, LS_FilterRule{type, address});
  changeElement(filterKey());
  return XCode::success();
}

void LS_CInbound::removeConfigFilterRule(unsigned int index) {
  Vector<LS_FilterRule>* const list = ownFilterRules();
  if (!list || index >= list->size())
    return;
  list->remove(index);
  if (list->isEmpty())
    removeValue(filterKey());
  // After the list went away this finds no own child and does nothing; the
  // removal has announced itself.
  changeElement(filterKey());
}

unsigned int LS_CInbound::getNumberOfFilterRules() const {
  return lengthOf(filterRules(LS_Strategy::LOCAL_OR_BASE));
}

XCode LS_CInbound::getFilterRule(unsigned int index, LS_FilterType::Type& type, IpAddress& address) const {
  return copyOut(filterRules(LS_Strategy::LOCAL_OR_BASE), index, type, address);
}

InfoContainer& LS_CInbound::getInfo(InfoContainer& info,
                                    unsigned int maxLevel,
                                    unsigned int level,
                                    unsigned int maxDetail,
                                    unsigned int detail,
                                    String const&) const {
  LS_FaceInfo const rows(info, maxLevel, maxDetail, detail);
  unsigned int const count = getNumberOfFilterRules();
  if (count == 0 || !rows.accepts(level + 1))
    return info;

  rows.add(level + 1, "Filter", String());
  for (unsigned int index = 0; index < count; ++index) {
    LS_FilterType::Type type = LS_FilterType::ACCEPT;
    IpAddress address;
    if (getFilterRule(index, type, address).isSuccess())
      rows.add(level + 2, ruleText(type, address), String());
  }
  return info;
}
