# What an application developer gets: library, headers, the host platform to build and test on, and
# the files by which CMake and pkg-config find them.

include(CMakePackageConfigHelpers)

set(ZELKORA_INCLUDE_DIR ${CMAKE_INSTALL_INCLUDEDIR}/zelkora-media)
set(ZELKORA_INSTALLED_DEVICES_DIR ${CMAKE_INSTALL_LIBDIR}/zelkora-media)

install(TARGETS zelkora-media
  LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT runtime NAMELINK_COMPONENT development
  FILE_SET HEADERS DESTINATION ${ZELKORA_INCLUDE_DIR} COMPONENT development)

if(NOT ZELKORA_HOST_PLATFORM)
  return()  # the device's own files find the library
endif()

install(DIRECTORY platform/include/ platform/appfw/include/ platform/simulated/include/
  DESTINATION ${ZELKORA_INCLUDE_DIR} COMPONENT development)
install(TARGETS osp-appfw
  LIBRARY DESTINATION ${ZELKORA_INSTALLED_DEVICES_DIR} COMPONENT simulated)
get_property(devices GLOBAL PROPERTY ZELKORA_DEVICES)
foreach(device ${devices})
  install(TARGETS ${device}-osp-media ${device}-capi-media-player ${device}-capi-media-sound-manager
    LIBRARY DESTINATION ${ZELKORA_INSTALLED_DEVICES_DIR}/${device} COMPONENT ${device})
endforeach()

set(package_dir ${CMAKE_INSTALL_LIBDIR}/cmake/ZelkoraMedia)
configure_package_config_file(cmake/ZelkoraMediaConfig.cmake.in ZelkoraMediaConfig.cmake
  INSTALL_DESTINATION ${package_dir}
  PATH_VARS ZELKORA_INCLUDE_DIR ZELKORA_INSTALLED_DEVICES_DIR CMAKE_INSTALL_LIBDIR)
write_basic_package_version_file(ZelkoraMediaConfigVersion.cmake COMPATIBILITY SameMajorVersion)
install(FILES
  ${PROJECT_BINARY_DIR}/ZelkoraMediaConfig.cmake
  ${PROJECT_BINARY_DIR}/ZelkoraMediaConfigVersion.cmake
  DESTINATION ${package_dir} COMPONENT development)

# Relative, so that the installation may be moved; the library directory may have several elements.
file(RELATIVE_PATH ZELKORA_LIB_TO_INCLUDE
  ${CMAKE_INSTALL_FULL_LIBDIR} ${CMAKE_INSTALL_FULL_INCLUDEDIR}/zelkora-media)
# A file for programs, and one for their tests: zelkora-media-simulated.
foreach(ZELKORA_PC_NAME zelkora-media zelkora-media-simulated)
  set(ZELKORA_PC_DEVICE ${ZELKORA_DEFAULT_DEVICE})
  if(ZELKORA_PC_NAME MATCHES "simulated$")
    set(ZELKORA_PC_DEVICE simulated)
  endif()
  configure_file(cmake/zelkora-media.pc.in ${ZELKORA_PC_NAME}.pc @ONLY)
  install(FILES ${PROJECT_BINARY_DIR}/${ZELKORA_PC_NAME}.pc
    DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig COMPONENT development)
endforeach()
