# The libraries that a host links along with libzrparsersql and for which CMake has no module of its own: the parsing
# runtime as zr::antlr3c and libuuid as zr::uuid. Installed beside the package's configuration, so hosts find them the
# same way. ZRParserSQL_MISSING lists what isn't there.

set(ZRParserSQL_MISSING)
foreach(zr_part IN ITEMS "antlr3c;antlr3.h" "uuid;uuid/uuid.h")
  list(GET zr_part 0 zr_name)
  list(GET zr_part 1 zr_header)
  string(TOUPPER "ZR_${zr_name}" zr_variable)
  find_path(${zr_variable}_INCLUDE_DIR ${zr_header})
  find_library(${zr_variable}_LIBRARY ${zr_name})
  mark_as_advanced(${zr_variable}_INCLUDE_DIR ${zr_variable}_LIBRARY)
  if(NOT ${zr_variable}_INCLUDE_DIR OR NOT ${zr_variable}_LIBRARY)
    list(APPEND ZRParserSQL_MISSING "lib${zr_name} with ${zr_header}")
  elseif(NOT TARGET zr::${zr_name})
    add_library(zr::${zr_name} UNKNOWN IMPORTED GLOBAL)
    set_target_properties(zr::${zr_name} PROPERTIES IMPORTED_LOCATION "${${zr_variable}_LIBRARY}"
                                                    INTERFACE_INCLUDE_DIRECTORIES "${${zr_variable}_INCLUDE_DIR}")
  endif()
endforeach()
