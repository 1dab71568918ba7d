#include "tests/gateway/Tftpd.h"

#include <arpa/inet.h>
#include <fcntl.h>
#include <netinet/in.h>
#include <poll.h>
#include <signal.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <sstream>
#include <thread>
#include <vector>

namespace gwtest {

namespace {

const char kProgram[] = "in.tftpd";
const int kAttempts = 5;
const auto kStartTimeout = std::chrono::seconds(5);

sockaddr_in loopback(int port) {
    sockaddr_in a{};
    a.sin_family = AF_INET;
    a.sin_port = htons(uint16_t(port));
    a.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    return a;
}

// A UDP port on 127.0.0.1 that nothing uses right now.
int freePort() {
    int s = socket(AF_INET, SOCK_DGRAM | SOCK_CLOEXEC, 0);
    if (s < 0)
        return 0;
    sockaddr_in a = loopback(0);
    socklen_t len = sizeof a;
    int port = 0;
    if (bind(s, reinterpret_cast<sockaddr*>(&a), sizeof a) == 0 &&
        getsockname(s, reinterpret_cast<sockaddr*>(&a), &len) == 0)
        port = ntohs(a.sin_port);
    close(s);
    return port;
}

}  // namespace

std::string Tftpd::program() {
    // Servers live in sbin, which an ordinary PATH may leave out.
    std::string dirs = std::getenv("PATH") != nullptr ? std::getenv("PATH") : "";
    dirs += ":/usr/sbin:/sbin";
    std::istringstream in(dirs);
    for (std::string dir; std::getline(in, dir, ':');) {
        if (dir.empty())
            continue;
        std::string path = dir + "/" + kProgram;
        if (access(path.c_str(), X_OK) == 0)
            return path;
    }
    return std::string();
}

Tftpd::~Tftpd() { stop(); }

std::string Tftpd::address() const { return "127.0.0.1:" + std::to_string(_port); }

void Tftpd::addFile(const std::string& name, const std::string& content) {
    std::filesystem::path path = std::filesystem::path(_dir.path()) / name;
    std::filesystem::create_directories(path.parent_path());
    for (std::filesystem::path p = path.parent_path(); p != _dir.path(); p = p.parent_path())
        chmod(p.c_str(), 0755);
    writeFile(path.string(), content);
    chmod(path.c_str(), 0644);
}

bool Tftpd::start(std::string& why) {
    const std::string server = program();
    if (server.empty()) {
        why = std::string(kProgram) +
              " is not installed: install the tftpd-hpa package (tools/dev.sh lists it), "
              "or set TVRN_TEST_NO_TFTPD=1 to skip the tests that need it";
        return false;
    }
    if (geteuid() != 0) {
        why = server + " gives up its privileges for every transfer, which only root may do: "
                       "run the tests as root, or set TVRN_TEST_NO_TFTPD=1 to skip the tests that need it";
        return false;
    }
    chmod(_dir.path().c_str(), 0755);
    for (int attempt = 0; attempt < kAttempts; attempt++) {
        // The port may be taken between the look-up and the server's bind; then try another.
        if (launch(server, freePort(), why))
            return true;
    }
    return false;
}

bool Tftpd::launch(const std::string& server, int port, std::string& why) {
    if (port == 0) {
        why = "no free UDP port on 127.0.0.1";
        return false;
    }
    const std::string address = "127.0.0.1:" + std::to_string(port);
    std::vector<std::string> args = {server, "--foreground", "--address", address, "--secure",
                                     "--user", "nobody", _dir.path()};
    std::vector<char*> argv;
    for (std::string& a : args)
        argv.push_back(&a[0]);
    argv.push_back(nullptr);

    pid_t pid = fork();
    if (pid < 0) {
        why = std::string("fork failed: ") + std::strerror(errno);
        return false;
    }
    if (pid == 0) {
        int null = open("/dev/null", O_RDWR);
        if (null >= 0)
            dup2(null, STDIN_FILENO);
        execv(argv[0], argv.data());
        _exit(127);
    }
    _pid = pid;
    _port = port;

    const auto deadline = std::chrono::steady_clock::now() + kStartTimeout;
    while (std::chrono::steady_clock::now() < deadline) {
        int status = 0;
        if (waitpid(_pid, &status, WNOHANG) == _pid) {
            why = server + " on " + address + " exited at start (wait status " + std::to_string(status) + ")";
            _pid = -1;
            return false;
        }
        if (answers(port))
            return true;
    }
    why = server + " on " + address + " did not answer within 5 seconds";
    stop();
    return false;
}

// Whether the server answers a read request (for a file that is not there)
// within a short while.
bool Tftpd::answers(int port) const {
    int s = socket(AF_INET, SOCK_DGRAM | SOCK_CLOEXEC, 0);
    if (s < 0)
        return false;
    static const char request[] = "\0\1.tvrn-probe-absent\0octet";  // RRQ
    sockaddr_in to = loopback(port);
    bool answered = false;
    if (sendto(s, request, sizeof request, 0, reinterpret_cast<sockaddr*>(&to), sizeof to) ==
        ssize_t(sizeof request)) {
        pollfd p{s, POLLIN, 0};
        char reply[516];
        answered = poll(&p, 1, 100) == 1 && recv(s, reply, sizeof reply, 0) >= 4 && reply[1] == 5;  // ERROR
    }
    close(s);
    if (!answered)
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
    return answered;
}

void Tftpd::stop() {
    if (_pid <= 0)
        return;
    kill(_pid, SIGTERM);
    for (int i = 0; i < 200; i++) {
        if (waitpid(_pid, nullptr, WNOHANG) == _pid) {
            _pid = -1;
            return;
        }
        std::this_thread::sleep_for(std::chrono::milliseconds(10));
    }
    kill(_pid, SIGKILL);
    waitpid(_pid, nullptr, 0);
    _pid = -1;
}

}  // namespace gwtest
