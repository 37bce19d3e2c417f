# What cmake --install installs, and where. No file contains the prefix, so an installed tree may be moved.

include(GNUInstallDirs)
include(CMakePackageConfigHelpers)

set(package_dir "${CMAKE_INSTALL_LIBDIR}/cmake/cdgen")
set(headers vx.h cdb.h cdb_fields.h cdb_values.h cdb_sections.h cdb_view.h)
list(TRANSFORM headers PREPEND "${PROJECT_SOURCE_DIR}/include/")

set(programs cdgen)
if(TARGET cdef)
  list(APPEND programs cdef)
endif()

install(TARGETS ${programs} EXPORT cdgenTargets COMPONENT program)
install(TARGETS cdb_view EXPORT cdgenTargets COMPONENT development)
target_include_directories(cdb_view INTERFACE "$<INSTALL_INTERFACE:${CMAKE_INSTALL_INCLUDEDIR}/cdgen>")
install(FILES ${headers} DESTINATION "${CMAKE_INSTALL_INCLUDEDIR}/cdgen" COMPONENT development)

# For find_package.
configure_package_config_file(cmake/cdgenConfig.cmake.in cdgenConfig.cmake INSTALL_DESTINATION "${package_dir}")
write_basic_package_version_file(cdgenConfigVersion.cmake COMPATIBILITY SameMinorVersion)
install(EXPORT cdgenTargets NAMESPACE cdgen:: DESTINATION "${package_dir}" COMPONENT development)
install(FILES "${CMAKE_CURRENT_BINARY_DIR}/cdgenConfig.cmake" "${CMAKE_CURRENT_BINARY_DIR}/cdgenConfigVersion.cmake"
  cmake/cdgenCompile.cmake DESTINATION "${package_dir}" COMPONENT development)

# For pkg-config. Paths count from the file itself, unless a directory was asked for that is outside the prefix.
function(pc_path variable directory)
  if(IS_ABSOLUTE "${directory}")
    set(${variable} "${directory}" PARENT_SCOPE)
  else()
    set(${variable} "\${prefix}/${directory}" PARENT_SCOPE)
  endif()
endfunction()
pc_path(pc_bindir "${CMAKE_INSTALL_BINDIR}")
pc_path(pc_includedir "${CMAKE_INSTALL_INCLUDEDIR}")
pc_path(pc_libdir "${CMAKE_INSTALL_LIBDIR}")
if(IS_ABSOLUTE "${CMAKE_INSTALL_LIBDIR}")
  set(pc_prefix "${CMAKE_INSTALL_PREFIX}")
else()
  file(RELATIVE_PATH up "/${CMAKE_INSTALL_LIBDIR}/pkgconfig" "/")
  set(pc_prefix "\${pcfiledir}/${up}")
  string(REGEX REPLACE "/$" "" pc_prefix "${pc_prefix}")
endif()
set(pc_cdef "")
if(TARGET cdef)
  set(pc_cdef "cdef=\${bindir}/cdef\n")
endif()
configure_file(cmake/cdgen.pc.in cdgen.pc @ONLY)
install(FILES "${CMAKE_CURRENT_BINARY_DIR}/cdgen.pc" DESTINATION "${CMAKE_INSTALL_LIBDIR}/pkgconfig" COMPONENT development)

# For people.
foreach(program IN LISTS programs)
  install(FILES man/${program}.1 DESTINATION "${CMAKE_INSTALL_MANDIR}/man1" COMPONENT program)
endforeach()
install(FILES man/cdefsrc.5 man/cdef.5 DESTINATION "${CMAKE_INSTALL_MANDIR}/man5" COMPONENT program)
install(FILES README.md CHANGELOG.md CONTRIBUTING.md LICENSE SECURITY.md DESTINATION "${CMAKE_INSTALL_DOCDIR}"
  COMPONENT documents)
install(DIRECTORY docs examples DESTINATION "${CMAKE_INSTALL_DOCDIR}" COMPONENT documents
  PATTERN Doxyfile EXCLUDE PATTERN mkdocs.yml EXCLUDE)

# Links of the documents to ../include lead to the headers.
file(RELATIVE_PATH headers_of_docs "${CMAKE_INSTALL_FULL_DOCDIR}" "${CMAKE_INSTALL_FULL_INCLUDEDIR}/cdgen")
file(MAKE_DIRECTORY "${CMAKE_CURRENT_BINARY_DIR}/doc")
file(CREATE_LINK "${headers_of_docs}" "${CMAKE_CURRENT_BINARY_DIR}/doc/include" SYMBOLIC)
install(FILES "${CMAKE_CURRENT_BINARY_DIR}/doc/include" DESTINATION "${CMAKE_INSTALL_DOCDIR}" COMPONENT documents)

# For programs that read what cdef writes as JSON.
if(TARGET cdef)
  install(DIRECTORY schema DESTINATION "${CMAKE_INSTALL_DATADIR}/cdgen" COMPONENT program)
endif()

# For editors. Vim looks below its own prefix for the files of all users; the others have no such place.
set(CDGEN_VIM_DIR "${CMAKE_INSTALL_DATADIR}/vim/vimfiles" CACHE STRING "Where Vim looks for the files of all users")
install(DIRECTORY editors/vim/ DESTINATION "${CDGEN_VIM_DIR}" COMPONENT program)
install(DIRECTORY editors/emacs editors/neovim editors/vscode DESTINATION "${CMAKE_INSTALL_DATADIR}/cdgen/editors"
  COMPONENT program PATTERN node_modules EXCLUDE PATTERN "*.vsix" EXCLUDE)

# For shells.
set(CDGEN_ZSH_DIR "${CMAKE_INSTALL_DATADIR}/zsh/site-functions" CACHE STRING "Where zsh looks for completions")
foreach(program IN LISTS programs)
  install(FILES completions/${program}.bash DESTINATION "${CMAKE_INSTALL_DATADIR}/bash-completion/completions"
    RENAME ${program} COMPONENT program)
  install(FILES completions/_${program} DESTINATION "${CDGEN_ZSH_DIR}" COMPONENT program)
  install(FILES completions/${program}.fish DESTINATION "${CMAKE_INSTALL_DATADIR}/fish/vendor_completions.d"
    COMPONENT program)
endforeach()
