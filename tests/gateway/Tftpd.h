// A real TFTP server for the download tests: the system's in.tftpd (Debian
// package tftpd-hpa) in inetd mode on a UDP socket bound here on 127.0.0.1,
// chrooted into a directory of its own, for the life of the object.
#ifndef TVRN_TESTS_GATEWAY_TFTPD_H
#define TVRN_TESTS_GATEWAY_TFTPD_H

#include <sys/types.h>

#include <string>

#include "tests/gateway/TestSupport.h"

namespace gwtest {

class Tftpd {
public:
    Tftpd() = default;
    ~Tftpd();
    Tftpd(const Tftpd&) = delete;
    Tftpd& operator=(const Tftpd&) = delete;

    // Starts the server; false with the reason in `why` (not installed, not root).
    bool start(std::string& why);
    // "127.0.0.1:<port>"
    std::string address() const { return "127.0.0.1:" + std::to_string(_port); }
    // Puts a file (world-readable, as the server demands) under the served directory.
    void addFile(const std::string& name, const std::string& content);
    const ScratchDir& dir() const { return _dir; }

private:
    ScratchDir _dir;
    pid_t _pid = -1;
    int _port = 0;
};

}  // namespace gwtest

#endif
