# libzrparsersql: the objects of the static pieces in one shared library. What it exports stands in exports.map; the
# descriptor classes reach hosts as a static library, one declaration for both sides.

set(zr_pieces)
foreach(piece zr_platform zr_model zr_stream zr_engine zr_grammars zr_parser zr_analysis)
  if(TARGET ${piece})
    list(APPEND zr_pieces ${piece})
  endif()
endforeach()

if(zr_pieces)
  add_library(zrparsersql SHARED)
  add_library(ZRParserSQL::zrparsersql ALIAS zrparsersql)
  foreach(piece IN LISTS zr_pieces)
    target_sources(zrparsersql PRIVATE $<TARGET_OBJECTS:${piece}>)
  endforeach()
  set_target_properties(zrparsersql PROPERTIES VERSION ${PROJECT_VERSION} SOVERSION ${PROJECT_VERSION_MAJOR}
                                               LINKER_LANGUAGE CXX)
  target_include_directories(zrparsersql PUBLIC "$<BUILD_INTERFACE:${PROJECT_SOURCE_DIR}/include>")
  # The generated context headers, and the runtime whose types they name, are part of the interface.
  if(TARGET zr_grammars)
    target_include_directories(
      zrparsersql PUBLIC "$<BUILD_INTERFACE:$<TARGET_PROPERTY:zr_grammars,INTERFACE_INCLUDE_DIRECTORIES>>")
  endif()
  set(zr_exports "${PROJECT_SOURCE_DIR}/cmake/exports.map")
  target_link_options(zrparsersql PRIVATE "LINKER:--version-script,${zr_exports}")
  set_target_properties(zrparsersql PROPERTIES LINK_DEPENDS "${zr_exports}")
  # Descriptors and character stream are not exported: a host brings them along.
  target_link_libraries(zrparsersql INTERFACE zr_model zr_platform)
  target_link_libraries(zrparsersql PUBLIC zr_stream zr::antlr3c PRIVATE ICU::i18n ICU::uc zr::uuid Threads::Threads)
  if(NOT ZR_SANITIZE)
    target_link_options(zrparsersql PRIVATE LINKER:--no-undefined)
  endif()
endif()
