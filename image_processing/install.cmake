# The engine by itself, for find_package(Quenby): static libraries, headers, the package files.
include(CMakePackageConfigHelpers)

set_target_properties(pelorin_image_processing PROPERTIES EXPORT_NAME image_processing)
install(TARGETS pelorin_image_processing pelorin_highway ${engine_libraries} EXPORT QuenbyTargets)
if(TARGET pelorin_instruction_sets)
  install(TARGETS pelorin_instruction_sets EXPORT QuenbyTargets)
endif()
install(DIRECTORY ${PROJECT_SOURCE_DIR}/image_processing
        DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/quenby
        FILES_MATCHING PATTERN "*.h")

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
