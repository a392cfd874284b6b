# The libraries that are called. zr::antlr3c, zr::uuid and ICU::* serve the library; the rest serve host, tool, tests.

find_path(ZR_ANTLR3C_INCLUDE_DIR antlr3.h REQUIRED)
find_library(ZR_ANTLR3C_LIBRARY antlr3c REQUIRED)
add_library(zr::antlr3c UNKNOWN IMPORTED GLOBAL)
set_target_properties(zr::antlr3c PROPERTIES IMPORTED_LOCATION "${ZR_ANTLR3C_LIBRARY}"
                                             INTERFACE_INCLUDE_DIRECTORIES "${ZR_ANTLR3C_INCLUDE_DIR}")

find_path(ZR_UUID_INCLUDE_DIR uuid/uuid.h REQUIRED)
find_library(ZR_UUID_LIBRARY uuid REQUIRED)
add_library(zr::uuid UNKNOWN IMPORTED GLOBAL)
set_target_properties(zr::uuid PROPERTIES IMPORTED_LOCATION "${ZR_UUID_LIBRARY}"
                                          INTERFACE_INCLUDE_DIRECTORIES "${ZR_UUID_INCLUDE_DIR}")

find_package(ICU REQUIRED COMPONENTS uc i18n)
find_package(Threads REQUIRED)

if(ZR_BUILD_TOOLS)
  find_package(nlohmann_json REQUIRED)
  find_package(CLI11 REQUIRED)
  find_package(SQLite3 REQUIRED)
endif()
if(ZR_BUILD_TESTS)
  find_package(GTest REQUIRED)
endif()
if(ZR_BUILD_BENCH)
  find_package(benchmark REQUIRED)
endif()
