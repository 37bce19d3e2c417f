# Run by cpack over the staged tree, before the package is made: what Debian's policy asks for beyond cmake --install.

if(NOT CPACK_GENERATOR STREQUAL "DEB")
  return()
endif()
set(share "${CPACK_TEMPORARY_INSTALL_DIRECTORY}${CPACK_PACKAGING_INSTALL_PREFIX}/share")
set(doc "${share}/doc/${CPACK_PACKAGE_NAME}")

# The licence is one of those that every system has.
file(REMOVE "${doc}/LICENSE")
file(WRITE "${doc}/copyright" "Format: https://www.debian.org/doc/packaging-manuals/copyright-format/1.0/
Upstream-Name: ${CPACK_PACKAGE_NAME}

Files: *
Copyright: 2026 ${CPACK_PACKAGE_VENDOR}
License: Apache-2.0
 On Debian systems the text of the licence is in
 /usr/share/common-licenses/Apache-2.0.
")

string(TIMESTAMP released "%a, %d %b %Y %H:%M:%S +0000" UTC) # SOURCE_DATE_EPOCH, which package_time.cmake has set
file(WRITE "${doc}/changelog.Debian"
  "${CPACK_PACKAGE_NAME} (${CPACK_PACKAGE_VERSION}-${CPACK_DEBIAN_PACKAGE_RELEASE}) unstable; urgency=medium

  * What is new stands in changelog.gz.

 -- ${CPACK_PACKAGE_CONTACT}  ${released}
")

# Pages and changes are compressed, without a time, so that equal builds make equal packages. The changes also stay as
# they are: other documents have links to them.
file(COPY_FILE "${doc}/CHANGELOG.md" "${doc}/changelog")
file(GLOB pages "${share}/man/man*/*")
foreach(file IN LISTS pages ITEMS "${doc}/changelog" "${doc}/changelog.Debian")
  execute_process(COMMAND gzip -9n "${file}" COMMAND_ERROR_IS_FATAL ANY)
endforeach()
