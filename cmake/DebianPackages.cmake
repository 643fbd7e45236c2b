# The Debian packages, which cpack makes of what cmake --install puts in place, a component each:
#
#   command      quenby           the command, its manual pages and completions
#   library      libquenbyN       libquenby.so.N for C, N being its QUENBY_ABI
#   development  libquenby-dev    headers, static libraries and what CMake and pkg-config read
#   jni          libquenby-jni    the natives
#   java         libquenby-java   the classes over them
#
# Dates in them come from SOURCE_DATE_EPOCH, where it is set.

set(CPACK_GENERATOR DEB)
set(CPACK_PACKAGE_NAME quenby)
set(CPACK_PACKAGE_VENDOR Pelorin)
set(CPACK_PACKAGE_VERSION ${PROJECT_VERSION})
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "") # every package has its own
set(CPACK_PACKAGING_INSTALL_PREFIX /usr)
set(CPACK_INSTALL_DEFAULT_DIRECTORY_PERMISSIONS
    OWNER_READ OWNER_WRITE OWNER_EXECUTE GROUP_READ GROUP_EXECUTE WORLD_READ WORLD_EXECUTE)
set(CPACK_STRIP_FILES ON)
set(CPACK_DEB_COMPONENT_INSTALL ON)
set(CPACK_DEBIAN_ENABLE_COMPONENT_DEPENDS OFF)
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_PRIORITY optional)
set(CPACK_DEBIAN_PACKAGE_CONTROL_STRICT_PERMISSION ON)
set(CPACK_DEBIAN_PACKAGE_MAINTAINER ${PELORIN_MAINTAINER})
set(CPACK_DEBIAN_PACKAGE_DEPENDS "")
configure_file(packaging/copyright.in packaging/copyright @ONLY)

# quenby_package(<component> <package> <section> <summary> <description> [ALL] [SHARED] [DEPENDS ...])
# ALL: for every architecture. SHARED: its libraries' dependencies are read from them.
set(CPACK_COMPONENTS_ALL "")
function(quenby_package component package section summary description)
  cmake_parse_arguments(PARSE_ARGV 5 arg "ALL;SHARED" "" "DEPENDS")
  string(TOUPPER ${component} COMPONENT)
  list(JOIN arg_DEPENDS ", " depends)
  list(APPEND CPACK_COMPONENTS_ALL ${component})
  set(CPACK_COMPONENTS_ALL ${CPACK_COMPONENTS_ALL} PARENT_SCOPE)
  set(CPACK_DEBIAN_${COMPONENT}_PACKAGE_NAME ${package} PARENT_SCOPE)
  set(CPACK_DEBIAN_${COMPONENT}_PACKAGE_SECTION ${section} PARENT_SCOPE)
  set(CPACK_DEBIAN_${COMPONENT}_PACKAGE_DEPENDS "${depends}" PARENT_SCOPE)
  set(CPACK_DEBIAN_${COMPONENT}_PACKAGE_SHLIBDEPS ${arg_SHARED} PARENT_SCOPE)
  set(CPACK_DEBIAN_${COMPONENT}_DESCRIPTION "${summary}\n${description}" PARENT_SCOPE)
  if(arg_ALL)
    set(CPACK_DEBIAN_${COMPONENT}_PACKAGE_ARCHITECTURE all PARENT_SCOPE)
  endif()
  set(documents ${CMAKE_INSTALL_DATAROOTDIR}/doc/${package})
  install(FILES ${PROJECT_BINARY_DIR}/packaging/copyright DESTINATION ${documents}
          COMPONENT ${component})
  install(
    CODE "set(changelog \"\$ENV{DESTDIR}\${CMAKE_INSTALL_PREFIX}/${documents}/changelog.gz\")
  execute_process(COMMAND \"${PROJECT_SOURCE_DIR}/packaging/changelog.sh\" ${PROJECT_VERSION}
                          \"${PELORIN_MAINTAINER}\" OUTPUT_FILE \"\${changelog}\"
                  COMMAND_ERROR_IS_FATAL ANY)"
    COMPONENT ${component})
