/* ids_file.h: the file of all numbers that were ever in use, as a file. */
#ifndef CDGEN_CDEF_GATE_IDS_FILE_H
#define CDGEN_CDEF_GATE_IDS_FILE_H

#include "gate/ids.h"

#include <string>
#include <vector>

namespace cdef::gate_command {

class ids_file {
public:
    /* may_be_missing: there need not be such a file. Throws failure. */
    ids_file(std::string name, bool may_be_missing);

    /* Whether there is such a file. Without it, numbers are not judged. */
    bool exists() const {
        return is_there;
    }
    const gate::id_record &record() const {
        return recorded;
    }
    /* Records the numbers of a class, unless they contradict a class that has been recorded by this object: returns
     * how, as findings. */
    std::vector<check::finding> accept(const std::vector<gate::numbered> &numbers, const gate::source_places &places);
    /* Replaces the file if it would change. Throws failure if another program has changed or made it. */
    void save() const;

private:
    std::string path;
    std::string before; /* its text as it was read */
    bool is_there;
    gate::id_record recorded;
    gate::id_record accepted; /* by this object */
};

} // namespace cdef::gate_command

#endif
