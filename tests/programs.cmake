# How the programs were linked.

if(CDGEN_STATIC AND NOT CDGEN_SANITIZE AND CMAKE_READELF)
  add_test(NAME program/static COMMAND "${CMAKE_READELF}" --program-headers --wide $<TARGET_FILE:cdgen>)
  set_tests_properties(program/static PROPERTIES
    PASS_REGULAR_EXPRESSION " LOAD " FAIL_REGULAR_EXPRESSION "INTERP|DYNAMIC")
endif()
