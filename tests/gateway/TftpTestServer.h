// A small TFTP server on 127.0.0.1 for the transfer tests: serves read
// requests in octet mode from memory, one transfer at a time, each from its own
// port, with a few faults that can be switched on.
#ifndef TVRN_TESTS_GATEWAY_TFTPTESTSERVER_H
#define TVRN_TESTS_GATEWAY_TFTPTESTSERVER_H

#include <netinet/in.h>

#include <atomic>
#include <cstdint>
#include <map>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

namespace gwtest {

class TftpTestServer {
public:
    struct Faults {
        int ignoreRequests = 0;  // read requests dropped before one is answered
        int dropBlockOnce = -1;  // first transmission of this block is not sent
        bool silent = false;     // never answer anything
        bool strayPacket = false;  // before block 2, a DATA packet from another port
    };

    TftpTestServer();
    ~TftpTestServer();
    TftpTestServer(const TftpTestServer&) = delete;
    TftpTestServer& operator=(const TftpTestServer&) = delete;

    void addFile(const std::string& name, const std::string& content);
    // A file of `size` bytes whose byte i is pattern(i), made as it is sent.
    void addGenerated(const std::string& name, uint64_t size);
    static unsigned char pattern(uint64_t i) { return (unsigned char)((i * 7 + i / 512) & 0xFF); }
    void setFaults(const Faults& faults);

    // "127.0.0.1:<port>"
    std::string address() const;
    // Read requests received, as "<name>|<mode>".
    std::vector<std::string> requests() const;
    // Error packets received from the client (their codes), and the code of
    // the answer the stray packet got (0 when none).
    std::vector<int> clientErrors() const;
    int strayAnswer() const;

private:
    struct File {
        std::string content;
        uint64_t generatedSize = 0;
        bool generated = false;
    };

    void run();
    void serve(const std::string& name, const sockaddr_in& client);
    std::string block(const File& file, uint64_t offset) const;

    int _socket = -1;
    uint16_t _port = 0;
    std::atomic<bool> _stop{false};
    mutable std::mutex _mutex;
    std::map<std::string, File> _files;
    Faults _faults;
    std::vector<std::string> _requests;
    std::vector<int> _clientErrors;
    int _strayAnswer = 0;
    std::thread _thread;
};

}  // namespace gwtest

#endif
