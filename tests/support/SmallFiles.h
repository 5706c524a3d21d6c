// SmallFiles: simulates a full disk.
#ifndef MORVIK_TESTS_SUPPORT_SMALLFILES_H
#define MORVIK_TESTS_SUPPORT_SMALLFILES_H

#include <signal.h>
#include <sys/resource.h>

namespace morvik::support {

/// Limits the size of this process's files during its lifetime, as if the disk were full.
class SmallFiles {
public:
    explicit SmallFiles(rlim_t bytes)
    {
        signal(SIGXFSZ, SIG_IGN);
        getrlimit(RLIMIT_FSIZE, &itsOld);
        const rlimit small = {bytes, itsOld.rlim_max};
        setrlimit(RLIMIT_FSIZE, &small);
    }

    SmallFiles(const SmallFiles&) = delete;
    SmallFiles& operator=(const SmallFiles&) = delete;

    ~SmallFiles()
    {
        setrlimit(RLIMIT_FSIZE, &itsOld);
        signal(SIGXFSZ, SIG_DFL);
    }

private:
    rlimit itsOld = {};
};

}  // namespace morvik::support

#endif
