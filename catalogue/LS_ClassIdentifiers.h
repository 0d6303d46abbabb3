// The class identifiers of the objects that the element factories make, and
// the driver identifiers and names under which the two masters register.
//
// Each accessor returns a function-local constant, made on first use
// (thread-safe) and never destroyed, whose attached name is the accessor's
// own; every call returns the same object. Which class an identifier makes is
// the business of the container helpers, not of this file.
#pragma once

#include "Export.h"

#include "String.h"
#include "UUID.h"

LS_EXPORT UUID const& CID_LS_Data();
LS_EXPORT UUID const& CID_LS_AppendList();
LS_EXPORT UUID const& CID_LS_Authentication();
LS_EXPORT UUID const& CID_LS_RegistrationOutbound();
LS_EXPORT UUID const& CID_LS_RegistrationInbound();
LS_EXPORT UUID const& CID_LS_MessageSubscription();
LS_EXPORT UUID const& CID_LS_CallOutbound();
LS_EXPORT UUID const& CID_LS_CallInbound();
LS_EXPORT UUID const& CID_LS_Identity();
LS_EXPORT UUID const& CID_LS_LocationService();
LS_EXPORT UUID const& CID_LS_MasterLocationService();
LS_EXPORT UUID const& CID_LS_AuthenticationService();
LS_EXPORT UUID const& CID_LS_MasterAuthenticationService();

LS_EXPORT UUID const& DID_MasterLocationService();
LS_EXPORT UUID const& DID_MasterAuthenticationService();

// The driver name under which the host registers a master and the lookups
// find it: IDriver::BUILD_DRIVER_NAME of baseName ("master-location-service"
// or "master-authentication-service") with 0, 0, 0xFFFFFFFF and four empty
// texts.
LS_EXPORT String LS_masterDriverName(char const* baseName);
