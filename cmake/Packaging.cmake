# `cpack` gives one .tar.gz of everything, or Debian packages of the components.
set(CPACK_PACKAGE_VENDOR "the quavel authors")
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "${PROJECT_DESCRIPTION}")
set(CPACK_RESOURCE_FILE_LICENSE ${CMAKE_CURRENT_SOURCE_DIR}/LICENSE)
set(CPACK_STRIP_FILES ON)
set(CPACK_VERBATIM_VARIABLES ON)
set(CPACK_THREADS 0)
set(CPACK_GENERATOR TGZ)
set(CPACK_PACKAGE_FILE_NAME quavel-${PROJECT_VERSION}-${CMAKE_SYSTEM_NAME}-${CMAKE_SYSTEM_PROCESSOR})

set(CPACK_COMPONENTS_ALL runtime development)
if(QUAVEL_BUILD_APPS)
  list(APPEND CPACK_COMPONENTS_ALL command)
endif()
if(QUAVEL_BUILD_PYTHON)
  list(APPEND CPACK_COMPONENTS_ALL python)
endif()
set(CPACK_DEB_COMPONENT_INSTALL ON)
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_RELEASE 1)
if(NOT DEFINED CPACK_DEBIAN_PACKAGE_MAINTAINER)
  set(CPACK_DEBIAN_PACKAGE_MAINTAINER "The quavel authors <authors@quavel.invalid>")
endif()
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
set(CPACK_DEBIAN_PACKAGE_GENERATE_SHLIBS ON)
# In the build tree the command finds its library by the build's own path.
get_target_property(library_dir quavel BINARY_DIR)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS_PRIVATE_DIRS ${library_dir})

set(runtime_package libquavel${soversion})
set(common_description "Reads the image size, orientation, capture dates, camera, lens and exposure
from camera files (TIFF, DNG, NEF, CR2, RAF, ARW, JPEG, NRW, 3FR, CR3).")

set(CPACK_DEBIAN_RUNTIME_PACKAGE_NAME ${runtime_package})
set(CPACK_DEBIAN_RUNTIME_PACKAGE_SECTION libs)
file(WRITE ${CMAKE_CURRENT_BINARY_DIR}/debian/triggers "activate-noawait ldconfig\n")
file(CHMOD ${CMAKE_CURRENT_BINARY_DIR}/debian/triggers
  PERMISSIONS OWNER_READ OWNER_WRITE GROUP_READ WORLD_READ)
set(CPACK_DEBIAN_RUNTIME_PACKAGE_CONTROL_EXTRA ${CMAKE_CURRENT_BINARY_DIR}/debian/triggers)
set(CPACK_COMPONENT_RUNTIME_DESCRIPTION
    "shooting metadata from camera files - shared library\n${common_description}")

set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_NAME libquavel-dev)
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_SECTION libdevel)
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_DEPENDS
    "${runtime_package} (= ${PROJECT_VERSION}-${CPACK_DEBIAN_PACKAGE_RELEASE})")
set(CPACK_COMPONENT_DEVELOPMENT_DESCRIPTION
    "shooting metadata from camera files - development files\n${common_description}")

set(CPACK_DEBIAN_COMMAND_PACKAGE_NAME quavel)
set(CPACK_DEBIAN_COMMAND_PACKAGE_SECTION graphics)
set(CPACK_DEBIAN_COMMAND_PACKAGE_DEPENDS "${runtime_package} (>= ${PROJECT_VERSION})")
set(CPACK_COMPONENT_COMMAND_DESCRIPTION
    "shooting metadata from camera files - command\n${common_description}")

if(QUAVEL_BUILD_PYTHON)
  set(python_package python3-quavel)
  set(CPACK_DEBIAN_PYTHON_PACKAGE_NAME ${python_package})
  set(CPACK_DEBIAN_PYTHON_PACKAGE_SECTION python)
  set(CPACK_DEBIAN_PYTHON_PACKAGE_DEPENDS
      "${runtime_package} (>= ${PROJECT_VERSION}), python3 (>= ${python_version}), \
python3 (<< ${next_python_version})")
  set(CPACK_COMPONENT_PYTHON_DESCRIPTION
      "shooting metadata from camera files - Python package\n${common_description}")
  set(python_scripts ${CMAKE_CURRENT_BINARY_DIR}/debian/python)
  file(WRITE ${python_scripts}/postinst "#!/bin/sh\nset -e\npy3compile -p ${python_package}\n")
  file(WRITE ${python_scripts}/prerm "#!/bin/sh\nset -e\npy3clean -p ${python_package}\n")
  file(CHMOD ${python_scripts}/postinst ${python_scripts}/prerm PERMISSIONS
    OWNER_READ OWNER_WRITE OWNER_EXECUTE GROUP_READ GROUP_EXECUTE WORLD_READ WORLD_EXECUTE)
  set(CPACK_DEBIAN_PYTHON_PACKAGE_CONTROL_EXTRA ${python_scripts}/postinst ${python_scripts}/prerm)
endif()

set(CPACK_PRE_BUILD_SCRIPTS ${CMAKE_CURRENT_SOURCE_DIR}/cmake/FinishDebianTree.cmake)
include(CPack)
