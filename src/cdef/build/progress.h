/* progress.h: the progress line of a long build on a terminal. */
#ifndef CDGEN_CDEF_BUILD_PROGRESS_H
#define CDGEN_CDEF_BUILD_PROGRESS_H

#include <cstddef>
#include <string>

namespace cdef::build_command {

/* "[3/17] name", cut to this many columns. Control characters in the name are escaped. */
std::string progress_line(std::size_t done, std::size_t all, const std::string &name, std::size_t columns);

/* Shows the line on standard error if that is a terminal that can clear it, and if there is more than one source;
 * otherwise, does nothing. */
class progress {
public:
    explicit progress(std::size_t sources);
    progress(const progress &) = delete;
    progress &operator=(const progress &) = delete;
    ~progress() {
        clear();
    }

    void show(std::size_t done, const std::string &name);
    /* Clears the line; called before anything else is written. */
    void clear();

private:
    std::size_t all;
    bool is_wanted;
    bool is_shown = false;
};

} // namespace cdef::build_command

#endif
