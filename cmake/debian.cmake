# Run by cpack over the staged trees, before the packages are made: what Debian's policy asks for beyond cmake --install.

if(NOT CPACK_GENERATOR STREQUAL "DEB")
  return()
endif()
string(TIMESTAMP released "%a, %d %b %Y %H:%M:%S +0000" UTC) # SOURCE_DATE_EPOCH, which package_time.cmake has set

# Pages and changes are compressed, without a time, so that equal builds make equal packages.
function(compress)
  foreach(file IN LISTS ARGN)
    execute_process(COMMAND gzip -9n "${file}" COMMAND_ERROR_IS_FATAL ANY)
  endforeach()
endfunction()

# Every package has its copyright and the list of changes.
function(complete component package)
  set(share "${CPACK_TEMPORARY_DIRECTORY}/${component}${CPACK_PACKAGING_INSTALL_PREFIX}/share")
  set(doc "${share}/doc/${package}")
  file(WRITE "${doc}/copyright" "Format: https://www.debian.org/doc/packaging-manuals/copyright-format/1.0/
Upstream-Name: ${CPACK_PACKAGE_NAME}

Files: *
Copyright: 2026 ${CPACK_PACKAGE_VENDOR}
License: Apache-2.0
 On Debian systems the text of the licence is in
 /usr/share/common-licenses/Apache-2.0.
")
  file(WRITE "${doc}/changelog.Debian"
    "${CPACK_PACKAGE_NAME} (${CPACK_PACKAGE_VERSION}-${CPACK_DEBIAN_PACKAGE_RELEASE}) unstable; urgency=medium

  * See changelog.gz for the changes.

 -- ${CPACK_PACKAGE_CONTACT}  ${released}
")
  file(COPY_FILE "${CMAKE_CURRENT_LIST_DIR}/../CHANGELOG.md" "${doc}/changelog")
  file(GLOB pages "${share}/man/man*/*")
  compress(${pages} "${doc}/changelog" "${doc}/changelog.Debian")
endfunction()

complete(program cdgen)
complete(development cdgen-dev)
complete(documents cdgen-doc)
# The licence is one of those that every system has.
file(REMOVE "${CPACK_TEMPORARY_DIRECTORY}/documents${CPACK_PACKAGING_INSTALL_PREFIX}/share/doc/cdgen/LICENSE")
