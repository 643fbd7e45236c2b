# pelorin_pkg_config(<name> <description> LIBRARIES <library>... [REQUIRES <package>...]
# [USES <package>...]): what pkg-config reads. Libraries come before those that they need, without "lib".
# What they use a program links as well when they are static, and with --static alone when not.
function(pelorin_pkg_config name description)
  cmake_parse_arguments(PARSE_ARGV 2 arg "" "" "LIBRARIES;REQUIRES;USES")
  file(RELATIVE_PATH to_prefix /${CMAKE_INSTALL_LIBDIR}/pkgconfig /)
  list(TRANSFORM arg_LIBRARIES PREPEND -l)
  list(JOIN arg_LIBRARIES " " libraries)
  set(private ${arg_USES})
  if(NOT BUILD_SHARED_LIBS)
    list(APPEND arg_REQUIRES ${private})
    set(private "")
  endif()
  list(JOIN arg_REQUIRES ", " requires)
  list(JOIN private ", " requires_private)
  configure_file(${PROJECT_SOURCE_DIR}/cmake/package.pc.in ${CMAKE_CURRENT_BINARY_DIR}/${name}.pc @ONLY)
  install(FILES ${CMAKE_CURRENT_BINARY_DIR}/${name}.pc DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
endfunction()
