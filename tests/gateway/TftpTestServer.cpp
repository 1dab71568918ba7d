#include "tests/gateway/TftpTestServer.h"

#include <arpa/inet.h>
#include <netinet/in.h>
#include <poll.h>
#include <sys/socket.h>
#include <unistd.h>

#include <cstring>
#include <stdexcept>

namespace gwtest {

namespace {

// A UDP socket bound to a free port of 127.0.0.1; the port in `port`.
int udpSocket(uint16_t* port = nullptr) {
    int fd = socket(AF_INET, SOCK_DGRAM | SOCK_CLOEXEC, 0);
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    socklen_t length = sizeof(address);
    if (fd < 0 || bind(fd, reinterpret_cast<sockaddr*>(&address), sizeof(address)) != 0 ||
        getsockname(fd, reinterpret_cast<sockaddr*>(&address), &length) != 0)
        throw std::runtime_error("no UDP socket on 127.0.0.1");
    if (port != nullptr)
        *port = ntohs(address.sin_port);
    return fd;
}

std::string packet(unsigned op, unsigned number, const std::string& payload) {
    const char head[] = {char(op >> 8), char(op), char(number >> 8 & 0xFF), char(number & 0xFF)};
    return std::string(head, 4) + payload;
}

unsigned get16(const unsigned char* p) {
    return unsigned(p[0]) << 8 | p[1];
}

// Waits up to `ms` for a packet; its length, or -1 on time-out.
ssize_t receive(int fd, unsigned char (&buffer)[1024], int ms, sockaddr_in* from = nullptr) {
    pollfd pfd = {fd, POLLIN, 0};
    if (poll(&pfd, 1, ms) <= 0)
        return -1;
    socklen_t length = sizeof(*from);
    return recvfrom(fd, buffer, sizeof buffer, 0, reinterpret_cast<sockaddr*>(from),
                    from ? &length : nullptr);
}

void sendTo(int fd, const std::string& packet, const sockaddr_in& to) {
    sendto(fd, packet.data(), packet.size(), 0, reinterpret_cast<const sockaddr*>(&to), sizeof(to));
}

}  // namespace

TftpTestServer::TftpTestServer() {
    _socket = udpSocket(&_port);
    _thread = std::thread([this] { run(); });
}

TftpTestServer::~TftpTestServer() {
    _stop = true;
    _thread.join();
    close(_socket);
}

void TftpTestServer::addFile(const std::string& name, const std::string& content) {
    std::lock_guard<std::mutex> lock(_mutex);
    _files[name] = content;
}

void TftpTestServer::setFaults(const Faults& faults) {
    std::lock_guard<std::mutex> lock(_mutex);
    _faults = faults;
}

std::vector<std::string> TftpTestServer::requests() const {
    std::lock_guard<std::mutex> lock(_mutex);
    return _requests;
}

std::vector<int> TftpTestServer::clientErrors() const {
    std::lock_guard<std::mutex> lock(_mutex);
    return _clientErrors;
}

int TftpTestServer::strayAnswer() const {
    std::lock_guard<std::mutex> lock(_mutex);
    return _strayAnswer;
}

void TftpTestServer::run() {
    unsigned char buffer[1024];
    while (!_stop) {
        sockaddr_in from{};
        ssize_t n = receive(_socket, buffer, 50, &from);
        if (n < 4 || get16(buffer) != 1)
            continue;
        // "<name>\0<mode>\0"
        const char* text = reinterpret_cast<const char*>(buffer + 2);
        std::string name(text, strnlen(text, n - 2));
        size_t modeAt = name.size() + 1;
        std::string mode = modeAt + 2 < size_t(n)
                               ? std::string(text + modeAt, strnlen(text + modeAt, n - 2 - modeAt))
                               : "";
        bool answer;
        {
            std::lock_guard<std::mutex> lock(_mutex);
            _requests.push_back(name + "|" + mode);
            answer = _faults.ignoreRequests == 0;
            if (!answer)
                _faults.ignoreRequests--;
        }
        if (answer)
            serve(name, from);
    }
}

void TftpTestServer::serve(const std::string& name, const sockaddr_in& client) {
    const int fd = udpSocket();
    std::string file;
    bool found;
    Faults faults;
    {
        std::lock_guard<std::mutex> lock(_mutex);
        auto it = _files.find(name);
        found = it != _files.end();
        if (found)
            file = it->second;
        faults = _faults;
    }
    if (!found)
        sendTo(fd, packet(5, 1, std::string("File not found", 15)), client);

    bool dropped = false;
    for (unsigned block = 1; found; block++) {
        const size_t offset = size_t(block - 1) * 512;
        const std::string data = offset < file.size() ? file.substr(offset, 512) : std::string();
        if (faults.strayPacket && block == 2) {
            // Somebody else's port sends a block the client did not ask for.
            int stray = udpSocket();
            sendTo(stray, packet(3, 2, std::string(512, 'X')), client);
            unsigned char reply[1024];
            ssize_t n = receive(stray, reply, 1000);
            std::lock_guard<std::mutex> lock(_mutex);
            if (n >= 4 && get16(reply) == 5)
                _strayAnswer = int(get16(reply + 2));
            close(stray);
        }

        if (faults.blockDelayMs > 0)
            usleep(useconds_t(faults.blockDelayMs) * 1000);
        bool acked = false;
        for (int attempt = 0; attempt < 10 && !acked && !_stop; attempt++) {
            if (int(block) == faults.dropBlockOnce && !dropped)
                dropped = true;
            else
                sendTo(fd, packet(3, block & 0xFFFF, data), client);
            // Wait for this block's acknowledgement; a repeated earlier one
            // means our block was lost, so send it again at once.
            for (;;) {
                unsigned char reply[1024];
                ssize_t n = receive(fd, reply, 300);
                if (n < 0)
                    break;
                const unsigned op = n < 4 ? 0 : get16(reply), number = n < 4 ? 0 : get16(reply + 2);
                if (op == 5) {
                    std::lock_guard<std::mutex> lock(_mutex);
                    _clientErrors.push_back(int(number));
                    close(fd);
                    return;
                }
                if (op == 4 && number == (block & 0xFFFF))
                    acked = true;
                if (acked || (op == 4 && number == ((block - 1) & 0xFFFF)))
                    break;
            }
        }
        found = acked && data.size() == 512;
    }
    close(fd);
}

}  // namespace gwtest
