#include "gateway/TftpClient.h"

#include <arpa/inet.h>
#include <netdb.h>
#include <netinet/in.h>
#include <poll.h>
#include <sys/socket.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <cstring>

namespace CPTA {

namespace {

enum Opcode : uint16_t { OP_RRQ = 1, OP_WRQ = 2, OP_DATA = 3, OP_ACK = 4, OP_ERROR = 5 };

const size_t kBlockSize = 512;
const size_t kMaxPacket = 4 + kBlockSize;
// A read request must fit one packet: opcode, name, NUL, "octet", NUL.
const size_t kMaxNameLength = kMaxPacket - 2 - 1 - 6;
const size_t kMaxHostLength = 253;

bool isHostChar(char c) {
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || (c >= '0' && c <= '9') || c == '.' ||
           c == '-' || c == '_' || c == ':' || c == '%';
}

bool validHost(const std::string& host) {
    if (host.empty() || host.size() > kMaxHostLength || host[0] == '-')
        return false;
    for (char c : host)
        if (!isHostChar(c))
            return false;
    return true;
}

bool validPort(const std::string& port) {
    if (port.empty() || port.size() > 5)
        return false;
    unsigned long value = 0;
    for (char c : port) {
        if (c < '0' || c > '9')
            return false;
        value = value * 10 + unsigned(c - '0');
    }
    return value >= 1 && value <= 65535;
}

void put16(std::string& packet, uint16_t value) {
    packet.push_back(char(value >> 8));
    packet.push_back(char(value & 0xFF));
}

uint16_t get16(const unsigned char* p) {
    return uint16_t((p[0] << 8) | p[1]);
}

std::string ackPacket(uint16_t block) {
    std::string packet;
    put16(packet, OP_ACK);
    put16(packet, block);
    return packet;
}

std::string errorPacket(uint16_t code, const char* text) {
    std::string packet;
    put16(packet, OP_ERROR);
    put16(packet, code);
    packet.append(text);
    packet.push_back('\0');
    return packet;
}

bool sameHost(const sockaddr_storage& a, const sockaddr_storage& b) {
    if (a.ss_family != b.ss_family)
        return false;
    if (a.ss_family == AF_INET)
        return reinterpret_cast<const sockaddr_in&>(a).sin_addr.s_addr ==
               reinterpret_cast<const sockaddr_in&>(b).sin_addr.s_addr;
    if (a.ss_family == AF_INET6)
        return std::memcmp(&reinterpret_cast<const sockaddr_in6&>(a).sin6_addr,
                           &reinterpret_cast<const sockaddr_in6&>(b).sin6_addr,
                           sizeof(in6_addr)) == 0;
    return false;
}

uint16_t portOf(const sockaddr_storage& a) {
    if (a.ss_family == AF_INET)
        return reinterpret_cast<const sockaddr_in&>(a).sin_port;
    if (a.ss_family == AF_INET6)
        return reinterpret_cast<const sockaddr_in6&>(a).sin6_port;
    return 0;
}

bool sameEndpoint(const sockaddr_storage& a, const sockaddr_storage& b) {
    return sameHost(a, b) && portOf(a) == portOf(b);
}

// The server's error text, cut at its NUL and made printable.
std::string errorText(const unsigned char* text, size_t length) {
    std::string out;
    for (size_t i = 0; i < length && text[i] != '\0' && out.size() < 200; i++)
        out.push_back(text[i] >= 0x20 && text[i] < 0x7F ? char(text[i]) : '?');
    return out;
}

bool writeAll(int fd, const unsigned char* data, size_t length) {
    while (length > 0) {
        ssize_t n = ::write(fd, data, length);
        if (n < 0) {
            if (errno == EINTR)
                continue;
            return false;
        }
        data += n;
        length -= size_t(n);
    }
    return true;
}

class Socket {
public:
    Socket() = default;
    ~Socket() {
        if (fd >= 0)
            ::close(fd);
    }
    Socket(const Socket&) = delete;
    Socket& operator=(const Socket&) = delete;
    int fd = -1;
};

class Transfer {
public:
    Transfer(int sock, const sockaddr_storage& server, socklen_t serverLength, int out,
             const TftpOptions& options)
        : _sock(sock), _server(server), _serverLength(serverLength), _out(out), _options(options) {}

    int run(const char* remoteName, std::string& error);

private:
    typedef std::chrono::steady_clock Clock;

    void send(const std::string& packet, const sockaddr_storage& to, socklen_t length) {
        ::sendto(_sock, packet.data(), packet.size(), 0, reinterpret_cast<const sockaddr*>(&to),
                 length);
    }
    void sendLast() {
        if (_locked)
            send(_last, _peer, _peerLength);
        else
            send(_last, _server, _serverLength);
    }

    int _sock;
    sockaddr_storage _server;
    socklen_t _serverLength;
    int _out;
    const TftpOptions& _options;

