# Packages for cpack: a Debian package and an archive.

# The day of the release in seconds since 1970. All that a package holds has this time, so that two packages
# of the same sources are the same bytes; cpack takes another one from the environment, as packagers have it there.
set(CPACK_CDGEN_RELEASED 1795219200)
set(CPACK_PROJECT_CONFIG_FILE "${PROJECT_SOURCE_DIR}/cmake/package_time.cmake")

set(CPACK_PACKAGE_NAME cdgen)
set(CPACK_PACKAGE_VENDOR "the cdgen maintainers")
# Nobody's address: who makes a package for others says who they are, see docs/install.md.
set(CPACK_PACKAGE_CONTACT "cdgen maintainers <maintainers@cdgen.invalid>")
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "compiler for resource class definitions")
set(CPACK_PACKAGE_DESCRIPTION "cdgen compiles the definition of a resource class, written as text, into a
binary database that a runtime maps and reads as it stands. The package has
the compiler, the inspector cdef, a library that reads databases, its headers,
manual pages, and files for shells, editors and build systems.")
set(CPACK_PACKAGE_FILE_NAME "${CPACK_PACKAGE_NAME}-${PROJECT_VERSION}-${CMAKE_SYSTEM_NAME}-${CMAKE_SYSTEM_PROCESSOR}")
set(CPACK_PACKAGING_INSTALL_PREFIX "${CMAKE_INSTALL_PREFIX}")
set(CPACK_GENERATOR TGZ)
find_program(DPKG dpkg)
if(DPKG)
  set(CPACK_GENERATOR DEB TGZ)
endif()
set(CPACK_STRIP_FILES ON)

set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_RELEASE 1)
set(CPACK_DEBIAN_PACKAGE_SECTION devel)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
set(CPACK_PRE_BUILD_SCRIPTS "${PROJECT_SOURCE_DIR}/cmake/debian.cmake")
include(CPack)
