# cdgen_compile(TARGET SOURCE OUTPUT [BYTE_ORDER native|little|big|both] [NO_TIMESTAMP] [WERROR] [GATE BASELINE])
#
# Builds the database OUTPUT of the class definition SOURCE with "cdef build", which shows every error and warning, and
# replaces the database in one step. Relative paths count from the current source and the current binary directory.
# TARGET is made if it does not exist and then belongs to "all"; an existing one, of several databases or a program that
# needs them, waits for the database.
#
#   BYTE_ORDER    of the machines that will read the database; that of the machine that builds if left out. With both,
#                 OUTPUT NAME.cdef stands for NAME.le.cdef and NAME.be.cdef
#   NO_TIMESTAMP  the database has no time of building: equal sources then make equal files
#   WERROR        a source with warnings makes no database
#   GATE          a source that breaks those who rely on an older version makes no database either. BASELINE is that
#                 version as "cdef gate" takes it: a file, a directory, or git:REVISION[:PATH]; relative paths count from
#                 the current source directory. cdef.toml chooses the level, and the file of numbers, which is ids.lock
#                 beside cdef.toml, or beside the source, if left out
#
# The database is built again when the source, its cdef.toml or cdef has changed; GATE is checked in each build. If the
# source has errors, the old database stays.

# The project file that cdef finds for a source; empty if there is none.
function(cdgen_project_file SOURCE variable)
  set(found "")
  cmake_path(GET SOURCE PARENT_PATH at)
  while(NOT found)
    if(EXISTS "${at}/cdef.toml" AND NOT IS_DIRECTORY "${at}/cdef.toml")
      set(found "${at}/cdef.toml")
    endif()
    cmake_path(GET at PARENT_PATH above)
    if(above STREQUAL at)
      break()
    endif()
    set(at "${above}")
  endwhile()
  set("${variable}" "${found}" PARENT_SCOPE)
endfunction()

function(cdgen_compile TARGET SOURCE OUTPUT)
  cmake_parse_arguments(PARSE_ARGV 3 arg "NO_TIMESTAMP;WERROR" "BYTE_ORDER;GATE" "")
  if(DEFINED arg_UNPARSED_ARGUMENTS OR DEFINED arg_KEYWORDS_MISSING_VALUES)
    message(FATAL_ERROR "cdgen_compile: cannot read \"${arg_UNPARSED_ARGUMENTS}${arg_KEYWORDS_MISSING_VALUES}\"")
  endif()
  if(NOT DEFINED arg_BYTE_ORDER)
    set(arg_BYTE_ORDER native)
  elseif(NOT arg_BYTE_ORDER MATCHES "^(native|little|big|both)$")
    message(FATAL_ERROR "cdgen_compile: BYTE_ORDER is native, little, big or both, not \"${arg_BYTE_ORDER}\"")
  endif()
  if(NOT TARGET cdgen::cdef)
    message(FATAL_ERROR "cdgen_compile: this cdgen was installed without cdef, which builds databases")
  endif()
  cmake_path(ABSOLUTE_PATH SOURCE BASE_DIRECTORY "${CMAKE_CURRENT_SOURCE_DIR}" NORMALIZE)
  cmake_path(ABSOLUTE_PATH OUTPUT BASE_DIRECTORY "${CMAKE_CURRENT_BINARY_DIR}" NORMALIZE)
  cmake_path(RELATIVE_PATH OUTPUT BASE_DIRECTORY "${CMAKE_BINARY_DIR}" OUTPUT_VARIABLE shown)
  cmake_path(GET OUTPUT PARENT_PATH place)
  cmake_path(GET OUTPUT FILENAME name)

  set(databases "${OUTPUT}")
  if(arg_BYTE_ORDER STREQUAL "both")
    string(REGEX REPLACE "\\.cdef$" "" base "${OUTPUT}")
    set(databases "${base}.le.cdef" "${base}.be.cdef")
  endif()
  set(time now)
  if(arg_NO_TIMESTAMP)
    set(time none)
  endif()
  set(options "--output=${name}" "--byte-order=${arg_BYTE_ORDER}" "--timestamp=${time}")
  if(arg_WERROR)
    list(APPEND options --werror)
  endif()

  # The hash distinguishes names that are equal without characters that a target's name cannot have (a-b, a_b).
  string(MD5 hash "${shown}")
  string(SUBSTRING "${hash}" 0 8 hash)

  cdgen_project_file("${SOURCE}" project)
  set(depends ${project})
  set(gate "")
  if(DEFINED arg_GATE)
    if(NOT arg_GATE MATCHES "^git:")
      cmake_path(ABSOLUTE_PATH arg_GATE BASE_DIRECTORY "${CMAKE_CURRENT_SOURCE_DIR}" NORMALIZE)
    endif()
    set(strict "")
    if(arg_WERROR)
      set(strict --werror)
    endif()
    # A target, because it is run in each build: a build system cannot know when a revision, a directory of older
    # versions or a file of numbers has changed.
    set(gate "cdgen_gate_${hash}")
    add_custom_target("${gate}"
      COMMAND "$<TARGET_FILE:cdgen::cdef>" gate "--against=${arg_GATE}" ${strict} -- "${SOURCE}"
      VERBATIM)
  endif()

  # A database that comes out as it was keeps its time. Ninja looks at it again after the command if the command has
  # byproducts, and here a stamp is one. Other build systems go by times alone.
  set(stamp "${CMAKE_CURRENT_BINARY_DIR}/CMakeFiles/cdgen_${hash}.stamp")
  if(CMAKE_GENERATOR MATCHES "Ninja")
    set(restat BYPRODUCTS "${stamp}" COMMAND "${CMAKE_COMMAND}" -E touch "${stamp}")
  else()
    set(restat COMMAND "${CMAKE_COMMAND}" -E touch_nocreate ${databases})
  endif()

  # A class without a Name is named after the output as given on the command line, which is the bare file name.
  add_custom_command(OUTPUT ${databases}
    COMMAND "${CMAKE_COMMAND}" -E make_directory "${place}"
    COMMAND "${CMAKE_COMMAND}" -E chdir "${place}" "$<TARGET_FILE:cdgen::cdef>" build ${options} -- "${SOURCE}"
    ${restat}
    DEPENDS "${SOURCE}" ${depends} ${gate} "$<TARGET_FILE:cdgen::cdef>"
    COMMENT "Building class definition ${shown}"
    VERBATIM)

  # One target for each database: with two, a parallel make would run the command in both.
  if(NOT TARGET "${TARGET}")
    add_custom_target("${TARGET}" ALL DEPENDS ${databases})
  else()
    string(MAKE_C_IDENTIFIER "${TARGET}_${shown}_${hash}" part)
    add_custom_target("${part}" DEPENDS ${databases})
    add_dependencies("${TARGET}" "${part}")
  endif()
endfunction()
