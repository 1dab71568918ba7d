// A small TFTP client: read requests only, octet mode (RFC 1350).
//
// Each packet is waited for `timeoutMs`; on a time-out the last packet sent
// (the read request or the last acknowledgement) is sent again, at most
// `retries` times in a row, before the transfer fails. However the server
// paces its packets, a transfer that has not ended after `totalMs` fails: with
// the defaults a dead server costs 18 s and any server at most 60 s (looking
// up a server name is the resolver's business and comes on top). The
// server's transfer port is fixed by its first data packet; packets from
// elsewhere are refused ("Unknown transfer ID") or ignored. Block numbers wrap
// after 65535, so files beyond 32 MiB are fine up to `maxBytes`.
#ifndef CPTA_GATEWAY_TFTPCLIENT_H
#define CPTA_GATEWAY_TFTPCLIENT_H

#include <cstdint>
#include <string>

namespace CPTA {

struct TftpOptions {
    int timeoutMs = 3000;
    int retries = 5;
    int totalMs = 60000;
    uint64_t maxBytes = uint64_t(256) << 20;
};

// Splits a server text into host and port: "host", "host:port", "[v6addr]",
// "[v6addr]:port", or a bare IPv6 literal (more than one colon, no port).
// The port defaults to "69". False for an empty or malformed text, a port that
// is not a number from 1 to 65535, or characters that cannot appear in a host
// name or address literal.
bool parseTftpServer(const char* text, std::string& host, std::string& port);

// Fetches `remoteName` from `server` (as for parseTftpServer) and writes it to
// the open descriptor `fd`. Returns 0 on success; -1 with a description in
// `error` otherwise (bytes already written stay in fd).
int tftpReceive(const char* server, const char* remoteName, int fd, const TftpOptions& options,
                std::string& error);

}  // namespace CPTA

#endif
