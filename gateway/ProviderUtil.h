// Utilities shared by every part of the module: class names, the two address
// forms and the text helpers, the host's identity, adapter look-ups through
// the adapter library and a few system services (each duty in a source of
// its own, ProviderUtil*.cpp).
//
// Address forms: the library is always addressed in colon format
// ("10:00:00:05:33:a0:b1:c2", 23 characters for a WWN, 17 for a MAC); CIM key
// properties carry the same digits without colons (16 or 12 characters).
//
// Everything is static and keeps no state between calls (apart from the
// settings below, which are set at start-up or by tests); any thread may call.
// Library calls are made as the adapter-library convention has it: the
// look-ups that read one adapter (getAdapterDetails and those built on it) are
// guarded and never throw; the list and id look-ups are plain calls, so an
// exception thrown by the library reaches the caller. JSON answers are read
// through gateway/JsonAccess.h: a member of the wrong type counts as missing.
#ifndef CPTA_GATEWAY_PROVIDERUTIL_H
#define CPTA_GATEWAY_PROVIDERUTIL_H

#include <cstddef>
#include <string>
#include <vector>

#include <json/json.h>

#include "framework/String.h"
#include "gateway/ClassId.h"

namespace CPTA {

struct TftpOptions;

// How the host is looked up; replaceable so that tests can play any host.
struct HostLookup {
    int (*hostName)(char* name, size_t length);    // as gethostname: 0 or -1
    int (*domainName)(char* name, size_t length);  // as getdomainname: 0 or -1
    // The host's IPv4 addresses in resolver order, as dotted text; false when
    // the name does not resolve.
    bool (*resolveIPv4)(const char* name, std::vector<std::string>& addresses);
};

class ProviderUtil {
public:
    static ProviderUtil* getProviderUtil();

    // ---- class names and status -------------------------------------------
    static String getClassName(classId_t classId);  // "INVALID CLASS" outside 0..38
    // False for null; true for any non-object; for an object, true when it
    // has no "error" member.
    static bool isValidJsonResponse(const Json::Value& response);
    // The driver gate: false only for driver status 2 or 3.
    static bool getDriverStatus();

    // ---- address forms ----------------------------------------------------
    // "0123456789ab" -> "01:23:45:67:89:ab"; text holding a colon, or shorter
    // than four characters, comes back unchanged; an odd last character stays
    // with the last pair.
    static String getIndexInColonFormat(const String& index);
    static String eraseColonsFromIndex(const String& index);
    // Bytes from 12 / 16 hexadecimal digits; false (output zeroed beyond what
    // was read) when the text does not hold them all.
    static bool getRawMacFromStr(const char* text, unsigned char mac[6]);
    static bool getRawWWNFromStr(const char* text, unsigned char wwn[8]);
    // Characters 19..22 of the tag (dropped when "0000") followed by the
    // characters from 24 on. The second argument is not used.
    static String getNodeMACOrWWNFromTag(const String& tag, const String& unused = String());

    // ---- host identity (ProviderUtil_Host.cpp) ----------------------------
    // Fills hostString (at most `length` bytes, NUL included) with the text
    // naming this host in keys and paths. Returns 0 when it is the first
    // non-loopback IPv4 address, 2 when it is the host name, 3 when it is
    // "localhost" because the host name could not be read.
    static int getHostInfo(char* hostString, size_t length);
    static String getHostName();  // uname's node name, or "localhost"
    // "//<host>/root/tavrin:<className>"
    static String updateNamespacePath(const String& className);
    // The same for a host text already looked up.
    static String namespacePath(const char* host, const String& className);
    // The CIM namespace of this module's classes.
    static constexpr const char* NAMESPACE = "root/tavrin";
    // Replaces the system look-up (null restores it).
    static void setHostLookup(const HostLookup* lookup);

    // ---- adapter look-ups (ProviderUtil_Adapters.cpp) ---------------------
    // Stores the library's adapter list in `adapters`; the number of adapters,
    // or -1 when the list is unusable.
    static int getNumberOfAdapters(Json::Value& adapters);
    // Key of adapter `adapterId` (numbered from 1), or "".
    static String getAddrByAdapterId(unsigned int adapterId);
    // The library's record of one adapter (guarded); 0, or -1 unless it
    // carries both "hbaData" and "driver".
    static int getAdapterDetails(const String& key, Json::Value& details);
    static String getAdapterSerialNumber(const String& key);
    static bool checkIfThisAdapterModelPresent(const char* model);
    static bool isCNA(const String& key);
    static bool hasEthernetPort(const String& key);
    static String getDriverVersion();
    // Adapter number of a raw WWN (16 characters) or raw MAC (12); -1 otherwise.
    static int getAdapterId(const String& address);
    static int getAdapterIdByNWWN(const String& wwn);
    static int getAdapterIdByMacAddr(const String& mac);
    static int getAdapterIdByIndexStr(const String& address);

    // Operating-system device name of an Ethernet function, from the Ethernet
    // inventory's record of the port ("ethData"."ethDev"), or "".
    static String getEthDeviceNameByMAC(const String& mac);
    // The Ethernet inventory supplies its port look-up here at start-up
    // (EthernetPortHelper::getEthPortDetails: 0 and the port record, or -1).
    // Until then getEthDeviceNameByMAC finds nothing.
    typedef int (*EthPortDetailsFn)(const String& portKey, Json::Value& port);
    static void setEthPortDetailsHook(EthPortDetailsFn hook);

    // ---- system services (ProviderUtil_System.cpp) ------------------------
    static constexpr int AGENT_PORT = 34568;
    // AGENT_PORT when the host management agent (a process named mdcagent)
    // is running, else 0.
    static int getAgentPort();
    // Whether a live (not zombie) process whose command name is `name` is
    // listed under procRoot.
    static bool isProcessRunning(const char* name, const char* procRoot = "/proc");

    static bool IsFileExist(const char* path);

    // Log callback handed to the library: library levels 1..5 map to DBG,
    // INFO, WARN, ERR, INFO (others DBG).
    static void logMsg(int level, const char* file, int line, const char* message) noexcept;

    // ---- TFTP downloads (ProviderUtil_Tftp.cpp) ---------------------------
    // Fetches `file` from TFTP server `server` ("host" or "host:port") into
    // the download directory, replacing any earlier copy; 0 on success, -1 on
    // failure (nothing left behind). The name must be relative, without ".."
    // components; the local copy is tftpLocalPath(file).
    static int TftpGetFile(const char* server, const char* file);
    // Where TftpGetFile puts `file`: its last path component inside the
    // download directory ("" when the name is not acceptable).
    static String tftpLocalPath(const char* file);
    // The download directory; "." (the process's working directory) unless set.
    static void setTftpDownloadDir(const String& dir);
    static String getTftpDownloadDir();
    // Time-outs and size limit of the client (gateway/TftpClient.h).
    static void setTftpOptions(const TftpOptions& options);

    // ---- text -------------------------------------------------------------
    // Copies input without leading and trailing blanks into output (at most
    // outputSize bytes, NUL included).
    static void trimString(const char* input, char* output, size_t outputSize);
    template <size_t N>
    static void trimString(const char* input, char (&output)[N]) {
        trimString(input, output, N);
    }
    // The text without leading and trailing blanks, as trimString leaves it
    // in a buffer of `width` bytes.
    static String trimString(const String& text, size_t width);
    // The first `width` characters.
    static String firstChars(const String& text, size_t width);
    // Whether the first byte may begin a UTF-8 character.
    static bool valid_UTF_string(const char* text);
};

}  // namespace CPTA

#endif
