# Installs this very build, as a user would, then builds and runs a consumer of the installed tree.
# A sanitized or instrumented library would ask its consumer for the same flags.
if(NOT QUAVEL_INSTALL OR QUAVEL_SANITIZE OR QUAVEL_COVERAGE)
  return()
endif()

set(prefix ${CMAKE_CURRENT_BINARY_DIR}/package/prefix)
set(consumer_dir ${prefix}/bin)  # beside a DLL, where there are such
set(consumer_photo ${PROJECT_SOURCE_DIR}/examples/photos/night.nef)

add_test(NAME Package.Installs
  COMMAND ${CMAKE_COMMAND} --install ${PROJECT_BINARY_DIR} --prefix ${prefix})
set_tests_properties(Package.Installs PROPERTIES FIXTURES_SETUP installed_tree)

add_test(NAME Package.IsFoundByCMake
  COMMAND ${CMAKE_CTEST_COMMAND}
    --build-and-test ${PROJECT_SOURCE_DIR}/tests/package ${CMAKE_CURRENT_BINARY_DIR}/package/build
    --build-generator ${CMAKE_GENERATOR}
    --build-options -Dquavel_DIR=${prefix}/${CMAKE_INSTALL_LIBDIR}/cmake/quavel
      -DCMAKE_TOOLCHAIN_FILE=${CMAKE_TOOLCHAIN_FILE} -DCMAKE_CXX_COMPILER=${CMAKE_CXX_COMPILER}
      -DCMAKE_CXX_FLAGS=${CMAKE_CXX_FLAGS} -DCMAKE_RUNTIME_OUTPUT_DIRECTORY=${consumer_dir}
    --test-command ${CMAKE_CROSSCOMPILING_EMULATOR}
      ${consumer_dir}/consumer${CMAKE_EXECUTABLE_SUFFIX} ${consumer_photo})
set_tests_properties(Package.IsFoundByCMake PROPERTIES FIXTURES_REQUIRED installed_tree)
