// The class identifiers of the objects that the element factories make, and
// the driver identifiers and names under which the two masters register.
//
// Each accessor returns a function-local constant, made on first use
// (thread-safe) and never destroyed, whose attached name is the accessor's
// own; every call returns the same object. Which class an identifier makes is
// the business of the container helpers, not of this file.
#pragma once

#include "String.h"
#include "UUID.h"

UUID const& CID_LS_Data();
UUID const& CID_LS_AppendList();
UUID const& CID_LS_Authentication();
UUID const& CID_LS_RegistrationOutbound();
UUID const& CID_LS_RegistrationInbound();
UUID const& CID_LS_MessageSubscription();
UUID const& CID_LS_CallOutbound();
UUID const& CID_LS_CallInbound();
UUID const& CID_LS_Identity();
UUID const& CID_LS_LocationService();
UUID const& CID_LS_MasterLocationService();
UUID const& CID_LS_AuthenticationService();
UUID const& CID_LS_MasterAuthenticationService();

UUID const& DID_MasterLocationService();
UUID const& DID_MasterAuthenticationService();

// The driver name under which the host registers a master and the lookups
// find it: IDriver::BUILD_DRIVER_NAME of baseName ("master-location-service"
// or "master-authentication-service") with 0, 0, 0xFFFFFFFF and four empty
// texts.
String LS_masterDriverName(char const* baseName);
