#include "tests/gateway/Tftpd.h"

#include <arpa/inet.h>
#include <netinet/in.h>
#include <signal.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstring>
#include <filesystem>

namespace gwtest {

Tftpd::~Tftpd() {
    if (_pid > 0) {
        kill(_pid, SIGKILL);
        waitpid(_pid, nullptr, 0);
    }
}

void Tftpd::addFile(const std::string& name, const std::string& content) {
    std::filesystem::path path = std::filesystem::path(_dir.path()) / name;
    std::filesystem::create_directories(path.parent_path());
    for (std::filesystem::path p = path.parent_path(); p != _dir.path(); p = p.parent_path())
        chmod(p.c_str(), 0755);
    writeFile(path.string(), content);
    chmod(path.c_str(), 0644);
}

bool Tftpd::start(std::string& why) {
    // Servers live in sbin, which an ordinary PATH may leave out.
    const char* const candidates[] = {"/usr/sbin/in.tftpd", "/sbin/in.tftpd",
                                      "/usr/local/sbin/in.tftpd"};
    const char* server = nullptr;
    for (const char* c : candidates)
        if (server == nullptr && access(c, X_OK) == 0)
            server = c;
    const char* skip = ", or set TVRN_TEST_NO_TFTPD=1 to skip the tests that need it";
    if (server == nullptr) {
        why = std::string(
                  "in.tftpd is not installed: install the tftpd-hpa package (tools/dev.sh lists "
                  "it)") +
              skip;
        return false;
    }
    if (geteuid() != 0) {
        why = std::string(
                  "in.tftpd gives up its privileges for every transfer, which only root may do: "
                  "run the tests as root") +
              skip;
        return false;
    }
    // The socket is bound before the server starts, so requests wait for it
    // and no port can be taken by someone else meanwhile.
    int s = socket(AF_INET, SOCK_DGRAM | SOCK_CLOEXEC, 0);
    sockaddr_in a{};
    a.sin_family = AF_INET;
    a.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    socklen_t length = sizeof a;
    if (s < 0 || bind(s, reinterpret_cast<sockaddr*>(&a), sizeof a) != 0 ||
        getsockname(s, reinterpret_cast<sockaddr*>(&a), &length) != 0) {
        why = std::string("no UDP socket on 127.0.0.1: ") + std::strerror(errno);
        if (s >= 0)
            close(s);
        return false;
    }
    _port = ntohs(a.sin_port);
    chmod(_dir.path().c_str(), 0755);
    _pid = fork();
    if (_pid == 0) {
        dup2(s, STDIN_FILENO);  // inetd mode: the socket is standard input
        execl(server, server, "--secure", "--user", "nobody", "--timeout", "600",
              _dir.path().c_str(), static_cast<char*>(nullptr));
        _exit(127);
    }
    close(s);
    if (_pid < 0)
        why = std::string("fork failed: ") + std::strerror(errno);
    return _pid > 0;
}

}  // namespace gwtest
