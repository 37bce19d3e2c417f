/* former.h: classes that an older version of a directory has, in files that the directory no longer has. */
#ifndef CDGEN_CDEF_GATE_FORMER_H
#define CDGEN_CDEF_GATE_FORMER_H

#include "cdef/gate/baseline.h"
#include "cdef/gate/version.h"

#include <memory>
#include <set>
#include <string>
#include <utility>
#include <vector>

namespace cdef::gate_command {

/* A file that is gone. */
struct former_file {
    std::string path; /* for findings */
    const baseline *in;
    std::unique_ptr<version> last; /* null if it cannot be read */
    std::string problem;           /* why it cannot be read */
};

class former_files {
public:
    /* Notes the files that an older version of a directory has, except those that are an older version of one of the
     * operands. sources: those of the operands that are in the directory. Throws failure if the older version cannot be
     * listed. */
    void look_for(const baseline &in, const std::string &directory, const std::vector<std::string> &sources,
                  const std::vector<std::string> &operands);

    /* Notes the files that the older version of a class may be if its file had another name, except those that cannot
     * be compiled. Throws failure if they cannot be listed or read. */
    void look_around(const baseline &in, const std::string &path);

    /* The older version of a class that is now in another file; null if there is none. */
    const version *last_of(const baseline &in, const version &now) const;

    bool has_files_of(const baseline &in) const;

    const std::vector<former_file> &all() const {
        return files;
    }

private:
    std::vector<former_file> files;
    std::set<std::pair<const baseline *, std::string>> noted;  /* with their keys */
    std::set<std::pair<const baseline *, std::string>> looked; /* around classes in these directories */
};

} // namespace cdef::gate_command

#endif
