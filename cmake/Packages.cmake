# Debian packages by component, and one archive of everything: scripts/package makes them.

set(CPACK_GENERATOR DEB TGZ)
set(CPACK_PACKAGE_CONTACT "The maintainers of zelkora-media <maintainers@localhost>")
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "")  # each package has its own
set(CPACK_PACKAGING_INSTALL_PREFIX /usr)
set(CPACK_STRIP_FILES ON)
set(CPACK_THREADS 1)  # more compress differently each time
set(CPACK_ARCHIVE_COMPONENT_INSTALL OFF)
set(CPACK_DEB_COMPONENT_INSTALL ON)
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_PACKAGE_FILE_NAME "${PROJECT_NAME}-${PROJECT_VERSION}-linux-${CMAKE_SYSTEM_PROCESSOR}")
set(CPACK_DEBIAN_PACKAGE_CONTROL_STRICT_PERMISSION ON)

# The packages of this run aren't installed, so what they need of each other is named below.
set(same "(= ${PROJECT_VERSION})")
set(runtime libzelkora-media1)
set(simulated "zelkora-media-simulated ${same}")
set(desktop "zelkora-media-desktop ${same}")
if(CMAKE_CROSSCOMPILING)
  # Nor are the foreign processor's: what all C++ programs need is named too.
  set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS OFF)
  set(system "libc6, libgcc-s1, libstdc++6, ")
  set(CPACK_DEBIAN_PACKAGE_ARCHITECTURE armhf)
else()
  set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
  set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS_PRIVATE_DIRS
    ${PROJECT_BINARY_DIR}/lib ${PROJECT_BINARY_DIR}/lib/zelkora-media
    ${PROJECT_BINARY_DIR}/lib/zelkora-media/simulated)
endif()

# zelkora_package(<component> <name> <section> <depends> <text>)
macro(zelkora_package component name section depends text)
  list(APPEND CPACK_COMPONENTS_ALL ${component})
  string(TOUPPER ${component} key)
  set(CPACK_DEBIAN_${key}_DESCRIPTION "${text}")
  set(CPACK_DEBIAN_${key}_PACKAGE_NAME ${name})
  set(CPACK_DEBIAN_${key}_PACKAGE_SECTION ${section})
  set(CPACK_DEBIAN_${key}_PACKAGE_DEPENDS "${depends}")
endmacro()

set(devices ${simulated})
set(CPACK_COMPONENTS_ALL "")
if(ZELKORA_DESKTOP)
  string(APPEND devices ", ${desktop}")
  zelkora_package(desktop zelkora-media-desktop sound "${simulated}"
    "media extensions: the desktop device\nA player on GStreamer and a sound manager on PulseAudio or PipeWire.")
  set(CPACK_DEBIAN_DESKTOP_PACKAGE_RECOMMENDS
    "pulseaudio | pipewire-pulse, gstreamer1.0-plugins-base, gstreamer1.0-plugins-good, gstreamer1.0-plugins-bad, gstreamer1.0-libav, swh-plugins")
endif()
if(ZELKORA_TOOLS)
  zelkora_package(tools zelkora-media-tools sound "${runtime} ${same}, ${devices}"
    "media extensions: the command-line program\nThe program zelkora, and zelkora-on, which runs any program on a device.")
endif()
zelkora_package(runtime ${runtime} libs "${system}${desktop} | ${simulated}"
  "media extensions: the library\nEffects, sessions, volumes, calls and key-frame seek for native applications.")
zelkora_package(development libzelkora-media-dev libdevel "${runtime} ${same}, ${devices}"
  "media extensions: headers, and what CMake and pkg-config need\nFor programs that use the library, and for their tests.")
zelkora_package(simulated zelkora-media-simulated libs "${system}"
  "media extensions: the simulated device\nIn memory and steered by a test, together with the application framework of all devices.")
foreach(key RUNTIME DEVELOPMENT SIMULATED DESKTOP TOOLS)
  string(REGEX REPLACE ", $" "" CPACK_DEBIAN_${key}_PACKAGE_DEPENDS "${CPACK_DEBIAN_${key}_PACKAGE_DEPENDS}")
endforeach()

# What other packages that link the library learn from the runtime's.
set(control ${PROJECT_BINARY_DIR}/control)
file(WRITE ${control}/shlibs "libzelkora-media 1 ${runtime} (>= ${PROJECT_VERSION})\n")
file(WRITE ${control}/triggers "activate-noawait ldconfig\n")
configure_file(abi/symbols ${control}/symbols COPYONLY)
set(CPACK_DEBIAN_RUNTIME_PACKAGE_CONTROL_EXTRA
  ${control}/shlibs ${control}/symbols ${control}/triggers)

include(CPack)
