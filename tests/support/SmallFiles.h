// SmallFiles: what a full disk is to a process.
#ifndef MORVIK_TESTS_SUPPORT_SMALLFILES_H
#define MORVIK_TESTS_SUPPORT_SMALLFILES_H

#include <signal.h>
#include <sys/resource.h>

namespace morvik::support {

/// Files of this process can have so many bytes for as long as it lives, as if the disk were full then.
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
