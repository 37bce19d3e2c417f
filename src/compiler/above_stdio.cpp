/* above_stdio.cpp: descriptors that no stream takes. */

#include "compiler/above_stdio.h"

#include <cerrno>
#include <fcntl.h>
#include <unistd.h>

int above_stdio(int fd) {
    if (fd < 0 || fd > STDERR_FILENO)
        return fd;
    int higher = fcntl(fd, F_DUPFD_CLOEXEC, STDERR_FILENO + 1);
    int error = errno;
    close(fd);
    errno = error;
    return higher;
}
