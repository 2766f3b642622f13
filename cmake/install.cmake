# `cmake --install BUILD --prefix DIR` puts the library, its public headers,
# its resource objects and a CMake package into DIR, so that a host finds it
# with find_package(Quaybar 1.5 CONFIG REQUIRED) and links Quaybar::quaybar.
#
#   DIR/include/quaybar.h, qbr_records.h
#   DIR/lib/libquaybar.a (quaybar.lib with MSVC)
#   DIR/lib/quaybar/*.res             the compiled resource scripts
#   DIR/lib/cmake/Quaybar/            QuaybarConfig.cmake, its version file, targets
if(NOT QBR_INSTALL)
  return()
endif()
include(CMakePackageConfigHelpers)

set(QBR_PACKAGE_DIR ${CMAKE_INSTALL_LIBDIR}/cmake/Quaybar)
set(QBR_RESOURCE_DIR ${CMAKE_INSTALL_LIBDIR}/quaybar)
install(TARGETS quaybar EXPORT QuaybarTargets ARCHIVE DESTINATION ${CMAKE_INSTALL_LIBDIR})
# The resource objects go into a folder of their own, side by side, so that a
# build without CMake names them in one go; the package hands them to every
# program that links Quaybar::quaybar.
install(FILES $<TARGET_OBJECTS:quaybar_resources> DESTINATION ${QBR_RESOURCE_DIR})
install(FILES ${QBR_PUBLIC_HEADERS} DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
install(EXPORT QuaybarTargets NAMESPACE Quaybar:: DESTINATION ${QBR_PACKAGE_DIR})

configure_package_config_file(${CMAKE_CURRENT_LIST_DIR}/QuaybarConfig.cmake.in
  ${PROJECT_BINARY_DIR}/QuaybarConfig.cmake INSTALL_DESTINATION ${QBR_PACKAGE_DIR}
  PATH_VARS QBR_RESOURCE_DIR)
write_basic_package_version_file(${PROJECT_BINARY_DIR}/QuaybarConfigVersion.cmake
  COMPATIBILITY SameMajorVersion)
install(FILES ${PROJECT_BINARY_DIR}/QuaybarConfig.cmake ${PROJECT_BINARY_DIR}/QuaybarConfigVersion.cmake
  DESTINATION ${QBR_PACKAGE_DIR})
