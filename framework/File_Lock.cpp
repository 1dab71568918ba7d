#include "framework/File_Lock.h"

#include <unistd.h>

#include <cerrno>
#include <cstring>

namespace CPTA {

namespace {

void _init(struct flock& fl, short type) {
    std::memset(&fl, 0, sizeof(fl));
    fl.l_type = type;
    fl.l_whence = SEEK_SET;
    fl.l_start = 0;
    fl.l_len = 0;  // to the end of the file, however long it grows
}

}  // namespace

File_Lock::File_Lock(const char* path)
    : _fd(path ? ::open(path, O_WRONLY | O_CREAT | O_CLOEXEC, 0600) : -1) {
    _init(_wlock, F_WRLCK);
    _init(_ulock, F_UNLCK);
}

File_Lock::~File_Lock() {
    if (_fd != -1)
        ::close(_fd);
}

int File_Lock::lock() {
    if (_fd == -1)
        return -1;
    for (;;) {
        if (::fcntl(_fd, F_SETLKW, &_wlock) == 0)
            return 0;
        if (errno != EINTR)
            return -1;
    }
}

int File_Lock::unlock() {
    if (_fd == -1)
        return -1;
    return ::fcntl(_fd, F_SETLKW, &_ulock) == 0 ? 0 : -1;
}

}  // namespace CPTA
