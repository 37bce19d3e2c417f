# Packages for cpack: three Debian packages, and an archive of everything.

# The day of the release in seconds since 1970. All that a package holds has this time, so that two packages
# of the same sources are the same bytes; cpack takes another one from the environment, as packagers have it there.
set(CPACK_CDGEN_RELEASED 1795219200)
set(CPACK_PROJECT_CONFIG_FILE "${PROJECT_SOURCE_DIR}/cmake/package_time.cmake")

set(CPACK_PACKAGE_NAME cdgen)
set(CPACK_PACKAGE_VENDOR "the cdgen maintainers")
# Not a real address: if you make packages for others, set your own, see docs/install.md.
set(CPACK_PACKAGE_CONTACT "cdgen maintainers <maintainers@cdgen.invalid>")
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "compiler for resource class definitions")
set(CPACK_PACKAGE_DESCRIPTION "cdgen compiles the definition of a resource class, written as text, into a
binary database that a runtime maps and reads in place. The package has the
compiler, the tool cdef that checks definitions and shows and compares
databases, manual pages, and files for shells and editors.")
set(CPACK_PACKAGE_FILE_NAME "${CPACK_PACKAGE_NAME}-${PROJECT_VERSION}-${CMAKE_SYSTEM_NAME}-${CMAKE_SYSTEM_PROCESSOR}")
set(CPACK_PACKAGING_INSTALL_PREFIX "${CMAKE_INSTALL_PREFIX}")
set(CPACK_GENERATOR TGZ)
find_program(DPKG dpkg)
if(DPKG)
  set(CPACK_GENERATOR DEB TGZ)
endif()
set(CPACK_STRIP_FILES ON)

# One package for each component: the program, what other programs need to read databases, the documents.
set(CPACK_DEB_COMPONENT_INSTALL ON)
set(CPACK_COMPONENTS_ALL program development documents)
set(CPACK_DEBIAN_PROGRAM_PACKAGE_NAME cdgen)
set(CPACK_DEBIAN_PROGRAM_PACKAGE_SUGGESTS "cdgen-dev, cdgen-doc")
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_NAME cdgen-dev)
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_SECTION libdevel)
set(CPACK_DEBIAN_DOCUMENTS_PACKAGE_NAME cdgen-doc)
set(CPACK_DEBIAN_DOCUMENTS_PACKAGE_SECTION doc)
set(CPACK_DEBIAN_DOCUMENTS_PACKAGE_ARCHITECTURE all)
set(CPACK_DEBIAN_DOCUMENTS_PACKAGE_SUGGESTS cdgen-dev)
set(CPACK_DEBIAN_PROGRAM_DESCRIPTION "${CPACK_PACKAGE_DESCRIPTION}")
set(CPACK_DEBIAN_DEVELOPMENT_DESCRIPTION "This package has the library and the headers that read the databases. A program 
linked with the library does not have to trust them. It also has what CMake and
pkg-config need to find the library, and to compile definitions in a build.")
set(CPACK_DEBIAN_DOCUMENTS_DESCRIPTION "This package has the documents and the examples: the language of class
definitions, the format of the databases, how programs read them, a tutorial,
and complete classes.")
# The CMake package names the programs too, and so needs those of the same version.
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_DEPENDS "cdgen (= ${PROJECT_VERSION}-1)")
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_RELEASE 1)
set(CPACK_DEBIAN_PACKAGE_SECTION devel)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
set(CPACK_PRE_BUILD_SCRIPTS "${PROJECT_SOURCE_DIR}/cmake/debian.cmake")
include(CPack)
