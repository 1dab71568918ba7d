#include "gateway/ProviderUtil.h"

#include <arpa/inet.h>
#include <dirent.h>
#include <fcntl.h>
#include <netdb.h>
#include <netinet/in.h>
#include <sys/stat.h>
#include <sys/utsname.h>
#include <unistd.h>

#include <atomic>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <mutex>

#include "framework/Log.h"
#include "gateway/CIMProviderTfaj.h"
#include "gateway/GuardedCall.h"
#include "gateway/JsonAccess.h"
#include "gateway/ProviderInit.h"

namespace CPTA {

namespace {

const char* const kClassNames[MAXCLASSID] = {
    "--",
    "TAVRIN_ComputerSystem",
    "TAVRIN_PortController",
    "TAVRIN_FCPort",
    "TAVRIN_SCSIProtocolEndpoint",
    "TAVRIN_FCPortStatistics",
    "TAVRIN_PhysicalPackage",
    "TAVRIN_Product",
    "TAVRIN_AdapterSoftwareIdentity",
    "TAVRIN_StorageExtent",
    "TAVRIN_RegisteredProfile",
    "TAVRIN_RegisteredSubProfile",
    "TAVRIN_Namespace",
    "TAVRIN_ObjectManager",
    "TAVRIN_CIMXMLCommunicationMechanism",
    "TAVRIN_ProfileSoftwareIdentity",
    "TAVRIN_TapeDrive",
    "TAVRIN_RemoteServiceAccessPoint",
    "TAVRIN_HBASoftwareInstallationService",
    "TAVRIN_HBASoftwareInstallationServiceCapabilities",
    "TAVRIN_EthernetPort",
    "TAVRIN_MemoryDiagnosticTest",
    "TAVRIN_LoopbackDiagnosticTest",
    "TAVRIN_PCILoopbackDiagnosticTest",
    "TAVRIN_EthLoopbackDiagnosticTest",
    "TAVRIN_DiagnosticSoftwareIdentity",
    "TAVRIN_ConcreteJob",
    "TAVRIN_DiagnosticServiceRecord",
    "TAVRIN_DiagnosticCompletionRecord",
    "TAVRIN_DiagnosticElementSoftwareIdentity",
    "TAVRIN_LogicalPortGroup",
    "TAVRIN_AffectedJobElement",
    "TAVRIN_ServiceRecordAppliesToElement",
    "TAVRIN_CompletionRecordAppliesToElement",
    "TAVRIN_LANEndpoint",
    "TAVRIN_PhysicalConnector",
    "TAVRIN_AlarmDevice",
    "TAVRIN_AgentService",
    "TAVRIN_LogicalDisk",
};

const size_t kHostBufferSize = 255;
const size_t kMacLength = 17;  // colon format

// ---- host look-up ---------------------------------------------------------

int systemHostName(char* name, size_t length) {
    return ::gethostname(name, length);
}

int systemDomainName(char* name, size_t length) {
    return ::getdomainname(name, length);
}

bool systemResolveIPv4(const char* name, std::vector<std::string>& addresses) {
    addrinfo hints{};
    hints.ai_family = AF_INET;
    hints.ai_socktype = SOCK_STREAM;  // one entry per address
    addrinfo* found = nullptr;
    if (::getaddrinfo(name, nullptr, &hints, &found) != 0)
        return false;
    for (addrinfo* ai = found; ai != nullptr; ai = ai->ai_next) {
        if (ai->ai_family != AF_INET || ai->ai_addrlen < sizeof(sockaddr_in))
            continue;
        char text[INET_ADDRSTRLEN] = {0};
        const sockaddr_in* sin = reinterpret_cast<const sockaddr_in*>(ai->ai_addr);
        if (::inet_ntop(AF_INET, &sin->sin_addr, text, sizeof(text)) != nullptr)
            addresses.push_back(text);
    }
    ::freeaddrinfo(found);
    return true;
}

const HostLookup kSystemLookup = {systemHostName, systemDomainName, systemResolveIPv4};
std::atomic<const HostLookup*> gHostLookup{nullptr};

const HostLookup& hostLookup() {
    const HostLookup* lookup = gHostLookup.load(std::memory_order_acquire);
    return lookup != nullptr ? *lookup : kSystemLookup;
}

// Reads the host name into a 256-byte buffer, always terminated.
bool readHostName(char (&name)[256]) {
    std::memset(name, 0, sizeof(name));
    if (hostLookup().hostName(name, sizeof(name) - 1) != 0)
        return false;
    name[sizeof(name) - 1] = '\0';
    return true;
}

void copyOut(char* hostString, size_t length, const char* text) {
    if (hostString != nullptr && length > 0)
        strlcpy(hostString, text, length);
}

// ---- other state ------------------------------------------------------------

std::atomic<ProviderUtil::EthPortDetailsFn> gEthPortDetails{nullptr};

struct TftpSettings {
    std::mutex mutex;
    std::string downloadDir = ".";
    TftpOptions options;
};

TftpSettings& tftpSettings() {
    static TftpSettings settings;
    return settings;
}

// Client-supplied text made safe for one log line.
std::string printable(const char* text) {
    std::string out;
    if (text == nullptr)
        return "(null)";
    for (const char* p = text; *p != '\0' && out.size() < 200; p++) {
        unsigned char c = static_cast<unsigned char>(*p);
        out.push_back(c >= 0x20 && c != 0x7F ? char(c) : '?');
    }
    return out;
}

int hexDigit(char c) {
    if (c >= '0' && c <= '9')
        return c - '0';
    if (c >= 'a' && c <= 'f')
        return c - 'a' + 10;
    if (c >= 'A' && c <= 'F')
        return c - 'A' + 10;
    return -1;
}

// Reads `count` bytes from 2 * count hexadecimal digits at the start of text.
bool readHexBytes(const char* text, unsigned char* out, size_t count) {
    if (out == nullptr)
        return false;
    std::memset(out, 0, count);
    if (text == nullptr)
        return false;
    for (size_t i = 0; i < count; i++) {
        int high = hexDigit(text[2 * i]);
        if (high < 0)
            return false;
        int low = hexDigit(text[2 * i + 1]);
        if (low < 0)
            return false;
        out[i] = static_cast<unsigned char>(high * 16 + low);
    }
    return true;
}

Json::Value jsonText(const String& s) {
    return Json::Value(s.c_str(), s.c_str() + s.size());
}

bool readSmallFile(const std::string& path, std::string& content, size_t limit) {
    int fd = ::open(path.c_str(), O_RDONLY | O_CLOEXEC);
    if (fd < 0)
        return false;
    char buffer[512];
    if (limit > sizeof(buffer))
        limit = sizeof(buffer);
    ssize_t n;
    do {
        n = ::read(fd, buffer, limit);
    } while (n < 0 && errno == EINTR);
    ::close(fd);
    if (n < 0)
        return false;
    content.assign(buffer, size_t(n));
    return true;
}

}  // namespace

ProviderUtil* ProviderUtil::getProviderUtil() {
    static ProviderUtil instance;
    return &instance;
}

// ---- class names and status --------------------------------------------------

String ProviderUtil::getClassName(classId_t classId) {
    int id = int(classId);
    TVRN_LOG(LL_INFO, "ClassId = %d", id);
    if (id < 0 || id >= MAXCLASSID) {
        TVRN_LOG(LL_INFO, "ClassId is greater than MAXCLASSID");
        return String("INVALID CLASS");
    }
    TVRN_LOG(LL_INFO, "Class = %s", kClassNames[id]);
    return String(kClassNames[id]);
}

bool ProviderUtil::isValidJsonResponse(const Json::Value& response) {
    if (response.isNull())
        return false;
    if (!response.isObject())
        return true;
    return jsonMember(response, "error") == nullptr;
}

bool ProviderUtil::getDriverStatus() {
    int status = ProviderInit::getDriverStatus();
    return status != 2 && status != 3;
}

// ---- address forms -----------------------------------------------------------

String ProviderUtil::getIndexInColonFormat(const String& index) {
    if (index.find(':') != String::npos) {
        TVRN_LOG(LL_INFO, "The string %s is already in : format", index.c_str());
        return index;
    }
    size_t length = index.size();
    size_t pairs = length / 2;
    if (length < 4)
        return index;
    String out;
    out.reserve(length + pairs);
    for (size_t i = 0; i < length; i++) {
        out.append(index[i]);
        if (i % 2 == 1 && (i + 1) / 2 < pairs)
            out.append(':');
    }
    return out;
}

String ProviderUtil::eraseColonsFromIndex(const String& index) {
    String out;
    out.reserve(index.size());
    for (size_t i = 0; i < index.size(); i++)
        if (index[i] != ':')
            out.append(index[i]);
    return out;
}

bool ProviderUtil::getRawMacFromStr(const char* text, unsigned char mac[6]) {
    return readHexBytes(text, mac, 6);
}

bool ProviderUtil::getRawWWNFromStr(const char* text, unsigned char wwn[8]) {
    return readHexBytes(text, wwn, 8);
}

String ProviderUtil::getNodeMACOrWWNFromTag(const String& tag, const String&) {
    String head = tag.substr(19, 4);
    String out;
    if (!head.equali("0000"))
        out.append(head);
    out.append(tag.substr(24));
    return out;
}

// ---- host identity -----------------------------------------------------------

void ProviderUtil::setHostLookup(const HostLookup* lookup) {
    gHostLookup.store(lookup, std::memory_order_release);
}

int ProviderUtil::getHostInfo(char* hostString, size_t length) {
    char name[256];
    if (!readHostName(name)) {
        copyOut(hostString, length, "localhost");
        TVRN_LOG(LL_INFO, "gethostname() FAILED. hostString will be filled with localhost");
        return 3;
    }

    std::vector<std::string> addresses;
    if (!hostLookup().resolveIPv4(name, addresses) || addresses.empty()) {
        copyOut(hostString, length, name);
        TVRN_LOG(LL_INFO,
                 "gethostbyname() FAILED. hostString will have hostname instead of ipAddress");
        return 2;
    }
    for (const std::string& address : addresses) {
        if (address.compare(0, 3, "127") != 0) {
            copyOut(hostString, length, address.c_str());
            return 0;
        }
    }

    // Only loopback addresses: name the host by its name.
    copyOut(hostString, length, name);
    if (!readHostName(name)) {
        TVRN_LOG(LL_INFO, "gethostname() failed");
        return 2;
    }
    char domain[256] = {0};
    if (hostLookup().domainName(domain, sizeof(domain) - 1) != 0) {
        TVRN_LOG(LL_INFO, "getdomainname() failed");
        return 2;
    }
    copyOut(hostString, length, name);
    TVRN_LOG(LL_INFO, "gethostbyname() FAILED. hostString will have hostname instead of ipAddress");
    return 2;
}

String ProviderUtil::getHostName() {
    struct utsname info;
    String name;
    if (::uname(&info) != 0) {
        TVRN_LOG(LL_ERR, "uname() returned error = %d", errno);
        name = "localhost";
    } else {
        name = info.nodename;
    }
    TVRN_LOG(LL_INFO, "Host Name: %s", name.c_str());
    return name;
}

String ProviderUtil::updateNamespacePath(const String& className) {
    char host[kHostBufferSize];
    std::memset(host, 0, sizeof(host));
    getHostInfo(host, sizeof(host));
    return namespacePath(host, className);
}

String ProviderUtil::namespacePath(const char* host, const String& className) {
    String path("//", host, "/");
    path.append(NAMESPACE);
    path.append(':');
    path.append(className);
    return path;
}

// ---- adapter look-ups ----------------------------------------------------------

int ProviderUtil::getNumberOfAdapters(Json::Value& adapters) {
    adapters = libGetAllAdaptersIndexString(Json::Value());
    if (isValidJsonResponse(adapters) && jsonHas(adapters, "indexStrings", Json::arrayValue)) {
        int count = int(jsonArray(adapters, "indexStrings").size());
        TVRN_LOG(LL_INFO, "Number of Adapters: %d", count);
        return count;
    }
    TVRN_LOG(LL_ERR, "libGetAllAdaptersIndexString returns NULL.");
    return -1;
}

String ProviderUtil::getAddrByAdapterId(unsigned int adapterId) {
    Json::Value adapters = libGetAllAdaptersIndexString(Json::Value());
    if (!isValidJsonResponse(adapters) || !jsonHas(adapters, "indexStrings", Json::arrayValue)) {
        TVRN_LOG(LL_ERR, "libGetAllAdaptersIndexString returns NULL.");
        return String();
    }
    const Json::Value& keys = jsonArray(adapters, "indexStrings");
    if (adapterId < 1 || adapterId > keys.size()) {
        TVRN_LOG(LL_INFO, "numOfAdapters = %u. Id = %u", unsigned(keys.size()), adapterId);
        return String();
    }
    return jsonAsString(keys[Json::ArrayIndex(adapterId - 1)]);
}

int ProviderUtil::getAdapterDetails(const String& key, Json::Value& details) {
    String index = getIndexInColonFormat(key);
    Json::Value request(Json::objectValue);
    request[index.size() == kMacLength ? "mac" : "wwn"] = jsonText(index);
    if (!guardedCall(LibCall("libGetHbaByWwn", index), libGetHbaByWwn, request, details))
        return -1;
    if (isValidJsonResponse(details) && jsonHas(details, "hbaData", Json::objectValue) &&
        jsonHas(details, "driver", Json::objectValue))
        return 0;
    TVRN_LOG(LL_ERR, "Unable to get adapater details for %s", index.c_str());
    return -1;
}

String ProviderUtil::getAdapterSerialNumber(const String& key) {
    Json::Value details;
    if (getAdapterDetails(key, details) != 0) {
        TVRN_LOG(LL_ERR, "Unable to get Adapter info for %s", key.c_str());
        return String();
    }
    if (!isValidJsonResponse(details)) {
        TVRN_LOG(LL_ERR, "adapter info is NULL or has errors for %s", key.c_str());
        return String();
    }
    const Json::Value& hba = jsonObject(details, "hbaData");
    String oem = jsonString(hba, "oemSerialNum");
    if (oem.size() == 0)
        return jsonString(hba, "serialNumber");
    String part = jsonString(hba, "partNum");
    if (part.size() > 0 && oem.equal(0, part.c_str(), part.size()))
        return oem.substr(part.size());
    return oem;
}

bool ProviderUtil::checkIfThisAdapterModelPresent(const char* model) {
    if (model == nullptr)
        return false;
    Json::Value adapters;
    int count = getNumberOfAdapters(adapters);
    if (count <= 0) {
        TVRN_LOG(LL_WARN, "No adapters in the system!");
        return false;
    }
    const String wanted(model);
    const Json::Value& keys = jsonArray(adapters, "indexStrings");
    for (int number = 1; number <= count; number++) {
        String key = jsonAsString(keys[Json::ArrayIndex(number - 1)]);
        Json::Value details;
        if (getAdapterDetails(key, details) != 0) {
            TVRN_LOG(LL_INFO, "Unable to get Adapter info %d - %s", number, key.c_str());
            continue;
        }
        if (details.isNull()) {
            TVRN_LOG(LL_ERR, "adapter is NULL for %s", key.c_str());
            continue;
        }
        // An adapter's model matches when the wanted text begins with it; an
        // adapter without a model matches nothing.
        String found = jsonString(jsonObject(details, "hbaData"), "model");
        if (found.size() > 0 && wanted.equali(0, found.c_str(), found.size())) {
            TVRN_LOG(LL_INFO, "Found the Adapter");
            return true;
        }
    }
    return false;
}

bool ProviderUtil::isCNA(const String& key) {
    String index = getIndexInColonFormat(key);
    Json::Value details;
    if (getAdapterDetails(index, details) != 0)
        return false;
    const Json::Value& hba = jsonObject(details, "hbaData");
    if (!jsonHas(hba, "isCNA", Json::booleanValue)) {
        TVRN_LOG(LL_ERR, "Unable to get CNA info for %s", index.c_str());
        return false;
    }
    bool cna = jsonBool(hba, "isCNA");
    TVRN_LOG(LL_INFO, "isCNA = %d", int(cna));
    return cna;
}

bool ProviderUtil::hasEthernetPort(const String& key) {
    String index = getIndexInColonFormat(key);
    Json::Value details;
    if (getAdapterDetails(index, details) != 0)
        return false;
    const Json::Value& hba = jsonObject(details, "hbaData");
    if (!jsonHas(hba, "hasEthPort", Json::booleanValue)) {
        TVRN_LOG(LL_ERR, "Unable to get Ethernet info %s", index.c_str());
        return false;
    }
    bool eth = jsonBool(hba, "hasEthPort");
    TVRN_LOG(LL_INFO, "ethFlag = %d", int(eth));
    return eth;
}

String ProviderUtil::getDriverVersion() {
    Json::Value adapters;
    if (getNumberOfAdapters(adapters) <= 0)
        return String();
    String key = jsonAsString(jsonArray(adapters, "indexStrings")[0]);
    Json::Value details;
    if (getAdapterDetails(key, details) != 0)
        return String();
    const Json::Value& driver = jsonObject(details, "driver");
    String version;
    if (jsonHas(driver, "storageDriverVersion", Json::stringValue)) {
        version = jsonString(driver, "storageDriverVersion");
    } else if (jsonHas(driver, "networkDriverVersion", Json::stringValue)) {
        version = jsonString(driver, "networkDriverVersion");
    } else {
        TVRN_LOG(LL_ERR, "Unable to get driver version for %s", key.c_str());
        return String();
    }
    char trimmed[64];
    trimString(version.c_str(), trimmed);
    TVRN_LOG(LL_INFO, "Driver version is %s", trimmed);
    return String(trimmed);
}

int ProviderUtil::getAdapterId(const String& address) {
    if (address.size() == 16)
        return getAdapterIdByNWWN(address);
    if (address.size() == 12)
        return getAdapterIdByMacAddr(address);
    TVRN_LOG(LL_ERR, "The address passed is not MAC or WWN");
    return -1;
}

int ProviderUtil::getAdapterIdByNWWN(const String& wwn) {
    return getAdapterIdByIndexStr(wwn);
}

int ProviderUtil::getAdapterIdByMacAddr(const String& mac) {
    return getAdapterIdByIndexStr(mac);
}

int ProviderUtil::getAdapterIdByIndexStr(const String& address) {
    Json::Value request(Json::objectValue);
    request["indexStr"] = jsonText(getIndexInColonFormat(address));
    Json::Value answer = libGetAdapterId(request);
    if (!isValidJsonResponse(answer) || !jsonHas(answer, "adapterId", Json::uintValue)) {
        TVRN_LOG(LL_ERR, "libGetAdapterId returns NULL.");
        return -1;
    }
    return int(jsonUInt(answer, "adapterId"));
}

void ProviderUtil::setEthPortDetailsHook(EthPortDetailsFn hook) {
    gEthPortDetails.store(hook, std::memory_order_release);
}

String ProviderUtil::getEthDeviceNameByMAC(const String& mac) {
    EthPortDetailsFn details = gEthPortDetails.load(std::memory_order_acquire);
    Json::Value port;
    int rc = -1;
    if (details != nullptr)
        guardedCall(LibCall("getEthPortDetails", mac), [&] { rc = details(mac, port); });
    if (rc == 0) {
        const Json::Value& eth = jsonObject(port, "ethData");
        if (jsonHas(eth, "ethDev", Json::stringValue))
            return jsonString(eth, "ethDev");
    }
    TVRN_LOG(LL_ERR, "Unable to get Eth Device Name for %s", mac.c_str());
    return String();
}

// ---- system services -------------------------------------------------------------

bool ProviderUtil::isProcessRunning(const char* name, const char* procRoot) {
    if (name == nullptr || name[0] == '\0' || procRoot == nullptr)
        return false;
    // The kernel keeps at most 15 characters of a command name.
    const std::string wanted = std::string(name).substr(0, 15);
    DIR* dir = ::opendir(procRoot);
    if (dir == nullptr)
        return false;
    bool found = false;
    while (!found) {
        dirent* entry = ::readdir(dir);
        if (entry == nullptr)
            break;
        const char* pid = entry->d_name;
        if (pid[0] == '\0' || pid[std::strspn(pid, "0123456789")] != '\0')
            continue;
        const std::string base = std::string(procRoot) + "/" + pid;
        std::string comm;
        if (!readSmallFile(base + "/comm", comm, 64))
            continue;
        while (!comm.empty() && (comm.back() == '\n' || comm.back() == '\0'))
            comm.pop_back();
        if (comm != wanted)
            continue;
        // A zombie is not running; the state follows the ") " that closes the name.
        std::string stat;
        if (readSmallFile(base + "/stat", stat, 512)) {
            size_t close = stat.rfind(')');
            if (close != std::string::npos && close + 2 < stat.size() &&
                (stat[close + 2] == 'Z' || stat[close + 2] == 'X'))
                continue;
        }
        found = true;
    }
    ::closedir(dir);
    return found;
}

int ProviderUtil::getAgentPort() {
    return isProcessRunning("mdcagent") ? AGENT_PORT : 0;
}

void ProviderUtil::setTftpDownloadDir(const String& dir) {
    TftpSettings& settings = tftpSettings();
    std::lock_guard<std::mutex> lock(settings.mutex);
    settings.downloadDir = dir.size() > 0 ? std::string(dir.c_str(), dir.size()) : ".";
}

String ProviderUtil::getTftpDownloadDir() {
    TftpSettings& settings = tftpSettings();
    std::lock_guard<std::mutex> lock(settings.mutex);
    return String(settings.downloadDir.c_str(), settings.downloadDir.size());
}

void ProviderUtil::setTftpOptions(const TftpOptions& options) {
    TftpSettings& settings = tftpSettings();
    std::lock_guard<std::mutex> lock(settings.mutex);
    settings.options = options;
}

namespace {

// Where `file` lands inside `dir`, or "" when the name is not acceptable: it
// must be relative, free of control characters and of ".." components, and
// end in a real file name.
String localPathIn(const std::string& dir, const char* file) {
    if (file == nullptr || file[0] == '\0' || file[0] == '/' || std::strlen(file) > 255)
        return String();
    for (const char* p = file; *p != '\0'; p++) {
        unsigned char c = static_cast<unsigned char>(*p);
        if (c < 0x20 || c == 0x7F)
            return String();
    }
    // No ".." anywhere in the path, even where it would cancel out.
    const char* component = file;
    for (;;) {
        const char* slash = std::strchr(component, '/');
        size_t length = slash != nullptr ? size_t(slash - component) : std::strlen(component);
        if (length == 2 && component[0] == '.' && component[1] == '.')
            return String();
        if (slash == nullptr)
            break;
        component = slash + 1;
    }
    // `component` is now the last one: the local file's name.
    if (component[0] == '\0' || std::strcmp(component, ".") == 0)
        return String();
    if (dir == ".")
        return String(component);
    return String(dir.c_str(), "/", component);
}

}  // namespace

String ProviderUtil::tftpLocalPath(const char* file) {
    TftpSettings& settings = tftpSettings();
    std::lock_guard<std::mutex> lock(settings.mutex);
    return localPathIn(settings.downloadDir, file);
}

int ProviderUtil::TftpGetFile(const char* server, const char* file) {
    std::string dir;
    TftpOptions options;
    {
        TftpSettings& settings = tftpSettings();
        std::lock_guard<std::mutex> lock(settings.mutex);
        dir = settings.downloadDir;
        options = settings.options;
    }

    String local = localPathIn(dir, file);
    if (local.size() == 0) {
        TVRN_LOG(LL_ERR, "TFTP file name refused: %s", printable(file).c_str());
        return -1;
    }
    std::string host, port;
    if (!parseTftpServer(server, host, port)) {
        TVRN_LOG(LL_ERR, "TFTP server name refused: %s", printable(server).c_str());
        return -1;
    }

    // Any earlier copy goes first, so a failed fetch never leaves a stale file.
    if (::unlink(local.c_str()) != 0 && errno != ENOENT) {
        TVRN_LOG(LL_ERR, "Cannot remove %s: %s", local.c_str(), std::strerror(errno));
        return -1;
    }
    // Fetch into a private temporary file and move it into place when complete.
    std::string temporary = dir + "/.tftp-XXXXXX";
    int fd = ::mkostemp(&temporary[0], O_CLOEXEC);
    if (fd < 0) {
        TVRN_LOG(LL_ERR, "Cannot create a file in %s: %s", dir.c_str(), std::strerror(errno));
        return -1;
    }
    ::fchmod(fd, 0644);

    std::string error;
    int rc = tftpReceive(server, file, fd, options, error);
    if (::close(fd) != 0 && rc == 0) {
        error = std::string("close failed: ") + std::strerror(errno);
        rc = -1;
    }
    if (rc == 0 && ::rename(temporary.c_str(), local.c_str()) != 0) {
        error = std::string("cannot rename to ") + local.c_str() + ": " + std::strerror(errno);
        rc = -1;
    }
    if (rc != 0) {
        ::unlink(temporary.c_str());
        TVRN_LOG(LL_ERR, "TFTP get of %s from %s failed: %s", printable(file).c_str(),
                 printable(server).c_str(), error.c_str());
        return -1;
    }
    TVRN_LOG(LL_INFO, "TFTP get of %s from %s saved as %s", printable(file).c_str(),
             printable(server).c_str(), local.c_str());
    return 0;
}

bool ProviderUtil::IsFileExist(const char* path) {
    struct stat info;
    return path != nullptr && ::stat(path, &info) == 0;
}

void ProviderUtil::trimString(const char* input, char* output, size_t outputSize) {
    if (output == nullptr || outputSize == 0)
        return;
    if (input == nullptr)
        input = "";
    const char* begin = input;
    while (*begin == ' ')
        begin++;
    size_t length = std::strlen(begin);
    while (length > 0 && begin[length - 1] == ' ')
        length--;
    if (length >= outputSize)
        length = outputSize - 1;
    std::memcpy(output, begin, length);
    output[length] = '\0';
    TVRN_LOG(LL_INFO, "Input String (string) = %s", input);
    TVRN_LOG(LL_INFO, "Output String (buf) = %s", output);
}

bool ProviderUtil::valid_UTF_string(const char* text) {
    if (text == nullptr)
        return false;
    unsigned char first = static_cast<unsigned char>(text[0]);
    return first < 0x80 || (first >= 0xC2 && first <= 0xF4);
}

void ProviderUtil::logMsg(int level, const char* file, int line, const char* message) noexcept {
    char where[32];
    std::snprintf(where, sizeof(where), "%s:%d ", file != nullptr ? file : "", line);
    Log_Level mapped;
    switch (level) {
        case 2: mapped = LL_INFO; break;
        case 3: mapped = LL_WARN; break;
        case 4: mapped = LL_ERR; break;
        case 5: mapped = LL_INFO; break;
        default: mapped = LL_DBG; break;
    }
    // The library's text is data, never a format.
    TVRN_LOG(mapped, "%s%s", where, message != nullptr ? message : "");
}

}  // namespace CPTA