endfunction()

if(PELORIN_CLI)
  quenby_package(
    command quenby graphics "enhance photos, find near-duplicates, score quality"
    "Quenby brightens photos with care for faces and local contrast, applies looks,
finds near-duplicates, scores quality and finds corners. Metadata is kept.
The same photo and options give the same bytes on every processor."
    # Cairo and SQLite are loaded when something is drawn or a database is opened.
    SHARED DEPENDS fonts-dejavu-core libcairo2 libsqlite3-0)
endif()
set(development "")
if(NOT TARGET pelorin_instruction_sets)
  list(APPEND development libhwy-dev)
endif()
if(PELORIN_PHOTO)
  list(APPEND development libfmt-dev libjpeg-dev liblcms2-dev libpng-dev libpugixml-dev libsqlite3-dev
       zlib1g-dev)
endif()
if(TARGET pelorin_c)
  get_target_property(abi pelorin_c SOVERSION)
  quenby_package(
    library libquenby${abi} libs "enhance photos, for programs"
    "The engine of Quenby and whole photos behind an interface in C: sessions on
pixels, photos from bytes to bytes, near-duplicates, NIQE, corners."
    SHARED)
  # Only a whole package could have them made.
  set(control ${PROJECT_BINARY_DIR}/packaging)
  file(CONFIGURE OUTPUT ${control}/triggers CONTENT "activate-noawait ldconfig\n")
  file(CONFIGURE OUTPUT ${control}/shlibs
       CONTENT "libquenby ${abi} libquenby${abi} (>= ${PROJECT_VERSION})\n")
  set(CPACK_DEBIAN_LIBRARY_PACKAGE_CONTROL_EXTRA ${control}/triggers ${control}/shlibs)
  list(PREPEND development "libquenby${abi} (= ${PROJECT_VERSION})")
endif()
quenby_package(
  development libquenby-dev libdevel "enhance photos, for programs: headers and libraries"
  "Headers, static libraries for C++, and what CMake and pkg-config read, for
programs in C and C++."
  DEPENDS ${development})
if(PELORIN_JARS)
  quenby_package(
    jni libquenby-jni java "enhance photos in Java: native libraries"
    "The native libraries that the classes of libquenby-java load." SHARED)
  install(FILES ${PROJECT_SOURCE_DIR}/packaging/libquenby-jni.overrides
          DESTINATION ${CMAKE_INSTALL_DATAROOTDIR}/lintian/overrides RENAME libquenby-jni COMPONENT jni)
  set(CPACK_DEBIAN_JNI_PACKAGE_SHLIBDEPS_PRIVATE_DIRS ${PROJECT_BINARY_DIR}/lib)
  quenby_package(
    java libquenby-java java "enhance photos in Java"
    "Sessions on bitmaps, whole photos as bytes, near-duplicates and quality for
programs on a Java virtual machine, in two jars: quenby and, with bitmaps for
desktops, quenby-desktop."
    ALL DEPENDS "libquenby-jni (>= ${PROJECT_VERSION})")
endif()
include(CPack)

add_custom_target(
  packages
  COMMAND ${CMAKE_COMMAND} -E rm -rf ${PROJECT_BINARY_DIR}/packages
  COMMAND ${CMAKE_CPACK_COMMAND} -B ${PROJECT_BINARY_DIR}/packages
  COMMAND ${CMAKE_COMMAND} -E rm -rf ${PROJECT_BINARY_DIR}/packages/_CPack_Packages
  COMMENT "Making the Debian packages")
foreach(target pelorin_image_processing pelorin_photo_collection pelorin_c natives plain_jars quenby_pages)
  if(TARGET ${target})
    add_dependencies(packages ${target})
  endif()
endforeach()
