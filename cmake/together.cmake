# Compiles several sources of a library at a time. Most of the time of a small source goes into the headers and templates
# that its neighbours need too, so a group takes hardly longer than one of its sources alone.

set(large_group 4) # the next folder begins another group
set(largest_group 7)

# Sources that would not compile after their neighbours, because both use the same name for something of their own.
set(compiled_alone
  src/cdef/gate/git.cpp
  src/cdef/source/bounds.cpp
  src/cdef/source/stanza.cpp
  src/cdef/support/text_of_file.cpp
  src/check/examples.cpp
  src/check/warnings/unknown.cpp
  src/compiler/cdgen_attr_values.cpp
  src/compiler/cdgen_bld.cpp
  src/compiler/cdgen_kind_dattr.cpp
  src/compiler/cdgen_kind_pattr.cpp
  src/compiler/cdgen_kind_sd.cpp
  src/compiler/cdgen_swap.cpp
  src/compiler/cdgen_util_tables.cpp
  src/reader/region_map.cpp
  src/reader/repair.cpp
  src/report/text.cpp
  src/server/completion.cpp
  src/server/tokens.cpp
  src/text/unified_diff.cpp
  tests/unit/cdef/source/proof_test.cpp
  tests/unit/cdef/source/range_test.cpp
  tests/unit/check/examples_test.cpp
  tests/unit/check/value_notes_test.cpp
  tests/unit/compiler/cdgen_attr_values_test.cpp
  tests/unit/compiler/cdgen_bld_test.cpp
  tests/unit/compiler/cdgen_catalogue_test.cpp
  tests/unit/compiler/cdgen_kind_action_test.cpp
  tests/unit/compiler/cdgen_kind_attr_test.cpp
  tests/unit/compiler/cdgen_kind_sd_test.cpp
  tests/unit/compiler/cdgen_stray_range_test.cpp
  tests/unit/compiler/cdgen_swap_sections_test.cpp
  tests/unit/compiler/cdgen_swap_test.cpp
  tests/unit/compiler/cdgen_util_serial_test.cpp
  tests/unit/compiler/cdgen_util_tables_test.cpp
  tests/unit/compiler/cdgen_util_values_test.cpp
  tests/unit/fuzz/mutate_source_test.cpp
  tests/unit/language/misspellings_test.cpp
  tests/unit/language/names_test.cpp
  tests/unit/language/words_test.cpp
  tests/unit/reader/diagnosis_test.cpp
  tests/unit/report/report_test.cpp)

# Divides a target's sources into groups, in their order.
function(compile_together target)
  get_target_property(place ${target} SOURCE_DIR)
  get_target_property(sources ${target} SOURCES)
  list(FILTER sources INCLUDE REGEX "\\.cpp$")
  set(group 0)
  set(size 0)
  set(folder_before "")
  foreach(source IN LISTS sources)
    cmake_path(ABSOLUTE_PATH source BASE_DIRECTORY "${place}" NORMALIZE)
    cmake_path(RELATIVE_PATH source BASE_DIRECTORY "${PROJECT_SOURCE_DIR}" OUTPUT_VARIABLE name)
    if(name IN_LIST compiled_alone)
      continue()
    endif()
    cmake_path(GET name PARENT_PATH folder)
    if(size EQUAL largest_group OR (size GREATER_EQUAL large_group AND NOT folder STREQUAL folder_before))
      math(EXPR group "${group} + 1")
      set(size 0)
    endif()
    set_source_files_properties("${source}" TARGET_DIRECTORY ${target} PROPERTIES UNITY_GROUP ${group})
    math(EXPR size "${size} + 1")
    set(folder_before "${folder}")
  endforeach()
  set_target_properties(${target} PROPERTIES UNITY_BUILD ON UNITY_BUILD_MODE GROUP)
endfunction()

set(targets cdgen_unit fuzz_mutate cdef_fuzz)
if(NOT CDGEN_TOGETHER STREQUAL "TESTS")
  list(APPEND targets cdgen_text cdb_view cdgen_language cdgen_compiler cdgen_compare cdgen_check cdgen_config
    cdgen_report cdgen_build cdgen_formatter cdgen_index cdgen_gate cdgen_server cdef_core)
endif()
foreach(target IN LISTS targets)
  if(TARGET ${target})
    compile_together(${target})
  endif()
endforeach()
