# What `cmake --install` puts under the prefix: the library and its headers, the stand-in
# and its public headers, the droqbxml command, a CMake package (droqbxml::droqbxml,
# droqbxml::simulator) and pkg-config files. Included by the top-level CMakeLists.txt.
include(CMakePackageConfigHelpers)

set(DROQBXML_CMAKE_DIR ${CMAKE_INSTALL_LIBDIR}/cmake/droqbxml)

# The library's headers, internal/ folders left out except what a public header includes
# (records/Transaction.hpp names internal::SearchScope in a protected template).
install(DIRECTORY ${PROJECT_SOURCE_DIR}/droqbxml/
  DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/droqbxml
  COMPONENT droqbxml_development
  FILES_MATCHING PATTERN "*.hpp"
  PATTERN "internal" EXCLUDE)
install(FILES ${PROJECT_SOURCE_DIR}/droqbxml/records/internal/TextSearch.hpp
  DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/droqbxml/records/internal
  COMPONENT droqbxml_development)

set(droqbxml_exported droqbxml)
if(DROQBXML_BUILD_SIMULATOR)
  list(APPEND droqbxml_exported droqbxml_simulator)
  install(FILES ${DROQBXML_SIMULATOR_PUBLIC_HEADERS}
    DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/droqbxml-simulator/simulator
    COMPONENT droqbxml_development)
endif()

# Installed shared objects find each other in the prefix they were installed to, wherever
# that is: the stand-in next to the library, the command one folder up.
if(BUILD_SHARED_LIBS)
  if(DROQBXML_BUILD_SIMULATOR)
    set_target_properties(droqbxml_simulator PROPERTIES INSTALL_RPATH "$ORIGIN")
  endif()
  if(DROQBXML_BUILD_CLI)
    file(RELATIVE_PATH libdir_from_bindir /root/${CMAKE_INSTALL_BINDIR}
      /root/${CMAKE_INSTALL_LIBDIR})
    set_target_properties(droqbxml_command PROPERTIES
      INSTALL_RPATH "$ORIGIN/${libdir_from_bindir}")
  endif()
endif()

install(TARGETS ${droqbxml_exported} EXPORT droqbxmlTargets
  ARCHIVE DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT droqbxml_development
  LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT droqbxml_runtime
    NAMELINK_COMPONENT droqbxml_development
  RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR} COMPONENT droqbxml_runtime)
if(DROQBXML_BUILD_CLI)
  install(TARGETS droqbxml_command RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR}
    COMPONENT droqbxml_runtime)
endif()

install(EXPORT droqbxmlTargets NAMESPACE droqbxml:: FILE droqbxmlTargets.cmake
  DESTINATION ${DROQBXML_CMAKE_DIR} COMPONENT droqbxml_development)

# A static stand-in brings SQLite3 and Expat into the host's link; a shared one has them
# as its own dependencies.
set(DROQBXML_PACKAGE_SIMULATOR ${DROQBXML_BUILD_SIMULATOR})
set(DROQBXML_PACKAGE_SHARED ${BUILD_SHARED_LIBS})
configure_package_config_file(${PROJECT_SOURCE_DIR}/cmake/droqbxmlConfig.cmake.in
  ${PROJECT_BINARY_DIR}/package/droqbxmlConfig.cmake
  INSTALL_DESTINATION ${DROQBXML_CMAKE_DIR}
  NO_SET_AND_CHECK_MACRO NO_CHECK_REQUIRED_COMPONENTS_MACRO)
# 0.x: a minor release may break what an earlier one offered.
write_basic_package_version_file(${PROJECT_BINARY_DIR}/package/droqbxmlConfigVersion.cmake
  VERSION ${PROJECT_VERSION} COMPATIBILITY SameMinorVersion)
install(FILES ${PROJECT_BINARY_DIR}/package/droqbxmlConfig.cmake
  ${PROJECT_BINARY_DIR}/package/droqbxmlConfigVersion.cmake
  DESTINATION ${DROQBXML_CMAKE_DIR} COMPONENT droqbxml_development)

# pkg-config: the prefix is found from the .pc file's own place, so the files stay right
# under `cmake --install --prefix` and in a moved tree.
if(IS_ABSOLUTE "${CMAKE_INSTALL_LIBDIR}" OR IS_ABSOLUTE "${CMAKE_INSTALL_INCLUDEDIR}")
  set(DROQBXML_PC_PREFIX "${CMAKE_INSTALL_PREFIX}")
  cmake_path(ABSOLUTE_PATH CMAKE_INSTALL_LIBDIR BASE_DIRECTORY "${CMAKE_INSTALL_PREFIX}"
    OUTPUT_VARIABLE DROQBXML_PC_LIBDIR)
  cmake_path(ABSOLUTE_PATH CMAKE_INSTALL_INCLUDEDIR BASE_DIRECTORY "${CMAKE_INSTALL_PREFIX}"
    OUTPUT_VARIABLE DROQBXML_PC_INCLUDEDIR)
else()
  file(RELATIVE_PATH up /root/${CMAKE_INSTALL_LIBDIR}/pkgconfig /root)
  string(REGEX REPLACE "/$" "" up "${up}")
  set(DROQBXML_PC_PREFIX "\${pcfiledir}/${up}")
  set(DROQBXML_PC_LIBDIR "\${prefix}/${CMAKE_INSTALL_LIBDIR}")
  set(DROQBXML_PC_INCLUDEDIR "\${prefix}/${CMAKE_INSTALL_INCLUDEDIR}")
endif()
configure_file(${PROJECT_SOURCE_DIR}/cmake/droqbxml.pc.in ${PROJECT_BINARY_DIR}/package/droqbxml.pc
  @ONLY)
install(FILES ${PROJECT_BINARY_DIR}/package/droqbxml.pc
  DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig COMPONENT droqbxml_development)
if(DROQBXML_BUILD_SIMULATOR)
  configure_file(${PROJECT_SOURCE_DIR}/cmake/droqbxml-simulator.pc.in
    ${PROJECT_BINARY_DIR}/package/droqbxml-simulator.pc @ONLY)
  install(FILES ${PROJECT_BINARY_DIR}/package/droqbxml-simulator.pc
    DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig COMPONENT droqbxml_development)
endif()
