# libzrparsersql: the static pieces of the tree in one shared library. What it exports is what the headers mark as
# exported; everything else keeps hidden visibility.

set(zr_pieces)
foreach(piece zr_platform zr_model zr_engine zr_grammars zr_parser zr_analysis)
  if(TARGET ${piece})
    list(APPEND zr_pieces ${piece})
  endif()
endforeach()

if(zr_pieces)
  set(stub "${PROJECT_BINARY_DIR}/zrparsersql_module.cpp")
  file(CONFIGURE OUTPUT "${stub}" CONTENT "// The module's code is in the static pieces linked into it.\n")
  add_library(zrparsersql SHARED "${stub}")
  add_library(ZRParserSQL::zrparsersql ALIAS zrparsersql)
  set_target_properties(zrparsersql PROPERTIES VERSION ${PROJECT_VERSION} SOVERSION ${PROJECT_VERSION_MAJOR})
  target_include_directories(zrparsersql PUBLIC "$<BUILD_INTERFACE:${PROJECT_SOURCE_DIR}/include>")
  # Generated context headers, one a grammar, and the runtime whose types they name, are part of the interface.
  if(TARGET zr_grammars)
    target_include_directories(
      zrparsersql PUBLIC "$<BUILD_INTERFACE:$<TARGET_PROPERTY:zr_grammars,INTERFACE_INCLUDE_DIRECTORIES>>")
    add_dependencies(zrparsersql zr_grammars)
  endif()
  target_link_libraries(zrparsersql PUBLIC zr::antlr3c PRIVATE ${zr_pieces} zr_warnings)

  list(JOIN zr_pieces "," zr_piece_list)
  set_property(TARGET zrparsersql PROPERTY LINK_LIBRARY_OVERRIDE "WHOLE_ARCHIVE,${zr_piece_list}")
  if(NOT ZR_SANITIZE)
    target_link_options(zrparsersql PRIVATE LINKER:--no-undefined)
  endif()
endif()
