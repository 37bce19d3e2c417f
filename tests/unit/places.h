/* places.h: where the tests find files. Only places.cpp is compiled with these paths, so that a compiler cache can give
 * one checkout's objects to another. */
#ifndef CDGEN_TESTS_PLACES_H
#define CDGEN_TESTS_PLACES_H

#include <string>

namespace places {

/* The path of a file below the project, such as "docs/messages.md". */
std::string in_project(const std::string &file);

/* The path of one of the images that the build has made; "" is their directory. */
std::string in_images(const std::string &file);

} // namespace places

#endif
