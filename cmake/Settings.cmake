# What every target of the project is built with. Nobody who uses the library gets any of it.
add_library(quavel_settings INTERFACE)
target_compile_options(quavel_settings INTERFACE
  -Wall -Wextra -Wpedantic -Wconversion -Wshadow
  $<$<BOOL:${QUAVEL_WERROR}>:-Werror>)

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
