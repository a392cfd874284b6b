# What hosts link: libzrparsersql, the objects of the static pieces in one shared library, which shows what exports.map
# lists; the descriptor classes and the character stream, which it doesn't show, as static libraries for a host to
# bring along, one declaration for both sides.

foreach(part IN ITEMS "zr_descriptors;descriptors;CXX;zr_model;zr_platform" "zr_host_stream;stream;C;zr_stream")
  list(POP_FRONT part target name language)
  add_library(${target} STATIC)
  add_library(ZRParserSQL::${name} ALIAS ${target})
  foreach(piece IN LISTS part)
    target_sources(${target} PRIVATE $<TARGET_OBJECTS:${piece}>)
  endforeach()
  set_target_properties(${target} PROPERTIES EXPORT_NAME ${name} OUTPUT_NAME zrparsersql-${name} LINKER_LANGUAGE ${language})
  target_include_directories(${target} INTERFACE "$<BUILD_INTERFACE:${PROJECT_SOURCE_DIR}/include>"
                                                 "$<INSTALL_INTERFACE:${CMAKE_INSTALL_INCLUDEDIR}>")
endforeach()
target_compile_features(zr_descriptors INTERFACE cxx_std_20)
target_link_libraries(zr_descriptors INTERFACE ICU::uc zr::uuid)
target_link_libraries(zr_host_stream INTERFACE zr::antlr3c)

add_library(zrparsersql SHARED)
add_library(ZRParserSQL::zrparsersql ALIAS zrparsersql)
foreach(piece zr_platform zr_message_box zr_model zr_stream zr_engine zr_grammars zr_parser zr_analysis)
  target_sources(zrparsersql PRIVATE $<TARGET_OBJECTS:${piece}>)
endforeach()
set_target_properties(zrparsersql PROPERTIES VERSION ${PROJECT_VERSION} SOVERSION ${PROJECT_VERSION_MAJOR}
                                             LINKER_LANGUAGE CXX)
# The generated context headers, and the runtime whose types they name, are part of the interface.
target_include_directories(
  zrparsersql INTERFACE "$<BUILD_INTERFACE:${PROJECT_SOURCE_DIR}/include>"
                        "$<BUILD_INTERFACE:$<TARGET_PROPERTY:zr_grammars,INTERFACE_INCLUDE_DIRECTORIES>>"
                        "$<INSTALL_INTERFACE:${CMAKE_INSTALL_INCLUDEDIR}>")
set(zr_exports "${PROJECT_SOURCE_DIR}/cmake/exports.map")
target_link_options(zrparsersql PRIVATE "LINKER:--version-script,${zr_exports}")
set_target_properties(zrparsersql PROPERTIES LINK_DEPENDS "${zr_exports}")
# Whoever finds the installed package gets the descriptors from its configuration, where C++ is at hand: a program in C
# calls the recognisers alone.
target_link_libraries(zrparsersql PRIVATE ICU::i18n ICU::uc zr::uuid Threads::Threads PUBLIC zr::antlr3c
                                  INTERFACE $<BUILD_INTERFACE:zr_descriptors> zr_host_stream)
if(NOT ZR_SANITIZE)
  target_link_options(zrparsersql PRIVATE LINKER:--no-undefined)
endif()
