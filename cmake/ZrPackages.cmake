# Debian packages, one a component: libzrparsersql, libzrparsersql-dev, zrsql. `./dev package` makes them, in a build of
# its own for /usr; cpack in any other build folder makes them as well, with that build's folders.

set(CPACK_GENERATOR DEB)
set(CPACK_PACKAGE_NAME zrparsersql)
set(CPACK_PACKAGE_VERSION ${PROJECT_VERSION})
set(CPACK_PACKAGING_INSTALL_PREFIX /usr)
# Who builds packages answers for them: as Debian's own tools are told, or as git knows them, or as this machine does.
set(ZR_PACKAGE_MAINTAINER "" CACHE STRING "Maintainer of the Debian packages, as NAME <ADDRESS>")
set(zr_maintainer "${ZR_PACKAGE_MAINTAINER}")
if(NOT zr_maintainer AND DEFINED ENV{DEBFULLNAME} AND DEFINED ENV{DEBEMAIL})
  set(zr_maintainer "$ENV{DEBFULLNAME} <$ENV{DEBEMAIL}>")
endif()
if(NOT zr_maintainer)
  execute_process(COMMAND git -C "${PROJECT_SOURCE_DIR}" config user.name OUTPUT_VARIABLE zr_name
                  OUTPUT_STRIP_TRAILING_WHITESPACE ERROR_QUIET)
  execute_process(COMMAND git -C "${PROJECT_SOURCE_DIR}" config user.email OUTPUT_VARIABLE zr_address
                  OUTPUT_STRIP_TRAILING_WHITESPACE ERROR_QUIET)
  if(zr_name AND zr_address)
    set(zr_maintainer "${zr_name} <${zr_address}>")
  endif()
endif()
if(NOT zr_maintainer)
  cmake_host_system_information(RESULT zr_machine QUERY FQDN)
  set(zr_maintainer "ZRParserSQL builder <root@${zr_machine}>")
endif()
set(CPACK_PACKAGE_CONTACT "${zr_maintainer}")
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "") # each package has its own
set(CPACK_STRIP_FILES ON)
set(CPACK_COMPONENTS_ALL library development)
if(ZR_BUILD_TOOLS)
  list(APPEND CPACK_COMPONENTS_ALL tools)
endif()

set(CPACK_DEB_COMPONENT_INSTALL ON)
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_RELEASE 1)
set(CPACK_DEBIAN_PACKAGE_PRIORITY optional)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS_PRIVATE_DIRS "${PROJECT_BINARY_DIR}/lib")
set(CPACK_DEBIAN_PACKAGE_CONTROL_STRICT_PERMISSION ON)

# What a package needs is read off its binaries; what the other two need of the library is told here.
set(zr_debian_version "${PROJECT_VERSION}-${CPACK_DEBIAN_PACKAGE_RELEASE}")
set(zr_same_library "libzrparsersql (= ${zr_debian_version})")
# What a package that links the library needs: class layouts hold within one minor version.
math(EXPR zr_next_minor "${PROJECT_VERSION_MINOR} + 1")
configure_file("${PROJECT_SOURCE_DIR}/cmake/debian/shlibs.in" "${PROJECT_BINARY_DIR}/package/shlibs" @ONLY)

set(CPACK_DEBIAN_LIBRARY_PACKAGE_NAME libzrparsersql)
set(CPACK_DEBIAN_LIBRARY_PACKAGE_SECTION libs)
set(CPACK_DEBIAN_LIBRARY_PACKAGE_SHLIBDEPS ON)
set(CPACK_DEBIAN_LIBRARY_PACKAGE_CONTROL_EXTRA "${PROJECT_SOURCE_DIR}/cmake/debian/triggers"
                                               "${PROJECT_BINARY_DIR}/package/shlibs")
set(CPACK_DEBIAN_LIBRARY_DESCRIPTION
    "analysis of SQL query text of five dialects
The library reads the text of a query as MySQL, MS Access, PostgreSQL, SQL
Server or Oracle and tells what its result columns are, where each of them
comes from, which tables it reads, and what stands in each clause.")

set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_NAME libzrparsersql-dev)
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_SECTION libdevel)
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_DEPENDS "${zr_same_library}, libantlr3c-dev, libicu-dev, uuid-dev")
set(CPACK_DEBIAN_DEVELOPMENT_DESCRIPTION
    "analysis of SQL query text of five dialects - development files
The headers, the static libraries of the descriptor classes and of the
character stream, and what CMake and pkg-config need to find them.")

set(CPACK_DEBIAN_TOOLS_PACKAGE_NAME zrsql)
set(CPACK_DEBIAN_TOOLS_PACKAGE_SECTION database)
set(CPACK_DEBIAN_TOOLS_PACKAGE_SHLIBDEPS ON)
set(CPACK_DEBIAN_TOOLS_PACKAGE_DEPENDS "${zr_same_library}")
set(CPACK_DEBIAN_TOOLS_PACKAGE_SUGGESTS "mdbtools") # runs its programs for databases of MS Access
set(CPACK_DEBIAN_TOOLS_DESCRIPTION
    "shows what the library libzrparsersql sees in a SQL text
A program that shows the tokens of a query, its syntax tree, and the columns,
sources and clauses that the library finds in it, for one text or for a file
with one text a line.")

# Every Debian package brings its licence and its changes along: those of the project, and those of the packaging,
# which has none of its own.
find_program(ZR_GZIP gzip)
mark_as_advanced(ZR_GZIP)
set(zr_changes)
if(ZR_GZIP)
  string(TIMESTAMP zr_date "%a, %d %b %Y %H:%M:%S +0000" UTC) # SOURCE_DATE_EPOCH, where somebody sets it
  configure_file("${PROJECT_SOURCE_DIR}/cmake/debian/changelog.in" "${PROJECT_BINARY_DIR}/package/changelog" @ONLY)
  foreach(pair "${PROJECT_SOURCE_DIR}/CHANGELOG.md;changelog.gz"
               "${PROJECT_BINARY_DIR}/package/changelog;changelog.Debian.gz")
    list(GET pair 0 zr_from)
    list(GET pair 1 zr_to)
    execute_process(COMMAND "${ZR_GZIP}" -9nc "${zr_from}" OUTPUT_FILE "${PROJECT_BINARY_DIR}/package/${zr_to}"
                            COMMAND_ERROR_IS_FATAL ANY)
    list(APPEND zr_changes "${PROJECT_BINARY_DIR}/package/${zr_to}")
  endforeach()
  set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS "${PROJECT_SOURCE_DIR}/CHANGELOG.md")
endif()
foreach(component IN LISTS CPACK_COMPONENTS_ALL)
  string(TOUPPER ${component} zr_upper)
  set(zr_package "${CPACK_DEBIAN_${zr_upper}_PACKAGE_NAME}")
  install(FILES "${PROJECT_SOURCE_DIR}/cmake/debian/copyright" ${zr_changes}
          DESTINATION "${CMAKE_INSTALL_DATAROOTDIR}/doc/${zr_package}" COMPONENT ${component})
  install(FILES "${PROJECT_SOURCE_DIR}/cmake/debian/${zr_package}.lintian-overrides"
          DESTINATION "${CMAKE_INSTALL_DATAROOTDIR}/lintian/overrides" RENAME ${zr_package} COMPONENT ${component})
endforeach()

include(CPack)
