include(CMakePackageConfigHelpers)
include(GNUInstallDirs)

set(config_dir ${CMAKE_INSTALL_LIBDIR}/cmake/quavel)
set(pkgconfig_dir ${CMAKE_INSTALL_LIBDIR}/pkgconfig)

install(TARGETS quavel EXPORT quavelTargets
  RUNTIME COMPONENT runtime
  LIBRARY COMPONENT runtime NAMELINK_COMPONENT development
  ARCHIVE COMPONENT development
  FILE_SET HEADERS COMPONENT development)
install(EXPORT quavelTargets NAMESPACE quavel:: DESTINATION ${config_dir} COMPONENT development)

configure_package_config_file(cmake/quavelConfig.cmake.in quavelConfig.cmake
  INSTALL_DESTINATION ${config_dir} NO_SET_AND_CHECK_MACRO)
set(compatibility SameMajorVersion)
if(PROJECT_VERSION_MAJOR EQUAL 0)
  set(compatibility SameMinorVersion)  # the same rule as the SOVERSION's
endif()
write_basic_package_version_file(quavelConfigVersion.cmake COMPATIBILITY ${compatibility})
install(FILES
  ${CMAKE_CURRENT_BINARY_DIR}/quavelConfig.cmake
  ${CMAKE_CURRENT_BINARY_DIR}/quavelConfigVersion.cmake
  DESTINATION ${config_dir} COMPONENT development)

# Directories relative to the file itself, so that the tree can be moved.
foreach(dir IN ITEMS INCLUDEDIR LIBDIR)
  file(RELATIVE_PATH relative_dir /prefix/${pkgconfig_dir} /prefix/${CMAKE_INSTALL_${dir}})
  set(pc_${dir} "\${pcfiledir}/${relative_dir}")
  if(IS_ABSOLUTE "${CMAKE_INSTALL_INCLUDEDIR}" OR IS_ABSOLUTE "${CMAKE_INSTALL_LIBDIR}")
    set(pc_${dir} "${CMAKE_INSTALL_FULL_${dir}}")
  endif()
endforeach()
set(pc_cflags "")
if(library_type STREQUAL "STATIC_LIBRARY")
  set(pc_cflags " -DQUAVEL_STATIC_DEFINE")
endif()
configure_file(cmake/quavel.pc.in quavel.pc @ONLY)
install(FILES ${CMAKE_CURRENT_BINARY_DIR}/quavel.pc
  DESTINATION ${pkgconfig_dir} COMPONENT development)

install(FILES LICENSE DESTINATION ${CMAKE_INSTALL_DOCDIR} COMPONENT license)

# Programs installed beside the library find it wherever the tree is moved. This does not apply
# to the library's own target, which exists already.
if(PROJECT_IS_TOP_LEVEL AND NOT DEFINED CMAKE_INSTALL_RPATH)
  file(RELATIVE_PATH libdir_from_bindir
       /prefix/${CMAKE_INSTALL_BINDIR} /prefix/${CMAKE_INSTALL_LIBDIR})
  set(origin $ORIGIN)
  if(APPLE)
    set(origin @loader_path)
  endif()
  set(CMAKE_INSTALL_RPATH ${origin}/${libdir_from_bindir})
endif()
