# Read by cpack: the time of everything in a package.

if(NOT DEFINED ENV{SOURCE_DATE_EPOCH})
  set(ENV{SOURCE_DATE_EPOCH} "${CPACK_CDGEN_RELEASED}")
endif()
