# The engine by itself, for find_package(Quenby): libraries, headers, the package files.
include(CMakePackageConfigHelpers)

set_target_properties(pelorin_image_processing PROPERTIES EXPORT_NAME image_processing)
install(TARGETS pelorin_image_processing pelorin_highway ${engine_libraries} EXPORT QuenbyTargets)
pelorin_install_headers(${PELORIN_ENGINE_API})
set(libraries ${engine_libraries})
list(REVERSE libraries)
set(uses USES libhwy)
if(TARGET pelorin_instruction_sets)
  install(TARGETS pelorin_instruction_sets EXPORT QuenbyTargets)
  list(APPEND libraries pelorin_instruction_sets)
  set(uses "")
endif()
pelorin_pkg_config(quenby-image-processing "The engine of Quenby, in C++" LIBRARIES ${libraries}
                   ${uses})

set(package_folder ${CMAKE_INSTALL_LIBDIR}/cmake/Quenby)
install(EXPORT QuenbyTargets NAMESPACE Quenby:: DESTINATION ${package_folder})
configure_package_config_file(
  ${PROJECT_SOURCE_DIR}/cmake/QuenbyConfig.cmake.in ${PROJECT_BINARY_DIR}/QuenbyConfig.cmake
  INSTALL_DESTINATION ${package_folder})
write_basic_package_version_file(${PROJECT_BINARY_DIR}/QuenbyConfigVersion.cmake
                                 COMPATIBILITY SameMinorVersion)
install(FILES ${PROJECT_BINARY_DIR}/QuenbyConfig.cmake
              ${PROJECT_BINARY_DIR}/QuenbyConfigVersion.cmake
        DESTINATION ${package_folder})
