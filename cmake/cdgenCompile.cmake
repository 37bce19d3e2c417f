# cdgen_compile(TARGET SOURCE OUTPUT [BYTE_ORDER big|little] [NO_TIMESTAMP])
#
# Compiles the class definition SOURCE into the database OUTPUT as part of the build. Relative paths count from the
# current source and the current binary directory. TARGET is made if it does not exist and then belongs to "all";
# an existing one, of several databases or a program that needs them, waits for the database.
#
#   BYTE_ORDER    of the machine that will read the database; the one of the machine that builds if left out
#   NO_TIMESTAMP  the database has no time of building: equal sources then make equal files
#
# The database is made anew when the source or cdgen has changed. If the source is at fault, what was there stays.

function(cdgen_compile TARGET SOURCE OUTPUT)
  cmake_parse_arguments(PARSE_ARGV 3 arg "NO_TIMESTAMP" "BYTE_ORDER" "")
  if(DEFINED arg_UNPARSED_ARGUMENTS OR DEFINED arg_KEYWORDS_MISSING_VALUES)
    message(FATAL_ERROR "cdgen_compile: cannot read \"${arg_UNPARSED_ARGUMENTS}${arg_KEYWORDS_MISSING_VALUES}\"")
  endif()
  if(DEFINED arg_BYTE_ORDER AND NOT arg_BYTE_ORDER MATCHES "^(big|little)$")
    message(FATAL_ERROR "cdgen_compile: BYTE_ORDER is big or little, not \"${arg_BYTE_ORDER}\"")
  endif()
  cmake_path(ABSOLUTE_PATH SOURCE BASE_DIRECTORY "${CMAKE_CURRENT_SOURCE_DIR}" NORMALIZE)
  cmake_path(ABSOLUTE_PATH OUTPUT BASE_DIRECTORY "${CMAKE_CURRENT_BINARY_DIR}" NORMALIZE)
  cmake_path(RELATIVE_PATH OUTPUT BASE_DIRECTORY "${CMAKE_BINARY_DIR}" OUTPUT_VARIABLE shown)

  set(script "${CMAKE_CURRENT_FUNCTION_LIST_DIR}/cdgenRun.cmake")
  add_custom_command(OUTPUT "${OUTPUT}"
    COMMAND "${CMAKE_COMMAND}" "-DCDGEN=$<TARGET_FILE:cdgen::cdgen>" "-DSOURCE=${SOURCE}" "-DOUTPUT=${OUTPUT}"
      "-DBYTE_ORDER=${arg_BYTE_ORDER}" "-DNO_TIMESTAMP=${arg_NO_TIMESTAMP}" -P "${script}"
    DEPENDS "${SOURCE}" "$<TARGET_FILE:cdgen::cdgen>" "${script}"
    COMMENT "Compiling class definition ${shown}"
    VERBATIM)

  # One target for each database: with two, a parallel make would run the command in both. Names that differ in what a
  # target's name cannot hold (a-b, a_b) differ in the hash.
  if(NOT TARGET "${TARGET}")
    add_custom_target("${TARGET}" ALL DEPENDS "${OUTPUT}")
  else()
    string(MD5 hash "${shown}")
    string(SUBSTRING "${hash}" 0 8 hash)
    string(MAKE_C_IDENTIFIER "${TARGET}_${shown}_${hash}" part)
    add_custom_target("${part}" DEPENDS "${OUTPUT}")
    add_dependencies("${TARGET}" "${part}")
  endif()
endfunction()
