#include "update/SoftwareUpdateHelper.h"

#include <sys/stat.h>
#include <unistd.h>

#include <condition_variable>
#include <initializer_list>
#include <mutex>
#include <set>
#include <stdexcept>
#include <string>

#include "framework/Log.h"
#include "framework/Meta_Lookup.h"
#include "gateway/CIMProviderTfaj.h"
#include "gateway/GuardedCall.h"
#include "gateway/JsonAccess.h"
#include "gateway/ProviderUtil.h"
#include "inventory/FCHBAManager.h"
#include "inventory/HostIdentityScope.h"
#include "schema/generated/TAVRIN_HBASoftwareInstallationService.h"
#include "schema/generated/TAVRIN_HBASoftwareInstallationServiceCapabilities.h"

namespace CPTA {

namespace {

const char kServiceName[] = "Tavrin Adapter Software Update Service";

// CIM values the capabilities advertise.
const uint16 kUriSchemeFile = 3;
const uint16 kUriSchemeTftp = 8;
const uint16 kActionInstallFromUri = 5;

Array<uint16> numbers(std::initializer_list<uint16> values) {
    Array<uint16> out;
    for (uint16 v : values)
        out.append(v);
    return out;
}

std::string text(const String& s) {
    return std::string(s.c_str(), s.size());
}

// A check of an install that failed: its text goes to the log, the client
// gets `result`.
class Install_Error : public std::runtime_error {
public:
    explicit Install_Error(const char* what, uint32 result_ = INSTALL_FAILED)
        : std::runtime_error(what), result(result_) {}
    uint32 result;
};

// Where an image comes from: a local file, or a file on a TFTP server.
struct Image_Source {
    bool tftp = false;
    std::string server;
    std::string path;  // the local path, or the name on the server
};

// The scheme is compared exactly: "FILE://" is not a file URI.
Image_Source parseURI(const std::string& uri) {
    Image_Source source;
    if (uri.compare(0, 7, "file://") == 0) {
        source.path = uri.substr(7);
        TVRN_LOG(LL_INFO, "file=%s", source.path.c_str());
        if (source.path.empty())
            throw Install_Error("malformed file URI");
    } else if (uri.compare(0, 7, "tftp://") == 0) {
        // server "/" name, the server part at least two characters long.
        const std::string rest = uri.substr(7);
        const size_t slash = rest.find('/');
        if (slash == std::string::npos || slash < 2 || slash + 1 == rest.size())
            throw Install_Error("malformed tftp URI");
        source.tftp = true;
        source.server = rest.substr(0, slash);
        source.path = rest.substr(slash + 1);
    } else {
        TVRN_LOG(LL_ERR, "malformed uri. Throw error");
        throw Install_Error("malformed URI");
    }
    return source;
}

// Only a regular file that can be read is handed to the library: not a
// directory, a device or a pipe.
bool isFlashable(const std::string& path) {
    struct stat info;
    return ::stat(path.c_str(), &info) == 0 && S_ISREG(info.st_mode) &&
           ::access(path.c_str(), R_OK) == 0;
}

// Names that one install at a time may hold.
class Claim_Set {
public:
    bool tryClaim(const std::string& key) {
        std::lock_guard<std::mutex> lock(_mutex);
        return _held.insert(key).second;
    }
    void claim(const std::string& key) {
        std::unique_lock<std::mutex> lock(_mutex);
        _released.wait(lock, [&] { return _held.count(key) == 0; });
        _held.insert(key);
    }
    void release(const std::string& key) {
        {
            std::lock_guard<std::mutex> lock(_mutex);
            _held.erase(key);
        }
        _released.notify_all();
    }

private:
    std::mutex _mutex;
    std::condition_variable _released;
    std::set<std::string> _held;
};

// The adapters being updated (by DeviceID) and the downloaded copies being
// fetched or flashed (by local path).
Claim_Set& adaptersInUpdate() {
    static Claim_Set claims;
    return claims;
}
Claim_Set& copiesInUse() {
    static Claim_Set claims;
    return claims;
}

// One claim, released when the install ends however it ends.
class Claim {
public:
    Claim() = default;
    ~Claim() {
        if (_set != nullptr)
            _set->release(_key);
    }
    Claim(const Claim&) = delete;
    Claim& operator=(const Claim&) = delete;

