# What `cmake --install` puts where. Components: library, development, and tools for the program.

include(CMakePackageConfigHelpers)
set(zr_config_dir "${CMAKE_INSTALL_LIBDIR}/cmake/ZRParserSQL")

install(
  TARGETS zrparsersql zr_descriptors zr_host_stream
  EXPORT ZRParserSQLTargets
  LIBRARY DESTINATION "${CMAKE_INSTALL_LIBDIR}" COMPONENT library NAMELINK_COMPONENT development
  ARCHIVE DESTINATION "${CMAKE_INSTALL_LIBDIR}" COMPONENT development)

install(DIRECTORY "${PROJECT_SOURCE_DIR}/include/" "${PROJECT_BINARY_DIR}/grammar/generated/"
        DESTINATION "${CMAKE_INSTALL_INCLUDEDIR}" COMPONENT development FILES_MATCHING PATTERN "*.h")

install(EXPORT ZRParserSQLTargets NAMESPACE ZRParserSQL:: DESTINATION "${zr_config_dir}" COMPONENT development)
configure_package_config_file("${PROJECT_SOURCE_DIR}/cmake/ZRParserSQLConfig.cmake.in"
                              "${PROJECT_BINARY_DIR}/package/ZRParserSQLConfig.cmake"
                              INSTALL_DESTINATION "${zr_config_dir}" NO_SET_AND_CHECK_MACRO)
# Class layouts and virtual tables are an agreement between library and host that holds within one minor version.
write_basic_package_version_file("${PROJECT_BINARY_DIR}/package/ZRParserSQLConfigVersion.cmake"
                                 COMPATIBILITY SameMinorVersion)
install(FILES "${PROJECT_BINARY_DIR}/package/ZRParserSQLConfig.cmake"
              "${PROJECT_BINARY_DIR}/package/ZRParserSQLConfigVersion.cmake"
              "${PROJECT_SOURCE_DIR}/cmake/ZRParserSQLDependencies.cmake"
        DESTINATION "${zr_config_dir}" COMPONENT development)

# The prefix is told from where the file lies, so that an installed tree may be moved.
file(RELATIVE_PATH ZR_PREFIX_FROM_PKGCONFIG "/prefix/${CMAKE_INSTALL_LIBDIR}/pkgconfig" "/prefix")
string(REGEX REPLACE "/$" "" ZR_PREFIX_FROM_PKGCONFIG "${ZR_PREFIX_FROM_PKGCONFIG}")
configure_file("${PROJECT_SOURCE_DIR}/cmake/zrparsersql.pc.in" "${PROJECT_BINARY_DIR}/package/zrparsersql.pc" @ONLY)
install(FILES "${PROJECT_BINARY_DIR}/package/zrparsersql.pc" DESTINATION "${CMAKE_INSTALL_LIBDIR}/pkgconfig"
        COMPONENT development)

if(ZR_BUILD_TOOLS)
  # Outside of /usr the loader doesn't look for libraries by itself.
  if(NOT CMAKE_INSTALL_PREFIX STREQUAL "/usr")
    file(RELATIVE_PATH zr_lib_from_bin "/prefix/${CMAKE_INSTALL_BINDIR}" "/prefix/${CMAKE_INSTALL_LIBDIR}")
    set_target_properties(zrsql PROPERTIES INSTALL_RPATH "$ORIGIN/${zr_lib_from_bin}")
  endif()
  install(TARGETS zrsql RUNTIME DESTINATION "${CMAKE_INSTALL_BINDIR}" COMPONENT tools)
endif()

# What a developer reads and starts from, in the folders in which the documents link to each other. The pictures of the
# rules are there when they were drawn: the target zr_diagrams.
set(zr_guides "${CMAKE_INSTALL_DATAROOTDIR}/doc/libzrparsersql-dev")
install(FILES "${PROJECT_SOURCE_DIR}/README.md" DESTINATION "${zr_guides}" COMPONENT development)
install(DIRECTORY "${PROJECT_SOURCE_DIR}/docs" DESTINATION "${zr_guides}" COMPONENT development FILES_MATCHING
        PATTERN "*.md" PATTERN diagrams EXCLUDE PATTERN man EXCLUDE PATTERN completion EXCLUDE)
install(DIRECTORY "${PROJECT_SOURCE_DIR}/examples" DESTINATION "${zr_guides}" COMPONENT development
        PATTERN CMakeLists.txt EXCLUDE)
install(FILES "${PROJECT_SOURCE_DIR}/examples/embed/CMakeLists.txt" DESTINATION "${zr_guides}/examples/embed"
        COMPONENT development)
install(DIRECTORY "${PROJECT_BINARY_DIR}/docs/diagrams" DESTINATION "${zr_guides}/docs" COMPONENT development OPTIONAL
        FILES_MATCHING PATTERN "*.svg")
