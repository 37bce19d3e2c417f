# Runs cdgen for cdgen_compile: CDGEN, SOURCE, OUTPUT, BYTE_ORDER (may be empty), NO_TIMESTAMP.
#
# A class without a name is called after the output file as the command line has it. So cdgen works in a directory of
# its own and is given the file's bare name; a finished database is then moved to its place in one step.
# The directory has the same name each time: what a killed build left behind is cleared by the next one.

cmake_minimum_required(VERSION 3.25)

cmake_path(GET OUTPUT PARENT_PATH place)
cmake_path(GET OUTPUT FILENAME name)
set(work "${place}/.cdgen-${name}")
file(REMOVE_RECURSE "${work}")
file(MAKE_DIRECTORY "${work}")
if(NO_TIMESTAMP)
  set(ENV{VX_CDB_FORCE_EMPTY_TIMESTAMP} 1)
endif()

# Says what cdgen says, the way compilers do, so that editors find the line; before it what cdgen tells beside.
function(give_up told said)
  file(REMOVE_RECURSE "${work}")
  string(REGEX REPLACE "\n$" "" told "${told}")
  if(told)
    message(NOTICE "${told}")
  endif()
  string(REGEX REPLACE "\n$" "" said "${said}")
  if(said MATCHES "^[0-9]+: ")
    string(REGEX REPLACE "^([0-9]+): " "${SOURCE}:\\1: error: " said "${said}")
  else()
    string(PREPEND said "${SOURCE}: error: ")
  endif()
  message(NOTICE "${said}")
  message(FATAL_ERROR "No database made: ${OUTPUT}")
endfunction()

function(run)
  execute_process(COMMAND "${CDGEN}" ${ARGN} -- "${SOURCE}" "${name}" WORKING_DIRECTORY "${work}"
    RESULT_VARIABLE status OUTPUT_VARIABLE told ERROR_VARIABLE said)
  if(NOT status STREQUAL "0")
    give_up("${told}" "${said}")
  endif()
endfunction()

# cdgen writes the order of the machine that it runs on, which may be an emulated one; the file tells which that is.
run()
if(BYTE_ORDER)
  file(READ "${work}/${name}" mark OFFSET 8 LIMIT 4 HEX)
  if(mark STREQUAL "666d7431")
    set(written big)
  else()
    set(written little)
  endif()
  if(NOT written STREQUAL BYTE_ORDER)
    run(-s)
  endif()
endif()
file(RENAME "${work}/${name}" "${OUTPUT}")
file(REMOVE_RECURSE "${work}")
