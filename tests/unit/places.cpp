/* places.cpp: where the tests find files. */

#include "places.h"

namespace places {

std::string in_project(const std::string &file) {
    return CDB_PROJECT "/" + file;
}

std::string in_images(const std::string &file) {
    return CDB_IMAGES "/" + file;
}

} // namespace places
