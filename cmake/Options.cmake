# What is built, and against which platform.

set(ZELKORA_PLATFORM_INCLUDE_DIRS "" CACHE STRING
  "Include directories of a device's own platform; empty: the host platform of this tree")
set(ZELKORA_PLATFORM_LIBRARIES "" CACHE STRING
  "Libraries of a device's own platform; empty: the host platform of this tree")

if(ZELKORA_PLATFORM_INCLUDE_DIRS OR ZELKORA_PLATFORM_LIBRARIES)
  set(ZELKORA_HOST_PLATFORM OFF)
else()
  set(ZELKORA_HOST_PLATFORM ON)
endif()

# A project that adds this one as a folder gets the library and the simulated device.
include(CMakeDependentOption)
cmake_dependent_option(ZELKORA_DESKTOP "Build the desktop device (GStreamer, PulseAudio)" ${PROJECT_IS_TOP_LEVEL}
  "ZELKORA_HOST_PLATFORM" OFF)
cmake_dependent_option(ZELKORA_TOOLS "Build the command-line program" ${PROJECT_IS_TOP_LEVEL}
  "ZELKORA_HOST_PLATFORM" OFF)
cmake_dependent_option(ZELKORA_TESTS "Build the tests" ${PROJECT_IS_TOP_LEVEL} "ZELKORA_HOST_PLATFORM" OFF)
cmake_dependent_option(ZELKORA_BENCHMARKS "Build the benchmarks" ON "ZELKORA_DESKTOP;ZELKORA_TESTS" OFF)
option(ZELKORA_WERROR "Treat warnings as errors" OFF)

if(ZELKORA_DESKTOP)
  set(ZELKORA_DEFAULT_DEVICE desktop)
else()
  set(ZELKORA_DEFAULT_DEVICE simulated)
endif()

set(CMAKE_CXX_STANDARD 17)
set(CMAKE_CXX_STANDARD_REQUIRED ON)
set(CMAKE_CXX_EXTENSIONS OFF)
set(CMAKE_EXPORT_COMPILE_COMMANDS ON)

# A build tree has the shape of an installation, so programs and scripts find things the same way.
set(CMAKE_RUNTIME_OUTPUT_DIRECTORY ${PROJECT_BINARY_DIR}/bin)
set(CMAKE_LIBRARY_OUTPUT_DIRECTORY ${PROJECT_BINARY_DIR}/lib)
set(ZELKORA_DEVICES_DIR lib/zelkora-media)
