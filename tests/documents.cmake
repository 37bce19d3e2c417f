# What the documents, the manual pages and the editor files say is what the programs do.

add_executable(list_names tools/list_names.cpp)
target_link_libraries(list_names PRIVATE cdgen_compiler)

add_test(NAME document/names COMMAND Python3::Interpreter -B "${CMAKE_CURRENT_SOURCE_DIR}/names_test.py"
  $<TARGET_FILE:list_names>)
add_test(NAME document/examples COMMAND Python3::Interpreter -B "${CMAKE_CURRENT_SOURCE_DIR}/documents_test.py"
  $<TARGET_FILE:cdgen> $<TARGET_FILE:list_names>)

file(GLOB examples CONFIGURE_DEPENDS "${PROJECT_SOURCE_DIR}/examples/*.cdefsrc")
foreach(example IN LISTS examples)
  cmake_path(GET example STEM name)
  add_test(NAME example/${name} COMMAND cdgen "${example}" "${CMAKE_CURRENT_BINARY_DIR}/${name}.cdef")
endforeach()
