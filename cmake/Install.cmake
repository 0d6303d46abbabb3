# What `cmake --install` provides: the public headers under
# include/locationservice, both shared libraries with versioned SONAMEs, a
# CMake package (find_package(LocationService CONFIG) gives
# LocationService::locationservice, which brings its include directory and
# LocationService::ls_platform) and a pkg-config file.
#
# Public are the interfaces, value records, enumerations, identifiers, the
# lookup functions, the two masters, and every header these include, the
# platform declarations among them, and what a host uses of the platform
# to start the library: the driver repository, the debug monitor and the SIP
# stack's statistics. No implementation class but the masters is installed.
include(GNUInstallDirs)
include(CMakePackageConfigHelpers)

set(LS_PLATFORM_PUBLIC_HEADERS
  CBlob.h CDriver.h CDriverRepository.h DebugMonitor.h Export.h SipStatistics.h SystemRepository.h
  CHostPort.h CInherit.h CNameAddr.h CObject.h CSipUri.h CSocketAddr.h CString.h CTelUri.h
  IDriver.h IDriverRepository.h IInfo.h IUnknown.h InfoContainer.h IpAddress.h List.h Lock.h LockedPtr.h Marshaller.h
  ProtectedPtr.h RefPtr.h RegEx.h String.h StringHashTable.h UUID.h Vector.h XCode.h)
set(LS_PUBLIC_HEADERS
  authentication/LS_CMasterAuthenticationService.h
  authentication/LS_Credentials.h
  authentication/LS_IAuthentication.h
  authentication/LS_IAuthenticationConfig.h
  authentication/LS_IAuthenticationService.h
  authentication/LS_IMasterAuthenticationService.h
  catalogue/LS_AddressText.h
  catalogue/LS_Alias.h
  catalogue/LS_AliasRange.h
  catalogue/LS_Authenticate.h
  catalogue/LS_AuthenticationProtocol.h
  catalogue/LS_AuthenticationType.h
  catalogue/LS_ClassIdentifiers.h
  catalogue/LS_Contact.h
  catalogue/LS_DriverInterface.h
  catalogue/LS_FilterRule.h
  catalogue/LS_FilterType.h
  catalogue/LS_ForcedDestination.h
  catalogue/LS_IdentityFace.h
  catalogue/LS_IdentityType.h
  catalogue/LS_Imperative.h
  catalogue/LS_Interface.h
  catalogue/LS_InterfaceIdentifiers.h
  catalogue/LS_KeepAliveMethod.h
  catalogue/LS_LifetimeRange.h
  catalogue/LS_MethodTable.h
  catalogue/LS_MwiSubscriptionMode.h
  catalogue/LS_NatTraversalMethod.h
  catalogue/LS_ProtocolConfig.h
  catalogue/LS_ProtocolRealm.h
  catalogue/LS_Proxy.h
  catalogue/LS_RegistrationMode.h
  catalogue/LS_Strategy.h
  catalogue/LS_UriScheme.h
  catalogue/LS_User.h
  element/LS_IContainer.h
  element/LS_IContainerObserver.h
  element/LS_IElement.h
  element/LS_IElementObserver.h
  element/LS_InfoRows.h
  element/ObserverContainer.h
  element/ObserverDelegate.h
  element/ObserverEvent.h
  element/ObserverIndex.h
  faces/LS_ICall.h
  faces/LS_ICallConfig.h
  faces/LS_IInbound.h
  faces/LS_IInboundConfig.h
  faces/LS_IMwiSubscription.h
  faces/LS_IMwiSubscriptionConfig.h
  faces/LS_IOutbound.h
  faces/LS_IOutboundConfig.h
  faces/LS_IRegistrationInbound.h
  faces/LS_IRegistrationInboundConfig.h
  faces/LS_IRegistrationOutbound.h
  faces/LS_IRegistrationOutboundConfig.h
  location/LS_CMasterLocationService.h
  location/LS_IIdentity.h
  location/LS_IIdentityConfig.h
  location/LS_ILocationService.h
  location/LS_ILocationServiceConfig.h
  location/LS_ILocationServiceObserver.h
  location/LS_ILocationServiceSubject.h
  location/LS_IMasterLocationService.h
  location/LS_IMasterLocationServiceObserver.h
  location/LS_IMasterLocationServiceSubject.h
  location/LS_IMwiSubscriptionObserver.h
  location/LS_IMwiSubscriptionSubject.h
  location/LS_IRegistrationInboundObserver.h
  location/LS_IRegistrationInboundSubject.h
  location/LS_IRegistrationOutboundObserver.h
  location/LS_IRegistrationOutboundSubject.h
  lookup/LS_CredentialLookup.h
  lookup/LS_IdentityResolution.h
  lookup/LS_ServiceResolution.h)

