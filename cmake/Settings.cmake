# What every target of the project is built with. None of it reaches users of the library.
add_library(quavel_settings INTERFACE)
if(MSVC)
  target_compile_options(quavel_settings INTERFACE
    /W4 /utf-8 $<$<BOOL:${QUAVEL_WERROR}>:/WX>)
else()
  target_compile_options(quavel_settings INTERFACE
    -Wall -Wextra -Wpedantic -Wconversion -Wshadow
    $<$<BOOL:${QUAVEL_WERROR}>:-Werror>)
endif()

include(CheckCXXCompilerFlag)
include(CheckLinkerFlag)

# Options that make a library smaller or faster where the compiler, or the linker, knows them.
function(quavel_compile_option_if_accepted target option)
  string(MAKE_C_IDENTIFIER "quavel_accepts${option}" accepts)
  check_cxx_compiler_flag(${option} ${accepts})
  if(${accepts})
    target_compile_options(${target} PRIVATE ${option})
  endif()
endfunction()

function(quavel_link_option_if_accepted target option)
  string(REGEX REPLACE "[=,]/.*" "" name "${option}")
  string(MAKE_C_IDENTIFIER "quavel_accepts_${name}" accepts)
  check_linker_flag(CXX ${option} ${accepts})
  if(${accepts})
    target_link_options(${target} PRIVATE ${option})
  endif()
endfunction()

if(QUAVEL_REPRODUCIBLE)
  # Where both prefixes match, the later option wins.
  target_compile_options(quavel_settings INTERFACE
    -ffile-prefix-map=${PROJECT_SOURCE_DIR}/= -ffile-prefix-map=${PROJECT_BINARY_DIR}=.)
  set(CMAKE_BUILD_RPATH_USE_ORIGIN ON)  # a path is cut out on installing, but leaves its length
endif()

# Without this, 32-bit systems cannot open files above 2 GB.
if(CMAKE_SIZEOF_VOID_P EQUAL 4)
  target_compile_definitions(quavel_settings INTERFACE _FILE_OFFSET_BITS=64)
endif()

if(QUAVEL_SANITIZE)
  list(JOIN QUAVEL_SANITIZE "," sanitizers)
  target_compile_options(quavel_settings INTERFACE
    -fsanitize=${sanitizers} -fno-sanitize-recover=all -fno-omit-frame-pointer)
  target_link_options(quavel_settings INTERFACE -fsanitize=${sanitizers})
endif()

if(QUAVEL_COVERAGE)
  target_compile_options(quavel_settings INTERFACE --coverage)
  target_link_options(quavel_settings INTERFACE --coverage)
endif()
