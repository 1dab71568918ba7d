// A small TFTP server on 127.0.0.1 for the tests of the client's error
// handling: serves read requests in octet mode from memory, one transfer at a
// time, each from its own port, with faults that a real server never makes.
#ifndef TVRN_TESTS_GATEWAY_TFTPTESTSERVER_H
#define TVRN_TESTS_GATEWAY_TFTPTESTSERVER_H

#include <netinet/in.h>

#include <atomic>
#include <map>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

namespace gwtest {

class TftpTestServer {
public:
    struct Faults {
        int ignoreRequests = 0;    // read requests dropped before one is answered
        int dropBlockOnce = -1;    // first transmission of this block is not sent
        bool strayPacket = false;  // before block 2, a DATA packet from another port
        int blockDelayMs = 0;      // each block is sent this late
    };

    TftpTestServer();
    ~TftpTestServer();
    TftpTestServer(const TftpTestServer&) = delete;
    TftpTestServer& operator=(const TftpTestServer&) = delete;

    void addFile(const std::string& name, const std::string& content);
    void setFaults(const Faults& faults);

    // "127.0.0.1:<port>"
    std::string address() const { return "127.0.0.1:" + std::to_string(_port); }
    // Read requests received, as "<name>|<mode>".
    std::vector<std::string> requests() const;
    // Error packets received from the client (their codes), and the code of
    // the answer the stray packet got (0 when none).
    std::vector<int> clientErrors() const;
    int strayAnswer() const;

private:
    void run();
    void serve(const std::string& name, const sockaddr_in& client);

    int _socket = -1;
    uint16_t _port = 0;
    std::atomic<bool> _stop{false};
    mutable std::mutex _mutex;
    std::map<std::string, std::string> _files;
    Faults _faults;
    std::vector<std::string> _requests;
    std::vector<int> _clientErrors;
    int _strayAnswer = 0;
    std::thread _thread;
};

}  // namespace gwtest

#endif