    bool tryTake(Claim_Set& set, const std::string& key) {
        if (!set.tryClaim(key))
            return false;
        hold(set, key);
        return true;
    }
    void take(Claim_Set& set, const std::string& key) {
        set.claim(key);
        hold(set, key);
    }

private:
    void hold(Claim_Set& set, const std::string& key) {
        _set = &set;
        _key = key;
    }
    Claim_Set* _set = nullptr;
    std::string _key;
};

// The port controllers an install looks through; destroyed with it.
class Controller_List {
public:
    explicit Controller_List(const Array<Instance*>& all) : _all(all) {}
    ~Controller_List() {
        for (size_t i = 0; i < _all.size(); i++)
            if (_all[i] != nullptr)
                destroy(_all[i]);
    }
    Controller_List(const Controller_List&) = delete;
    Controller_List& operator=(const Controller_List&) = delete;

    // The first instance whose keys are the target's, when it is a port controller.
    const TAVRIN_PortController* find(const Instance* target) const {
        for (size_t i = 0; i < _all.size(); i++) {
            const Instance* candidate = _all[i];
            if (candidate == nullptr || !key_eq(candidate, target))
                continue;
            if (!is_subclass(&TAVRIN_PortController::static_meta_class, candidate->meta_class))
                return nullptr;
            return static_cast<const TAVRIN_PortController*>(candidate);
        }
        return nullptr;
    }

private:
    Array<Instance*> _all;
};

void checkArguments(const Property<String>& uri, const Instance* target,
                    const Property<Array<uint16>>& options) {
    if (uri.null || uri.value.size() == 0) {
        TVRN_LOG(LL_ERR, "URI.value is empty");
        throw Install_Error("empty input parameters");
    }
    if (target == nullptr) {
        TVRN_LOG(LL_ERR, "Target is empty");
        throw Install_Error("empty input parameters");
    }
    if (options.null || options.value.size() == 0) {
        TVRN_LOG(LL_ERR, "InstallOptions.value.size() is  0");
        throw Install_Error("empty input parameters");
    }
    // Further options and InstallOptionsValues are not looked at.
    const uint16 option = options.value[0];
    if (option != INSTALL_OPTION_INSTALL && option != INSTALL_OPTION_UPDATE) {
        TVRN_LOG(LL_ERR, "InstallOptions[0] validation failed. throw invalide option type");
        throw Install_Error("invalid option type");
    }
}

// FCHBAManager answers for the service and its capabilities (behind the
// driver gate), so association providers find them where they find the host.
Array<Instance*> softwareUpdateRoute(classId_t id) {
    _adapterData host;
    host.hostName = HostIdentityScope::hostText();
    return SoftwareUpdateHelper::getSoftwareUpdateHelperInstance()->getInstancesByClass(host, id);
}

struct RouteFilledAtLoad {
    RouteFilledAtLoad() {
        FCHBAManager::fillRoute(CID_HBA_SOFTWARE_INSTALLATION_SERVICE, softwareUpdateRoute);
    }
} routeFilledAtLoad;

}  // namespace

SoftwareUpdateHelper* SoftwareUpdateHelper::getSoftwareUpdateHelperInstance() {
    static SoftwareUpdateHelper instance;
    return &instance;
}

Array<Instance*> SoftwareUpdateHelper::getInstancesByClass(const _adapterData& host,
                                                           classId_t classId) {
    TVRN_LOG(LL_DBG, "Entering: %s", "getInstancesByClass");
    Array<Instance*> out;
    Instance* built = nullptr;
    switch (classId) {
        case CID_HBA_SOFTWARE_INSTALLATION_SERVICE:
            built = getHBASoftwareInstallationServiceInstance(host);
            break;
        case CID_HBA_SOFTWARE_INSTALLATION_SERVICE_CAPABILITIES:
            built = getHBASoftwareInstallationServiceCapabilitiesInstance(host);
            break;
        default: TVRN_LOG(LL_INFO, "Default case . Other classes "); break;
    }
    if (built != nullptr)
        out.append(built);
    TVRN_LOG(LL_INFO, "Number of instances: %d", int(out.size()));
    TVRN_LOG(LL_DBG, "Returning: %s", "getInstancesByClass");
    return out;
}

Instance* SoftwareUpdateHelper::getHBASoftwareInstallationServiceInstance(
    const _adapterData& host) {
    auto* service = create<TAVRIN_HBASoftwareInstallationService>(true);
    if (service == nullptr)
        return nullptr;
    service->SystemCreationClassName.set(ProviderUtil::getClassName(CID_COMPUTER_SYSTEM));
    service->SystemName.set(host.hostName);
    service->CreationClassName.set(
        ProviderUtil::getClassName(CID_HBA_SOFTWARE_INSTALLATION_SERVICE));
    service->Name.set(String(kServiceName));
    return service;
}

Instance* SoftwareUpdateHelper::getHBASoftwareInstallationServiceCapabilitiesInstance(
    const _adapterData&) {
    auto* capabilities = create<TAVRIN_HBASoftwareInstallationServiceCapabilities>(true);
    if (capabilities == nullptr)
        return nullptr;
    capabilities->InstanceID.set(String(kServiceName));
    capabilities->SupportedInstallOptions.set(
        numbers({INSTALL_OPTION_INSTALL, INSTALL_OPTION_UPDATE}));
    capabilities->SupportedURISchemes.set(numbers({kUriSchemeFile, kUriSchemeTftp}));
    capabilities->SupportedSynchronousActions.set(numbers({kActionInstallFromUri}));
    return capabilities;
}

int SoftwareUpdateHelper::UpdatePortControllerSoftware(const TAVRIN_PortController* pc,
                                                       const char* file) {
    TVRN_LOG(LL_DBG, "Entering: %s", "UpdatePortControllerSoftware");
    const String deviceId = pc->DeviceID.null ? String() : pc->DeviceID.value;
    TVRN_LOG(LL_INFO, "UpdatePortControllerSoftware portType=%d deviceid=%s file=%s\n",
             pc->ControllerType.null ? 0 : int(pc->ControllerType.value), deviceId.c_str(), file);

    Json::Value request = keyRequest("indexStr", ProviderUtil::getIndexInColonFormat(deviceId));
    request["file"] = file;
    Json::Value answer;
    int status = -1;
    if (guardedCall(LibCall("libAdapterUpdateFlash", deviceId), libAdapterUpdateFlash, request,
                    answer) &&
        ProviderUtil::isValidJsonResponse(answer) && jsonHas(answer, "status", Json::uintValue) &&
        jsonHas(answer, "message", Json::stringValue)) {
        status = int(jsonUInt(answer, "status"));
        TVRN_LOG(LL_DBG, "status=%d message = %s\n", status, jsonString(answer, "message").c_str());
    } else {
        TVRN_LOG(LL_ERR, "libAdapterUpdateFlash is failed.");
    }
    TVRN_LOG(LL_DBG, "Returning: %s", "UpdatePortControllerSoftware");
    return status;
}

uint32 SoftwareUpdateHelper::installFromURI(const Property<String>& uri, const Instance* target,
                                            const Property<Array<uint16>>& options,
                                            Controller_Source controllers) noexcept {
    TVRN_LOG(LL_DBG, "Entering: %s", "InstallFromURI");
    uint32 result = INSTALL_FAILED;
    try {
        checkArguments(uri, target, options);
        const Image_Source source = parseURI(text(uri.value));

        // The target first, so that its adapter is claimed before anything
        // is fetched for it.
        Controller_List found(controllers(CID_PORT_CONTROLLER));
        const TAVRIN_PortController* pc = found.find(target);
        if (pc == nullptr) {
            TVRN_LOG(LL_ERR, "Couldnt find the matching port controller.");
            throw Install_Error("Could not find target controller");
        }
        const std::string adapter = pc->DeviceID.null ? "" : text(pc->DeviceID.value);
        Claim adapterClaim;
        if (!adapterClaim.tryTake(adaptersInUpdate(), adapter)) {
            TVRN_LOG(LL_ERR, "Adapter %s is already being updated", adapter.c_str());
            throw Install_Error("target controller in use", INSTALL_TARGET_IN_USE);
        }

        std::string file = source.path;
        Claim copyClaim;
        if (source.tftp) {
            // The copy in the download directory is what is checked and
            // flashed, and nobody fetches over it before its flash has ended.
            file = text(ProviderUtil::tftpLocalPath(source.path.c_str()));
            if (!file.empty())
                copyClaim.take(copiesInUse(), file);
            if (ProviderUtil::TftpGetFile(source.server.c_str(), source.path.c_str()) != 0)
                throw Install_Error("tftp command failed");
        }
        if (!isFlashable(file)) {
            TVRN_LOG(LL_ERR, "File doesnt exist");
            throw Install_Error("File not exists");
        }
        if (UpdatePortControllerSoftware(pc, file.c_str()) != 0) {
            TVRN_LOG(LL_ERR, "UpdatePortControllerSoftware method failed");
            throw Install_Error("controller update failed");
        }
        TVRN_LOG(LL_DBG, "Software update is success");
        result = INSTALL_DONE;
    } catch (const Install_Error& e) {
        TVRN_LOG(LL_DBG, "InstallFromURI : ERROR - %s", e.what());
        result = e.result;
    } catch (...) {
        TVRN_LOG(LL_DBG, "InstallFromURI : ERROR - unknown Exception");
        result = INSTALL_FAILED;
    }
    TVRN_LOG(LL_DBG, "return value = %d\n", int(result));
    TVRN_LOG(LL_DBG, "Returning: %s", "InstallFromURI");
    return result;
}

}  // namespace CPTA
