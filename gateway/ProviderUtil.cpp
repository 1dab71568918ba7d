// ProviderUtil: class names, the library's answer test and the driver gate,
// address forms and text. Its other duties have units of their own:
// ProviderUtil_Adapters.cpp (adapter look-ups), ProviderUtil_Host.cpp (the
// host's identity), ProviderUtil_System.cpp (agent detection, file test,
// the library's log callback), ProviderUtil_Tftp.cpp (TFTP downloads).
#include "gateway/ProviderUtil.h"

#include <cstring>
#include <vector>

#include "framework/Log.h"
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

}  // namespace

ProviderUtil* ProviderUtil::getProviderUtil() {
    static ProviderUtil instance;
    return &instance;
}

// ---- class names and status ----------------------------------------------

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

// ---- address forms ----------------------------------------------------------

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

// ---- text -------------------------------------------------------------------

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

String ProviderUtil::trimString(const String& text, size_t width) {
    if (width == 0)
        return String();
    std::vector<char> buffer(width, '\0');
    trimString(text.c_str(), buffer.data(), width);
    return String(buffer.data());
}

String ProviderUtil::firstChars(const String& text, size_t width) {
    return text.size() > width ? text.substr(0, width) : text;
}

bool ProviderUtil::valid_UTF_string(const char* text) {
    if (text == nullptr)
        return false;
    unsigned char first = static_cast<unsigned char>(text[0]);
    return first < 0x80 || (first >= 0xC2 && first <= 0xF4);
}

}  // namespace CPTA
