# What every target of this tree is compiled with, and the few kinds of targets there are.

set(OMBRIX_SANITIZE "" CACHE STRING "Sanitizers to build with, as -fsanitize takes them")
option(OMBRIX_FUZZ "Build the fuzz targets (Clang only)" OFF)

add_library(ombrix_options INTERFACE)
target_compile_options(ombrix_options INTERFACE
  -Wall -Wextra -Wpedantic -Wshadow -Wnon-virtual-dtor -Wcast-align)
if(CMAKE_CXX_COMPILER_ID MATCHES Clang)
  target_compile_options(ombrix_options INTERFACE -Wthread-safety -Wno-error=unknown-warning-option)
endif()
if(CMAKE_CXX_COMPILER_ID STREQUAL GNU)
  # GCC 12 warns of overlapping copies in std::string's own operator+ when it optimises.
  target_compile_options(ombrix_options INTERFACE -Wno-restrict)
endif()
target_include_directories(ombrix_options INTERFACE ${PROJECT_SOURCE_DIR})
target_link_options(ombrix_options INTERFACE -Wl,-z,defs -Wl,--as-needed)
if(OMBRIX_SANITIZE)
  # A library that is checked cannot be linked with -z,defs: the checks' own symbols come from the program.
  set_property(TARGET ombrix_options PROPERTY INTERFACE_LINK_OPTIONS -Wl,--as-needed)
  add_compile_options(-fsanitize=${OMBRIX_SANITIZE} -fno-sanitize-recover=all -fno-omit-frame-pointer -g1)
  add_link_options(-fsanitize=${OMBRIX_SANITIZE})
  if(CMAKE_CXX_COMPILER_ID STREQUAL GNU)
    # The checks hide from GCC 12 that a variant is looked at only where it holds something.
    target_compile_options(ombrix_options INTERFACE -Wno-maybe-uninitialized)
  endif()
endif()

# ombrix_library(NAME SOURCES... [LINK LIBRARIES...]): one static library a folder.
function(ombrix_library name)
  cmake_parse_arguments(PARSE_ARGV 1 arg "" "" "LINK;PRIVATE_LINK")
  add_library(${name} STATIC ${arg_UNPARSED_ARGUMENTS})
  target_link_libraries(${name} PUBLIC ${arg_LINK} PRIVATE $<BUILD_INTERFACE:ombrix_options> ${arg_PRIVATE_LINK})
  target_include_directories(${name} PUBLIC $<BUILD_INTERFACE:${PROJECT_SOURCE_DIR}>)
endfunction()

# ombrix_program(NAME SOURCES... [LINK LIBRARIES...]): a program in bin/.
function(ombrix_program name)
  cmake_parse_arguments(PARSE_ARGV 1 arg "" "" "LINK")
  add_executable(${name} ${arg_UNPARSED_ARGUMENTS})
  target_link_libraries(${name} PRIVATE ombrix_options ${arg_LINK})
  set_target_properties(${name} PROPERTIES
    BUILD_RPATH "$ORIGIN/../lib" INSTALL_RPATH "$ORIGIN/../${CMAKE_INSTALL_LIBDIR}")
endfunction()

# ombrix_tests(NAME SOURCES... [LINK LIBRARIES...]): a doctest program; each of its cases is a test of ctest.
function(ombrix_tests name)
  cmake_parse_arguments(PARSE_ARGV 1 arg "" "" "LINK")
  add_executable(${name} ${arg_UNPARSED_ARGUMENTS})
  target_link_libraries(${name} PRIVATE ombrix_options ombrix_test_main ${arg_LINK})
  set_target_properties(${name} PROPERTIES RUNTIME_OUTPUT_DIRECTORY ${PROJECT_BINARY_DIR}/tests)
  doctest_discover_tests(${name} PROPERTIES TIMEOUT 1200)
endfunction()