list(TRANSFORM LS_PLATFORM_PUBLIC_HEADERS PREPEND platform/)
target_sources(ls_platform_shared PUBLIC FILE_SET HEADERS BASE_DIRS ${PROJECT_SOURCE_DIR}/platform
               FILES ${LS_PLATFORM_PUBLIC_HEADERS})
list(TRANSFORM LS_LIBRARY_DIRECTORIES PREPEND ${PROJECT_SOURCE_DIR}/ OUTPUT_VARIABLE LS_HEADER_BASE_DIRECTORIES)
target_sources(locationservice_shared PUBLIC FILE_SET HEADERS BASE_DIRS ${LS_HEADER_BASE_DIRECTORIES}
               FILES ${LS_PUBLIC_HEADERS})

set(LS_INSTALL_INCLUDEDIR ${CMAKE_INSTALL_INCLUDEDIR}/locationservice)
set(LS_INSTALL_CMAKEDIR ${CMAKE_INSTALL_LIBDIR}/cmake/LocationService)
foreach(library ls_platform_shared locationservice_shared)
  set_target_properties(${library} PROPERTIES VERSION ${PROJECT_VERSION} SOVERSION ${PROJECT_VERSION_MAJOR})
  target_include_directories(${library} INTERFACE $<INSTALL_INTERFACE:${LS_INSTALL_INCLUDEDIR}>)
endforeach()

# Two install components, one Debian package each (cmake/Packaging.cmake):
# "library", the versioned shared objects, and "development", the rest.
install(TARGETS ls_platform_shared locationservice_shared
        EXPORT LocationServiceTargets
        LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT library NAMELINK_COMPONENT development
        FILE_SET HEADERS DESTINATION ${LS_INSTALL_INCLUDEDIR} COMPONENT development)
install(EXPORT LocationServiceTargets NAMESPACE LocationService:: DESTINATION ${LS_INSTALL_CMAKEDIR}
        COMPONENT development)
configure_package_config_file(${PROJECT_SOURCE_DIR}/cmake/LocationServiceConfig.cmake.in
                              ${PROJECT_BINARY_DIR}/LocationServiceConfig.cmake
                              INSTALL_DESTINATION ${LS_INSTALL_CMAKEDIR})
write_basic_package_version_file(${PROJECT_BINARY_DIR}/LocationServiceConfigVersion.cmake
                                 COMPATIBILITY SameMajorVersion)
install(FILES ${PROJECT_BINARY_DIR}/LocationServiceConfig.cmake
              ${PROJECT_BINARY_DIR}/LocationServiceConfigVersion.cmake
        DESTINATION ${LS_INSTALL_CMAKEDIR} COMPONENT development)
# The pkg-config file finds the prefix from where it lies, so that an
# install under another --prefix than the configured one still works.
file(RELATIVE_PATH LS_PC_TO_PREFIX /prefix/${CMAKE_INSTALL_LIBDIR}/pkgconfig /prefix)
configure_file(${PROJECT_SOURCE_DIR}/cmake/locationservice.pc.in ${PROJECT_BINARY_DIR}/locationservice.pc @ONLY)
install(FILES ${PROJECT_BINARY_DIR}/locationservice.pc DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig
        COMPONENT development)
