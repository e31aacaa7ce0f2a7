# As armv7.cmake, with the libraries of scripts/make-armv7-sysroot, so that the desktop device can be built.
include(${CMAKE_CURRENT_LIST_DIR}/armv7.cmake)

get_filename_component(tree ${CMAKE_CURRENT_LIST_DIR}/../build/armv7-sysroot/tree REALPATH)
set(CMAKE_SYSROOT ${tree})
set(CMAKE_FIND_ROOT_PATH ${tree})
set(CMAKE_LIBRARY_ARCHITECTURE arm-linux-gnueabihf)
set(CMAKE_CROSSCOMPILING_EMULATOR "/usr/bin/qemu-arm-static;-L;${tree}")
