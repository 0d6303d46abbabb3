// LS_CCallFace<Self, Base>: what the inbound and the outbound call face have
// in common, the names of the VoIP, tone-set and SIP profiles that calls of
// the identity use ("voip-profile", "tone-set-profile", "sip-profile", one
// text each). Self supplies its log formats (LOG_FORMATS) and its dump
// heading (INFO_HEADING); Base is the inbound or the outbound face, whose settings,
// dump rows and value helpers (setValue, removeValue, readValue,
// readValueOr) the call face takes over.
//
// Decision: the two call faces are one template instead of two copies,
// because they differ only in base, log texts and dump heading; each
// concrete class still derives from CInherit<Self, Base, LS_ICallConfig,
// LS_ICall> (through this template), so its interfaces and queryInterface
// are exactly those of a hand-written face. Each class writes its log
// formats out in full, so that every line it prints can be found in the code
// as printed.
//
// Config getters read "localOnly", effective getters "localOrBase"; an empty
// name is stored like any other and hides the inherited one. Ownership and
// threading are those of Base. What the profiles are does not belong here.
#pragma once

#include "CInherit.h"
#include "LS_Debug.h"
#include "LS_ElementClassTable.h"
#include "LS_FaceInfo.h"
#include "LS_ICall.h"
#include "LS_ICallConfig.h"
#include "LS_Strategy.h"

// The keys of the profile names, made once: every read looks one up.
struct LS_CallProfileKeys {
  String const voipProfile{"voip-profile"};
  String const toneSetProfile{"tone-set-profile"};
  String const sipProfile{"sip-profile"};

  static LS_CallProfileKeys const& get() {
    static LS_CallProfileKeys const keys;
    return keys;
  }
};

// The log formats of one call face, each with the face's address first and
// the profile name, where there is one, second.
struct LS_CallFaceLogFormats {
  char const* constructed;
  char const* destroyed;
  char const* setVoipProfile;
  char const* removeVoipProfile;
  char const* setToneSetProfile;
  char const* removeToneSetProfile;
  char const* setSipProfile;
  char const* removeSipProfile;
};

template <class Self, class Base>
class LS_CCallFace : public CInherit<Self, Base, LS_ICallConfig, LS_ICall> {
 public:
  LS_CCallFace();
  ~LS_CCallFace() override;

  // LS_IElement
  XCode create(RefPtr<LS_IElement>& element) override { return LS_makeElement<Self>(element); }

  // LS_ICallConfig
  XCode getConfigVoipProfile(String& profile) const override;
  void setConfigVoipProfile(String const& profile) override;
  void removeConfigVoipProfile() override;
  XCode getConfigToneSetProfile(String& profile) const override;
  void setConfigToneSetProfile(String const& profile) override;
  void removeConfigToneSetProfile() override;
  XCode getConfigSipProfile(String& profile) const override;
  void setConfigSipProfile(String const& profile) override;
  void removeConfigSipProfile() override;

  // LS_ICall
  String getVoipProfile() const override;
  String getToneSetProfile() const override;
  String getSipProfile() const override;

  // IInfo: the heading (after prefix) at level, Base's rows, then each
  // effective profile name that is not empty at level + 1.
  InfoContainer& getInfo(InfoContainer& info,
                         unsigned int maxLevel,
                         unsigned int level,
                         unsigned int maxDetail,
                         unsigned int detail,
                         String const& prefix) const override;

 private:
  static LS_CallProfileKeys const& keys() { return LS_CallProfileKeys::get(); }
  static LS_CallFaceLogFormats const& formats() { return Self::LOG_FORMATS; }
};

template <class Self, class Base>
LS_CCallFace<Self, Base>::LS_CCallFace() {
  LS_DEBUG(formats().constructed, this->logAddress());
}

template <class Self, class Base>
LS_CCallFace<Self, Base>::~LS_CCallFace() {
  LS_DEBUG(formats().destroyed, this->logAddress());
}

template <class Self, class Base>
XCode LS_CCallFace<Self, Base>::getConfigVoipProfile(String& profile) const {
  return this->readValue(keys().voipProfile, LS_Strategy::LOCAL_ONLY, profile);
}

template <class Self, class Base>
void LS_CCallFace<Self, Base>::setConfigVoipProfile(String const& profile) {
  LS_DEBUG(formats().setVoipProfile, this->logAddress(), profile.c_str());
  this->setValue(keys().voipProfile, profile);
}

template <class Self, class Base>
void LS_CCallFace<Self, Base>::removeConfigVoipProfile() {
  LS_DEBUG(formats().removeVoipProfile, this->logAddress());
  this->removeValue(keys().voipProfile);
}

template <class Self, class Base>
XCode LS_CCallFace<Self, Base>::getConfigToneSetProfile(String& profile) const {
  return this->readValue(keys().toneSetProfile, LS_Strategy::LOCAL_ONLY, profile);
}

template <class Self, class Base>
void LS_CCallFace<Self, Base>::setConfigToneSetProfile(String const& profile) {
  LS_DEBUG(formats().setToneSetProfile, this->logAddress(), profile.c_str());
  this->setValue(keys().toneSetProfile, profile);
}

template <class Self, class Base>
void LS_CCallFace<Self, Base>::removeConfigToneSetProfile() {
  LS_DEBUG(formats().removeToneSetProfile, this->logAddress());
  this->removeValue(keys().toneSetProfile);
}

template <class Self, class Base>
XCode LS_CCallFace<Self, Base>::getConfigSipProfile(String& profile) const {
  return this->readValue(keys().sipProfile, LS_Strategy::LOCAL_ONLY, profile);
}

template <class Self, class Base>
void LS_CCallFace<Self, Base>::setConfigSipProfile(String const& profile) {
  LS_DEBUG(formats().setSipProfile, this->logAddress(), profile.c_str());
  this->setValue(keys().sipProfile, profile);
}

template <class Self, class Base>
void LS_CCallFace<Self, Base>::removeConfigSipProfile() {
  LS_DEBUG(formats().removeSipProfile, this->logAddress());
  this->removeValue(keys().sipProfile);
}

template <class Self, class Base>
String LS_CCallFace<Self, Base>::getVoipProfile() const {
  return this->readValueOr(keys().voipProfile, String());
}

template <class Self, class Base>
String LS_CCallFace<Self, Base>::getToneSetProfile() const {
  return this->readValueOr(keys().toneSetProfile, String());
}

template <class Self, class Base>
String LS_CCallFace<Self, Base>::getSipProfile() const {
  return this->readValueOr(keys().sipProfile, String());
}

template <class Self, class Base>
InfoContainer& LS_CCallFace<Self, Base>::getInfo(InfoContainer& info,
                                                 unsigned int maxLevel,
                                                 unsigned int level,
                                                 unsigned int maxDetail,
                                                 unsigned int detail,
                                                 String const& prefix) const {
  LS_FaceInfo const rows(info, maxLevel, maxDetail, detail);
  rows.add(level, String(prefix).append(Self::INFO_HEADING), String());
  Base::getInfo(info, maxLevel, level, maxDetail, detail, String());
  if (!rows.accepts(level + 1))
    return info;

  struct ProfileRow {
    char const* key;
    String text;
  };
  for (ProfileRow const& row :
       {ProfileRow{"VoIP Profile", getVoipProfile()}, ProfileRow{"Tone-Set Profile", getToneSetProfile()},
        ProfileRow{"SIP Profile", getSipProfile()}}) {
    if (!row.text.isEmpty())
      rows.add(level + 1, row.key, String().format("%s", row.text.c_str()));
  }
  return info;
}
