// ProviderUtil: TFTP downloads into the download directory, by the client of
// gateway/TftpClient.h.
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <mutex>
#include <string>

#include "framework/Log.h"
#include "gateway/ProviderUtil.h"
#include "gateway/TftpClient.h"

namespace CPTA {

namespace {

struct TftpSettings {
    std::mutex mutex;
    std::string downloadDir = ".";
    TftpOptions options;
};

TftpSettings& tftpSettings() {
    static TftpSettings settings;
    return settings;
}

// Client-supplied text made safe for one log line.
std::string printable(const char* text) {
    std::string out;
    if (text == nullptr)
        return "(null)";
    for (const char* p = text; *p != '\0' && out.size() < 200; p++) {
        unsigned char c = static_cast<unsigned char>(*p);
        out.push_back(c >= 0x20 && c != 0x7F ? char(c) : '?');
    }
    return out;
}

// Where `file` lands inside `dir`, or "" when the name is not acceptable: it
// must be relative, free of control characters and of ".." components, and
// end in a real file name.
String localPathIn(const std::string& dir, const char* file) {
    if (file == nullptr || file[0] == '\0' || file[0] == '/' || std::strlen(file) > 255)
        return String();
    for (const char* p = file; *p != '\0'; p++) {
        unsigned char c = static_cast<unsigned char>(*p);
        if (c < 0x20 || c == 0x7F)
            return String();
    }
    // No ".." anywhere in the path, even where it would cancel out.
    const char* component = file;
    for (;;) {
        const char* slash = std::strchr(component, '/');
        size_t length = slash != nullptr ? size_t(slash - component) : std::strlen(component);
        if (length == 2 && component[0] == '.' && component[1] == '.')
            return String();
        if (slash == nullptr)
            break;
        component = slash + 1;
    }
    // `component` is now the last one: the local file's name.
    if (component[0] == '\0' || std::strcmp(component, ".") == 0)
        return String();
    if (dir == ".")
        return String(component);
    return String(dir.c_str(), "/", component);
}

}  // namespace

void ProviderUtil::setTftpDownloadDir(const String& dir) {
    TftpSettings& settings = tftpSettings();
    std::lock_guard<std::mutex> lock(settings.mutex);
    settings.downloadDir = dir.size() > 0 ? std::string(dir.c_str(), dir.size()) : ".";
}

String ProviderUtil::getTftpDownloadDir() {
    TftpSettings& settings = tftpSettings();
    std::lock_guard<std::mutex> lock(settings.mutex);
    return String(settings.downloadDir.c_str(), settings.downloadDir.size());
}

void ProviderUtil::setTftpOptions(const TftpOptions& options) {
    TftpSettings& settings = tftpSettings();
    std::lock_guard<std::mutex> lock(settings.mutex);
    settings.options = options;
}

String ProviderUtil::tftpLocalPath(const char* file) {
    TftpSettings& settings = tftpSettings();
    std::lock_guard<std::mutex> lock(settings.mutex);
    return localPathIn(settings.downloadDir, file);
}

int ProviderUtil::TftpGetFile(const char* server, const char* file) {
    std::string dir;
    TftpOptions options;
    {
        TftpSettings& settings = tftpSettings();
        std::lock_guard<std::mutex> lock(settings.mutex);
        dir = settings.downloadDir;
        options = settings.options;
    }

    String local = localPathIn(dir, file);
    if (local.size() == 0) {
        TVRN_LOG(LL_ERR, "TFTP file name refused: %s", printable(file).c_str());
        return -1;
    }
    std::string host, port;
    if (!parseTftpServer(server, host, port)) {
        TVRN_LOG(LL_ERR, "TFTP server name refused: %s", printable(server).c_str());
        return -1;
    }

    // Any earlier copy goes first, so a failed fetch never leaves a stale file.
    if (::unlink(local.c_str()) != 0 && errno != ENOENT) {
        TVRN_LOG(LL_ERR, "Cannot remove %s: %s", local.c_str(), std::strerror(errno));
        return -1;
    }
    // Fetch into a private temporary file and move it into place when complete.
    std::string temporary = dir + "/.tftp-XXXXXX";
    int fd = ::mkostemp(&temporary[0], O_CLOEXEC);
    if (fd < 0) {
        TVRN_LOG(LL_ERR, "Cannot create a file in %s: %s", dir.c_str(), std::strerror(errno));
        return -1;
    }
    ::fchmod(fd, 0644);

    std::string error;
    int rc = tftpReceive(server, file, fd, options, error);
    if (::close(fd) != 0 && rc == 0) {
        error = std::string("close failed: ") + std::strerror(errno);
        rc = -1;
    }
    if (rc == 0 && ::rename(temporary.c_str(), local.c_str()) != 0) {
        error = std::string("cannot rename to ") + local.c_str() + ": " + std::strerror(errno);
        rc = -1;
    }
    if (rc != 0) {
        ::unlink(temporary.c_str());
        TVRN_LOG(LL_ERR, "TFTP get of %s from %s failed: %s", printable(file).c_str(),
                 printable(server).c_str(), error.c_str());
        return -1;
    }
    TVRN_LOG(LL_INFO, "TFTP get of %s from %s saved as %s", printable(file).c_str(),
             printable(server).c_str(), local.c_str());
    return 0;
}

}  // namespace CPTA
