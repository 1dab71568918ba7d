// An advisory write lock over a whole file, shared between processes.
#ifndef CPTA_FRAMEWORK_FILE_LOCK_H
#define CPTA_FRAMEWORK_FILE_LOCK_H

#include <fcntl.h>

namespace CPTA {

class File_Lock {
public:
    // Opens (creating with mode 0600) the file to lock.
    explicit File_Lock(const char* path);
    ~File_Lock();

    File_Lock(const File_Lock&) = delete;
    File_Lock& operator=(const File_Lock&) = delete;

    // Waits for the write lock (an interrupted wait is retried): 0 or -1.
    int lock();
    int unlock();
    // Whether the file could be opened.
    bool okay() const { return _fd != -1; }

private:
    int _fd;
    struct flock _wlock;
    struct flock _ulock;
};

}  // namespace CPTA

#endif
