# cdgen_compile(TARGET SOURCE OUTPUT [BYTE_ORDER native|little|big|both] [NO_TIMESTAMP] [WERROR] [GATE BASELINE])
#
# Builds the database OUTPUT of the class definition SOURCE with "cdef build", which shows every error and warning, and
# replaces the database in one step. Relative paths count from the current source and the current binary directory.
# TARGET is made if it does not exist and then belongs to "all"; an existing one, of several databases or a program that
# needs them, waits for the database.
#
#   BYTE_ORDER    of the machines that will read the database. If left out, cdef.toml chooses it, and without that it is
#                 that of the machine that builds. With both, OUTPUT NAME.cdef stands for NAME.le.cdef and NAME.be.cdef
#   NO_TIMESTAMP  the database has no time. If left out, it has the time in the environment variable SOURCE_DATE_EPOCH or,
#                 if that is not set when the database is built, the time at which it is built
#   WERROR        a source with warnings makes no database
#   GATE          a source that breaks those who rely on an older version makes no database either. BASELINE is that
#                 version as "cdef gate" takes it: a file, a directory, git:REVISION or git:REVISION:PATH; relative paths
#                 count from the current source directory. cdef.toml chooses the level, and the file of numbers, which is
#                 ids.lock beside cdef.toml, or beside the source, if left out
#
# The database is built again when the source, its cdef.toml or cdef has changed, also if a cdef.toml has been added or
# removed; GATE is checked in each build. If the source has errors, the old database stays.

# The project file that cdef finds for a source; empty if there is none. CMake runs again if there is another one when
# the project is built.
function(cdgen_project_file SOURCE variable)
  cmake_path(GET SOURCE PARENT_PATH given)
  file(REAL_PATH "${given}" at)
  set(found "")
  set(patterns "")
  while(TRUE)
    cmake_path(APPEND at "cdef.toml" OUTPUT_VARIABLE candidate)
    if(NOT found AND (EXISTS "${candidate}" OR IS_SYMLINK "${candidate}") AND NOT IS_DIRECTORY "${candidate}")
      set(found "${candidate}")
    endif()
    string(REGEX REPLACE "([[*?])" "[\\1]" pattern "${candidate}")
    list(APPEND patterns "${pattern}")
    cmake_path(GET at PARENT_PATH above)
    if(above STREQUAL at)
      break()
    endif()
    set(at "${above}")
  endwhile()
  file(GLOB unused CONFIGURE_DEPENDS ${patterns})
  if(found)
    set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS "${found}")
  endif()
  set("${variable}" "${found}" PARENT_SCOPE)
endfunction()

# The names of the databases that "cdef build" makes with these options, in the directory of OUTPUT. A cdef.toml with
# errors is reported when the database is built.
function(cdgen_databases OUTPUT options variable)
  get_target_property(cdef cdgen::cdef LOCATION)
  cmake_path(GET OUTPUT PARENT_PATH place)
  execute_process(COMMAND "${cdef}" build --list ${options} -- x.cdefsrc
    RESULT_VARIABLE status OUTPUT_VARIABLE listed ERROR_VARIABLE said OUTPUT_STRIP_TRAILING_WHITESPACE)
  set(databases "${OUTPUT}")
  if(status EQUAL 0)
    string(REPLACE "\n" ";${place}/" databases "${place}/${listed}")
  elseif(said MATCHES "must end in .cdef")
    message(FATAL_ERROR "cdgen_compile: ${said}")
  endif()
  set("${variable}" "${databases}" PARENT_SCOPE)
endfunction()

function(cdgen_compile TARGET SOURCE OUTPUT)
  cmake_parse_arguments(PARSE_ARGV 3 arg "NO_TIMESTAMP;WERROR" "BYTE_ORDER;GATE" "")
  if(DEFINED arg_UNPARSED_ARGUMENTS OR DEFINED arg_KEYWORDS_MISSING_VALUES)
    message(FATAL_ERROR "cdgen_compile: cannot read \"${arg_UNPARSED_ARGUMENTS}${arg_KEYWORDS_MISSING_VALUES}\"")
  endif()
  foreach(word IN ITEMS BYTE_ORDER GATE) # a variable that is not set must not switch a check off
    if(word IN_LIST ARGN AND "${arg_${word}}" STREQUAL "")
      message(FATAL_ERROR "cdgen_compile: ${word} has no value")
    endif()
  endforeach()
  if(DEFINED arg_BYTE_ORDER AND NOT arg_BYTE_ORDER MATCHES "^(native|little|big|both)$")
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

  cdgen_project_file("${SOURCE}" project)
  set(config --no-config)
  if(project)
    set(config "--config=${project}")
  endif()
  set(options "--output=${name}" "${config}")
  if(DEFINED arg_BYTE_ORDER)
    list(APPEND options "--byte-order=${arg_BYTE_ORDER}")
  endif()
  cdgen_databases("${OUTPUT}" "${options}" databases)
  if(arg_WERROR)
    list(APPEND options --werror)
  endif()

  # The hash distinguishes names that are equal without characters that a target's name cannot have (a-b, a_b).
  string(MD5 hash "${shown}")
  string(SUBSTRING "${hash}" 0 8 hash)

  # Changed options build the database again, such as another cdef.toml, even if that is old.
  set(known "${CMAKE_CURRENT_BINARY_DIR}/CMakeFiles/cdgen_${hash}.options")
  file(CONFIGURE OUTPUT "${known}" CONTENT "${options}\n" @ONLY)
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
      COMMAND "$<TARGET_FILE:cdgen::cdef>" gate "--against=${arg_GATE}" "${config}" ${strict} -- "${SOURCE}"
      DEPENDS "${SOURCE}"
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
  set(time "time=none")
  if(NOT arg_NO_TIMESTAMP)
    set(time "time=$\{SOURCE_DATE_EPOCH-now}")
  endif()
  set(build "mkdir -p \"$0\" && cd \"$0\" && ${time} && exec \"$@\" \"--timestamp=$time\"")
  add_custom_command(OUTPUT ${databases}
    COMMAND sh -c "${build}" "${place}" "$<TARGET_FILE:cdgen::cdef>" build "${SOURCE}" ${options}
    ${restat}
    DEPENDS "${SOURCE}" ${project} "${known}" ${gate} "$<TARGET_FILE:cdgen::cdef>"
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
