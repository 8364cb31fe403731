# Run by cpack on the trees it is about to pack: gives each Debian package the documents that the
# Debian policy asks of it, in the form it asks for.
cmake_minimum_required(VERSION 3.23)
if(NOT CPACK_GENERATOR STREQUAL "DEB")
  return()
endif()

# Without these, cpack silently makes packages that have no dependencies.
foreach(tool_and_package IN ITEMS "dpkg-shlibdeps;dpkg-dev" "file;file")
  list(GET tool_and_package 0 tool)
  list(GET tool_and_package 1 package)
  find_program(found_${tool} ${tool})
  if(NOT found_${tool})
    message(FATAL_ERROR "Debian packages need ${tool}: install the package ${package}.")
  endif()
endforeach()

# The time in the packages is that of the sources, so that the same sources make the same packages.
if(NOT DEFINED ENV{SOURCE_DATE_EPOCH})
  execute_process(COMMAND git log -1 --format=%ct
    WORKING_DIRECTORY ${CMAKE_CURRENT_LIST_DIR} ERROR_QUIET
    OUTPUT_VARIABLE time OUTPUT_STRIP_TRAILING_WHITESPACE)
  if(time)
    set(ENV{SOURCE_DATE_EPOCH} ${time})
  endif()
endif()

string(TIMESTAMP date "%a, %d %b %Y %H:%M:%S +0000" UTC)
foreach(component IN LISTS CPACK_COMPONENTS_ALL)
  set(tree ${CPACK_TEMPORARY_DIRECTORY}/${component}/usr)
  string(TOUPPER ${component} upper)
  set(docs ${tree}/share/doc/${CPACK_DEBIAN_${upper}_PACKAGE_NAME})

  configure_file(${CPACK_RESOURCE_FILE_LICENSE} ${docs}/copyright
    NO_SOURCE_PERMISSIONS COPYONLY)
  file(WRITE ${docs}/changelog.Debian
"quavel (${CPACK_PACKAGE_VERSION}-${CPACK_DEBIAN_PACKAGE_RELEASE}) unstable; urgency=medium

  * The changes are listed in the project's CHANGELOG.md.

 -- ${CPACK_DEBIAN_PACKAGE_MAINTAINER}  ${date}
")
  file(GLOB pages ${tree}/share/man/*/*)
  execute_process(COMMAND gzip -9nf ${docs}/changelog.Debian ${pages} COMMAND_ERROR_IS_FATAL ANY)
endforeach()

# Everybody may read what is installed, whatever umask this runs with.
execute_process(COMMAND chmod -R u=rwX,go=rX ${CPACK_TEMPORARY_DIRECTORY} COMMAND_ERROR_IS_FATAL ANY)
