#include "LS_ClassIdentifiers.h"

#include "IDriver.h"

#define LS_DEFINE_CLASS_IDENTIFIER(Accessor, text) \
  UUID const& Accessor() {                         \
    static UUID const id(text, #Accessor);         \
    return id;                                     \
  }

LS_DEFINE_CLASS_IDENTIFIER(CID_LS_Data, "b2b53df7-9b4e-4b87-91bc-b17ce42776d5")
LS_DEFINE_CLASS_IDENTIFIER(CID_LS_AppendList, "c55b31ef-4559-4920-99fd-623b2b9ffe48")
LS_DEFINE_CLASS_IDENTIFIER(CID_LS_Authentication, "d13ee0d1-5ea5-4f67-b639-14269517b322")
LS_DEFINE_CLASS_IDENTIFIER(CID_LS_RegistrationOutbound, "c307765b-7e9a-4f7b-b438-f0539f6d572f")
LS_DEFINE_CLASS_IDENTIFIER(CID_LS_RegistrationInbound, "d6dfcf79-fea9-4fc8-b842-6741a1c698cb")
LS_DEFINE_CLASS_IDENTIFIER(CID_LS_MessageSubscription, "1e2061d8-352d-4bb0-b91f-ad634d38215b")
LS_DEFINE_CLASS_IDENTIFIER(CID_LS_CallOutbound, "bc1383f5-e09b-443e-8b12-d293252129b5")
LS_DEFINE_CLASS_IDENTIFIER(CID_LS_CallInbound, "416be71a-1322-4a7b-a6f2-f8071abffb45")
LS_DEFINE_CLASS_IDENTIFIER(CID_LS_Identity, "a4fd1732-f7f0-4460-99d3-de5e67113bc1")
LS_DEFINE_CLASS_IDENTIFIER(CID_LS_LocationService, "35d8fb06-a9cb-46d5-9c03-1895e374a5aa")
LS_DEFINE_CLASS_IDENTIFIER(CID_LS_MasterLocationService, "1b7a1326-7611-4bd9-93be-c533d48741f3")
LS_DEFINE_CLASS_IDENTIFIER(CID_LS_AuthenticationService, "eb3ca04d-b15a-47be-b5b8-7f269b8496c9")
LS_DEFINE_CLASS_IDENTIFIER(CID_LS_MasterAuthenticationService, "f4946952-0b3e-4c63-9e44-0d9cd98f8c15")
LS_DEFINE_CLASS_IDENTIFIER(DID_MasterLocationService, "ae0010e5-648d-415f-9c83-2003bd677420")
LS_DEFINE_CLASS_IDENTIFIER(DID_MasterAuthenticationService, "b1cea50b-3642-4cef-a6f5-845eb242a05d")

String LS_masterDriverName(char const* baseName) {
  String name;
  IDriver::BUILD_DRIVER_NAME(name, baseName, 0, 0, 0xFFFFFFFFu, String(), String(), String(), String());
  return name;
}
