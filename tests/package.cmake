# Installs this very build, as a user would, then builds and runs a consumer of the installed tree.
# A sanitized or instrumented library would ask its consumer for the same flags.
if(NOT QUAVEL_INSTALL OR QUAVEL_SANITIZE OR QUAVEL_COVERAGE)
  return()
endif()

set(prefix ${CMAKE_CURRENT_BINARY_DIR}/package/prefix)
set(consumer_photo ${PROJECT_SOURCE_DIR}/examples/photos/night.nef)

add_test(NAME Package.Installs
  COMMAND ${CMAKE_COMMAND} --install ${PROJECT_BINARY_DIR} --prefix ${prefix})
set_tests_properties(Package.Installs PROPERTIES FIXTURES_SETUP installed_tree)

add_test(NAME Package.IsFoundByCMake
  COMMAND ${CMAKE_CTEST_COMMAND}
    --build-and-test ${PROJECT_SOURCE_DIR}/tests/package ${CMAKE_CURRENT_BINARY_DIR}/package/build
    --build-generator ${CMAKE_GENERATOR}
    --build-options -DCMAKE_PREFIX_PATH=${prefix} -DCMAKE_CXX_COMPILER=${CMAKE_CXX_COMPILER}
    --test-command consumer ${consumer_photo})
set_tests_properties(Package.IsFoundByCMake PROPERTIES FIXTURES_REQUIRED installed_tree)