    bool _locked = false;
    sockaddr_storage _peer{};
    socklen_t _peerLength = 0;
    std::string _last;
};

int Transfer::run(const char* remoteName, std::string& error) {
    _last.clear();
    put16(_last, OP_RRQ);
    _last.append(remoteName);
    _last.push_back('\0');
    _last.append("octet");
    _last.push_back('\0');
    sendLast();

    const auto timeout = std::chrono::milliseconds(_options.timeoutMs > 0 ? _options.timeoutMs : 1);
    const auto end = Clock::now() + std::chrono::milliseconds(std::max(_options.totalMs, 1));
    auto deadline = Clock::now() + timeout;
    int resent = 0;
    uint16_t expected = 1;
    uint64_t received = 0;
    unsigned char buffer[kMaxPacket + 1];

    for (;;) {
        auto now = Clock::now();
        if (now >= end) {
            error = "not complete after " + std::to_string(_options.totalMs) + " ms";
            return -1;
        }
        if (now >= deadline) {
            if (resent >= _options.retries) {
                error = "timed out waiting for block " + std::to_string(expected);
                return -1;
            }
            resent++;
            sendLast();
            deadline = now + timeout;
            continue;
        }
        auto wait =
            std::chrono::duration_cast<std::chrono::milliseconds>(std::min(deadline, end) - now)
                .count();
        pollfd pfd = {_sock, POLLIN, 0};
        int ready = ::poll(&pfd, 1, int(wait) + 1);
        if (ready < 0 && errno != EINTR) {
            error = std::string("poll failed: ") + std::strerror(errno);
            return -1;
        }
        if (ready <= 0)
            continue;

        sockaddr_storage from{};
        socklen_t fromLength = sizeof(from);
        ssize_t n = ::recvfrom(_sock, buffer, sizeof(buffer), 0, reinterpret_cast<sockaddr*>(&from),
                               &fromLength);
        if (n < 0)
            continue;
        if (!sameHost(from, _server))
            continue;  // not the server we asked
        if (_locked && !sameEndpoint(from, _peer)) {
            send(errorPacket(5, "Unknown transfer ID"), from, fromLength);
            continue;
        }
        if (n < 4 || size_t(n) > kMaxPacket)
            continue;

        uint16_t opcode = get16(buffer);
        uint16_t block = get16(buffer + 2);
        if (opcode == OP_ERROR) {
            error = "server error " + std::to_string(block) + ": " +
                    errorText(buffer + 4, size_t(n) - 4);
            return -1;
        }
        if (opcode != OP_DATA)
            continue;

        if (!_locked) {
            if (block != 1)
                continue;
            _locked = true;
            _peer = from;
            _peerLength = fromLength;
        }

        if (block == expected) {
            size_t length = size_t(n) - 4;
            if (received + length > _options.maxBytes) {
                send(errorPacket(3, "Disk full or allocation exceeded"), _peer, _peerLength);
                error = "file larger than " + std::to_string(_options.maxBytes) + " bytes";
                return -1;
            }
            if (!writeAll(_out, buffer + 4, length)) {
                int saved = errno;
                send(errorPacket(3, "Disk full or allocation exceeded"), _peer, _peerLength);
                error = std::string("write failed: ") + std::strerror(saved);
                return -1;
            }
            received += length;
            _last = ackPacket(block);
            sendLast();
            if (length < kBlockSize)
                return 0;
            expected = uint16_t(expected + 1);
            resent = 0;
            deadline = Clock::now() + timeout;
        } else if (block == uint16_t(expected - 1)) {
            // Our acknowledgement was lost and the server sent the block again.
            sendLast();
        }
    }
}

}  // namespace

bool parseTftpServer(const char* text, std::string& host, std::string& port) {
    if (text == nullptr)
        return false;
    std::string s(text);
    port = "69";
    if (!s.empty() && s[0] == '[') {
        size_t close = s.find(']');
        if (close == std::string::npos)
            return false;
        host = s.substr(1, close - 1);
        std::string rest = s.substr(close + 1);
        if (!rest.empty()) {
            if (rest[0] != ':')
                return false;
            port = rest.substr(1);
        }
        if (host.find(':') == std::string::npos)
            return false;
    } else {
        size_t first = s.find(':');
        if (first != std::string::npos && s.find(':', first + 1) == std::string::npos) {
            host = s.substr(0, first);
            port = s.substr(first + 1);
        } else {
            host = s;
        }
    }
    return validHost(host) && validPort(port);
}

int tftpReceive(const char* server, const char* remoteName, int fd, const TftpOptions& options,
                std::string& error) {
    std::string host, port;
    if (!parseTftpServer(server, host, port)) {
        error = "invalid server name";
        return -1;
    }
    if (remoteName == nullptr || remoteName[0] == '\0' ||
        std::strlen(remoteName) > kMaxNameLength) {
        error = "invalid file name";
        return -1;
    }

    addrinfo hints{};
    hints.ai_family = AF_UNSPEC;
    hints.ai_socktype = SOCK_DGRAM;
    hints.ai_flags = AI_NUMERICSERV;
    addrinfo* found = nullptr;
    int rc = ::getaddrinfo(host.c_str(), port.c_str(), &hints, &found);
    if (rc != 0 || found == nullptr) {
        error = "cannot resolve " + host + ": " + ::gai_strerror(rc);
        return -1;
    }

    Socket sock;
    sockaddr_storage address{};
    socklen_t addressLength = 0;
    for (addrinfo* ai = found; ai != nullptr; ai = ai->ai_next) {
        if (ai->ai_addrlen > sizeof(address))
            continue;
        sock.fd = ::socket(ai->ai_family, ai->ai_socktype | SOCK_CLOEXEC, ai->ai_protocol);
        if (sock.fd >= 0) {
            std::memcpy(&address, ai->ai_addr, ai->ai_addrlen);
            addressLength = ai->ai_addrlen;
            break;
        }
    }
    ::freeaddrinfo(found);
    if (sock.fd < 0) {
        error = std::string("cannot open a socket: ") + std::strerror(errno);
        return -1;
    }

    Transfer transfer(sock.fd, address, addressLength, fd, options);
    return transfer.run(remoteName, error);
}

}  // namespace CPTA
