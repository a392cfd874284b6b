# zr_add_test(NAME SOURCES file... [LIBS target...] [LABELS label...] [TIMEOUT seconds])
#
# One GoogleTest program. Every TEST in it becomes a ctest test called NAME.<Suite>.<Case>. The label `corpus` marks
# the tier that runs over whole files of real queries.
include(GoogleTest)

function(zr_add_test name)
  cmake_parse_arguments(PARSE_ARGV 1 arg "" "TIMEOUT" "SOURCES;LIBS;LABELS;DEFINITIONS")
  if(NOT arg_TIMEOUT)
    set(arg_TIMEOUT 120)
  endif()
  if(ZR_SANITIZE)
    math(EXPR arg_TIMEOUT "${arg_TIMEOUT} * 5") # everything takes some ten times as long there
  endif()
  add_executable(${name} ${arg_SOURCES})
  target_link_libraries(${name} PRIVATE ${arg_LIBS} GTest::gtest_main GTest::gmock zr_warnings)
  target_compile_definitions(${name} PRIVATE ${arg_DEFINITIONS})
  # A test's own code runs once: compiling it fast is worth more than running it fast.
  target_compile_options(${name} PRIVATE $<$<CONFIG:Release>:-O1>)
  set_target_properties(${name} PROPERTIES RUNTIME_OUTPUT_DIRECTORY "${PROJECT_BINARY_DIR}/bin/tests")
  gtest_discover_tests(${name} TEST_PREFIX "${name}." NO_PRETTY_VALUES DISCOVERY_TIMEOUT 60
                       PROPERTIES TIMEOUT ${arg_TIMEOUT} LABELS "${arg_LABELS}")
endfunction()

# zr_rediscover_with(NAME pattern...): the program has a case for each of these files, so its list of tests is made again
# when one comes or changes.
function(zr_rediscover_with name)
  file(GLOB files CONFIGURE_DEPENDS ${ARGN})
  set_property(TARGET ${name} APPEND PROPERTY LINK_DEPENDS ${files})
endfunction()
