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

int udpSocket(sockaddr_in& bound) {
    int fd = socket(AF_INET, SOCK_DGRAM | SOCK_CLOEXEC, 0);
    if (fd < 0)
        throw std::runtime_error("socket failed");
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    if (bind(fd, reinterpret_cast<sockaddr*>(&address), sizeof(address)) != 0) {
        close(fd);
        throw std::runtime_error("bind failed");
    }
    socklen_t length = sizeof(bound);
    getsockname(fd, reinterpret_cast<sockaddr*>(&bound), &length);
    return fd;
}

void put16(std::string& p, unsigned v) {
    p.push_back(char((v >> 8) & 0xFF));
    p.push_back(char(v & 0xFF));
}

unsigned get16(const unsigned char* p) { return unsigned(p[0]) << 8 | p[1]; }

// Waits up to `ms` for a packet; its length, or -1 on time-out.
ssize_t receive(int fd, unsigned char* buffer, size_t size, int ms, sockaddr_in* from) {
    pollfd pfd = {fd, POLLIN, 0};
    if (poll(&pfd, 1, ms) <= 0)
        return -1;
    socklen_t length = sizeof(*from);
    return recvfrom(fd, buffer, size, 0, reinterpret_cast<sockaddr*>(from), &length);
}

void sendTo(int fd, const std::string& packet, const sockaddr_in& to) {
    sendto(fd, packet.data(), packet.size(), 0, reinterpret_cast<const sockaddr*>(&to), sizeof(to));
}

}  // namespace

TftpTestServer::TftpTestServer() {
    sockaddr_in bound{};
    _socket = udpSocket(bound);
    _port = ntohs(bound.sin_port);
    _thread = std::thread([this] { run(); });
}

TftpTestServer::~TftpTestServer() {
    _stop = true;
    _thread.join();
    close(_socket);
}

void TftpTestServer::addFile(const std::string& name, const std::string& content) {
    std::lock_guard<std::mutex> lock(_mutex);
    File file;
    file.content = content;
    _files[name] = file;
}

void TftpTestServer::addGenerated(const std::string& name, uint64_t size) {
    std::lock_guard<std::mutex> lock(_mutex);
    File file;
    file.generated = true;
    file.generatedSize = size;
    _files[name] = file;
}

void TftpTestServer::setFaults(const Faults& faults) {
    std::lock_guard<std::mutex> lock(_mutex);
    _faults = faults;
}

std::string TftpTestServer::address() const { return "127.0.0.1:" + std::to_string(_port); }

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

std::string TftpTestServer::block(const File& file, uint64_t offset) const {
    uint64_t size = file.generated ? file.generatedSize : file.content.size();
    if (offset >= size)
        return std::string();
    uint64_t n = size - offset < 512 ? size - offset : 512;
    if (!file.generated)
        return file.content.substr(offset, n);
    std::string data(n, '\0');
    for (uint64_t i = 0; i < n; i++)
        data[i] = char(pattern(offset + i));
    return data;
}

void TftpTestServer::run() {
    unsigned char buffer[1024];
    while (!_stop) {
        sockaddr_in from{};
        ssize_t n = receive(_socket, buffer, sizeof(buffer), 50, &from);
        if (n < 4 || get16(buffer) != 1)
            continue;
        // "<name>\0<mode>\0"
        std::string name(reinterpret_cast<char*>(buffer + 2), strnlen(reinterpret_cast<char*>(buffer + 2), n - 2));
        size_t modeAt = 2 + name.size() + 1;
        std::string mode = modeAt < size_t(n)
            ? std::string(reinterpret_cast<char*>(buffer + modeAt), strnlen(reinterpret_cast<char*>(buffer + modeAt), n - modeAt))
            : std::string();
        bool answer;
        {
            std::lock_guard<std::mutex> lock(_mutex);
            _requests.push_back(name + "|" + mode);
            answer = !_faults.silent;
            if (answer && _faults.ignoreRequests > 0) {
                _faults.ignoreRequests--;
                answer = false;
            }
        }
        if (answer)
            serve(name, from);
    }
}

void TftpTestServer::serve(const std::string& name, const sockaddr_in& client) {
    sockaddr_in bound{};
    int fd = udpSocket(bound);
    File file;
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
    if (!found) {
        std::string error;
        put16(error, 5);
        put16(error, 1);
        error += "File not found";
        error.push_back('\0');
        sendTo(fd, error, client);
        close(fd);
        return;
    }

    unsigned blockNumber = 1;
    uint64_t offset = 0;
    bool dropped = false;
    bool strayDone = false;
    for (;;) {
        std::string data = block(file, offset);
        std::string packet;
        put16(packet, 3);
        put16(packet, blockNumber & 0xFFFF);
        packet += data;

        if (faults.strayPacket && !strayDone && blockNumber == 2) {
            // Somebody else's port sends a block the client did not ask for.
            strayDone = true;
            sockaddr_in strayBound{};
            int stray = udpSocket(strayBound);
            std::string bogus;
            put16(bogus, 3);
            put16(bogus, 2);
            bogus += std::string(512, 'X');
            sendTo(stray, bogus, client);
            unsigned char reply[600];
            sockaddr_in replyFrom{};
            ssize_t n = receive(stray, reply, sizeof(reply), 1000, &replyFrom);
            std::lock_guard<std::mutex> lock(_mutex);
            if (n >= 4 && get16(reply) == 5)
                _strayAnswer = int(get16(reply + 2));
            close(stray);
        }

        bool acked = false;
        for (int attempt = 0; attempt < 10 && !acked && !_stop; attempt++) {
            if (int(blockNumber) == faults.dropBlockOnce && !dropped)
                dropped = true;
            else
                sendTo(fd, packet, client);
            // Wait for this block's acknowledgement; a repeated earlier one
            // means our block was lost, so send it again at once.
            for (;;) {
                unsigned char reply[600];
                sockaddr_in from{};
                ssize_t n = receive(fd, reply, sizeof(reply), 300, &from);
                if (n < 0)
                    break;
                if (n < 4)
                    continue;
                unsigned op = get16(reply);
                unsigned number = get16(reply + 2);
                if (op == 5) {
                    std::lock_guard<std::mutex> lock(_mutex);
                    _clientErrors.push_back(int(number));
                    close(fd);
                    return;
                }
                if (op != 4)
                    continue;
                if (number == (blockNumber & 0xFFFF)) {
                    acked = true;
                    break;
                }
                if (number == ((blockNumber - 1) & 0xFFFF))
                    break;
            }
        }
        if (!acked || data.size() < 512)
            break;
        blockNumber++;
        offset += 512;
    }
    close(fd);
}

}  // namespace gwtest
