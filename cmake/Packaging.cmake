# Debian packages, made with `cpack -G DEB` in a build directory
# (tools/build-packages.sh does it with Debian's hardening flags):
#
#   liblocationservice1       the two shared libraries under their SONAMEs
#   liblocationservice-dev    headers, CMake package, pkg-config file, .so links
#   location-gateway          the gateway and the console, the systemd unit,
#                             the configuration under /etc, state under /var/lib
#
# Each package is an install component. Dependencies on other packages are
# dpkg-shlibdeps' (libraries) and CPack's from the components' own (each
# package on liblocationservice1 of the same version); only adduser, which
# the gateway's postinst runs, is written here. The architecture is the
# target's: armhf when cross-built with cmake/armhf-linux.cmake.
#
# The gateway's files under /etc and /lib are installed to those absolute
# paths, as the package needs them; `cmake --install` into a scratch prefix
# therefore names the library's components (.ci/install does).
set(LS_PACKAGING_DIR ${PROJECT_SOURCE_DIR}/packaging)

# Debian wants the changelog compressed, and reproducibly so (no name, no
# time stamp in the gzip header).
execute_process(COMMAND gzip -9nc ${LS_PACKAGING_DIR}/changelog OUTPUT_FILE ${PROJECT_BINARY_DIR}/changelog.gz
                COMMAND_ERROR_IS_FATAL ANY)
set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS ${LS_PACKAGING_DIR}/changelog)

# What every package carries: the copyright, the changelog, and the
# lintian overrides with their reasons, where there are any.
function(ls_package_documents component package)
  install(FILES ${LS_PACKAGING_DIR}/copyright ${PROJECT_BINARY_DIR}/changelog.gz
          DESTINATION ${CMAKE_INSTALL_DATAROOTDIR}/doc/${package} COMPONENT ${component})
  if(EXISTS ${LS_PACKAGING_DIR}/lintian/${package})
    install(FILES ${LS_PACKAGING_DIR}/lintian/${package}
            DESTINATION ${CMAKE_INSTALL_DATAROOTDIR}/lintian/overrides COMPONENT ${component})
  endif()
endfunction()

ls_package_documents(library liblocationservice1)
ls_package_documents(development liblocationservice-dev)

set(CPACK_COMPONENTS_ALL library development)
if(TARGET location-gateway)
  list(APPEND CPACK_COMPONENTS_ALL gateway)
  install(TARGETS location-gateway location-console RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR} COMPONENT gateway)
  install(FILES ${LS_PACKAGING_DIR}/location-gateway.service DESTINATION /lib/systemd/system COMPONENT gateway)
  install(FILES ${LS_PACKAGING_DIR}/location-gateway.default DESTINATION /etc/default
          RENAME location-gateway COMPONENT gateway)
  install(FILES ${LS_PACKAGING_DIR}/gateway.script DESTINATION /etc/location-gateway COMPONENT gateway)
  install(FILES ${PROJECT_SOURCE_DIR}/README.md DESTINATION ${CMAKE_INSTALL_DATAROOTDIR}/doc/location-gateway
          COMPONENT gateway)
  ls_package_documents(gateway location-gateway)
endif()

set(CPACK_GENERATOR DEB)
set(CPACK_PACKAGE_NAME locationservice)
set(CPACK_PACKAGE_VERSION ${PROJECT_VERSION})
set(CPACK_PACKAGE_CONTACT "location-service maintainers <maintainers@location-service.example>")
set(CPACK_PACKAGING_INSTALL_PREFIX /usr)
set(CPACK_STRIP_FILES ON)
set(CPACK_DEB_COMPONENT_INSTALL ON)
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_SECTION net)
set(CPACK_DEBIAN_PACKAGE_PRIORITY optional)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
# The gateway's program needs the library it is packaged beside, which is
# in no system directory while the packages are made.
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS_PRIVATE_DIRS ${PROJECT_BINARY_DIR})
set(CPACK_DEBIAN_ENABLE_COMPONENT_DEPENDS ON)
if(CMAKE_CROSSCOMPILING AND CMAKE_SYSTEM_PROCESSOR MATCHES "^arm")
  set(CPACK_DEBIAN_PACKAGE_ARCHITECTURE armhf)
endif()

set(CPACK_DEBIAN_LIBRARY_PACKAGE_NAME liblocationservice1)
set(CPACK_DEBIAN_LIBRARY_PACKAGE_SECTION libs)
# Only this package has shared objects: the shlibs file and the ldconfig
# trigger are its own.
set(CPACK_DEBIAN_PACKAGE_GENERATE_SHLIBS ON)
set(CPACK_DEBIAN_PACKAGE_GENERATE_SHLIBS_POLICY ">=")
set(CPACK_DEBIAN_LIBRARY_PACKAGE_CONTROL_EXTRA ${LS_PACKAGING_DIR}/triggers)
set(CPACK_COMPONENT_LIBRARY_DESCRIPTION
    "location service of an embedded SIP voice gateway - shared library
The configuration of a SIP voice gateway's subscribers and peers as a tree
of reference-counted, inheritable objects (location services, identities
with aliases and faces, authentication services), and the answers to the
SIP stack's questions about it: which location service is responsible for
a host, which identity a name-addr denotes, which realms to challenge with,
which passwords to check, which credentials to answer a challenge with.")

set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_NAME liblocationservice-dev)
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_SECTION libdevel)
set(CPACK_COMPONENT_DEVELOPMENT_DEPENDS library)
set(CPACK_COMPONENT_DEVELOPMENT_DESCRIPTION
    "location service of an embedded SIP voice gateway - development files
The public headers of liblocationservice1, its CMake package
(find_package(LocationService)) and its pkg-config file (locationservice).")

set(CPACK_DEBIAN_GATEWAY_PACKAGE_NAME location-gateway)
set(CPACK_DEBIAN_GATEWAY_PACKAGE_DEPENDS adduser)
set(CPACK_COMPONENT_GATEWAY_DEPENDS library)
set(CPACK_DEBIAN_GATEWAY_PACKAGE_CONTROL_EXTRA
    ${LS_PACKAGING_DIR}/maintainer/postinst ${LS_PACKAGING_DIR}/maintainer/prerm
    ${LS_PACKAGING_DIR}/maintainer/postrm ${LS_PACKAGING_DIR}/conffiles)
set(CPACK_DEBIAN_GATEWAY_PACKAGE_CONTROL_STRICT_PERMISSION ON)
set(CPACK_COMPONENT_GATEWAY_DESCRIPTION
    "SIP registrar and call relay on the location service
location-gateway answers REGISTER for the subscribers its scripts
configure, relays their calls (or redirects them), registers trunks at
carriers, and keeps the registrations in a store that outlives it. It
runs as a systemd service under its own user; location-console configures
it over its control socket while it serves.")

include(CPack)
