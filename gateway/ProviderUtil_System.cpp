// ProviderUtil: system services: whether the host management agent runs,
// whether a file exists, and the log callback handed to the library.
#include <dirent.h>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <string>

#include "framework/Log.h"
#include "gateway/ProviderUtil.h"

namespace CPTA {

namespace {

bool readSmallFile(const std::string& path, std::string& content, size_t limit) {
    int fd = ::open(path.c_str(), O_RDONLY | O_CLOEXEC);
    if (fd < 0)
        return false;
    char buffer[512];
    if (limit > sizeof(buffer))
        limit = sizeof(buffer);
    ssize_t n;
    do {
        n = ::read(fd, buffer, limit);
    } while (n < 0 && errno == EINTR);
    ::close(fd);
    if (n < 0)
        return false;
    content.assign(buffer, size_t(n));
    return true;
}

}  // namespace

bool ProviderUtil::isProcessRunning(const char* name, const char* procRoot) {
    if (name == nullptr || name[0] == '\0' || procRoot == nullptr)
        return false;
    // The kernel keeps at most 15 characters of a command name.
    const std::string wanted = std::string(name).substr(0, 15);
    DIR* dir = ::opendir(procRoot);
    if (dir == nullptr)
        return false;
    bool found = false;
    while (!found) {
        dirent* entry = ::readdir(dir);
        if (entry == nullptr)
            break;
        const char* pid = entry->d_name;
        if (pid[0] == '\0' || pid[std::strspn(pid, "0123456789")] != '\0')
            continue;
        const std::string base = std::string(procRoot) + "/" + pid;
        std::string comm;
        if (!readSmallFile(base + "/comm", comm, 64))
            continue;
        while (!comm.empty() && (comm.back() == '\n' || comm.back() == '\0'))
            comm.pop_back();
        if (comm != wanted)
            continue;
        // A zombie is not running; the state follows the ") " that closes the name.
        std::string stat;
        if (readSmallFile(base + "/stat", stat, 512)) {
            size_t close = stat.rfind(')');
            if (close != std::string::npos && close + 2 < stat.size() &&
                (stat[close + 2] == 'Z' || stat[close + 2] == 'X'))
                continue;
        }
        found = true;
    }
    ::closedir(dir);
    return found;
}

int ProviderUtil::getAgentPort() {
    return isProcessRunning("mdcagent") ? AGENT_PORT : 0;
}

bool ProviderUtil::IsFileExist(const char* path) {
    struct stat info;
    return path != nullptr && ::stat(path, &info) == 0;
}

void ProviderUtil::logMsg(int level, const char* file, int line, const char* message) noexcept {
    char where[32];
    std::snprintf(where, sizeof(where), "%s:%d ", file != nullptr ? file : "", line);
    Log_Level mapped;
    switch (level) {
        case 2: mapped = LL_INFO; break;
        case 3: mapped = LL_WARN; break;
        case 4: mapped = LL_ERR; break;
        case 5: mapped = LL_INFO; break;
        default: mapped = LL_DBG; break;
    }
    // The library's text is data, never a format.
    TVRN_LOG(mapped, "%s%s", where, message != nullptr ? message : "");
}

}  // namespace CPTA
