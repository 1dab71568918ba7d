// Firmware update: the software installation service and its capabilities,
// and the installation of an adapter's firmware from a "file://" or
// "tftp://" URI.
//
// An install runs on the caller's thread until the flash has ended (no job is
// created). A "tftp://" image is fetched with ProviderUtil::TftpGetFile into
// the download directory, and that copy is what is checked and flashed. Two
// installs never work on one adapter at once: while one runs, another for the
// same adapter is refused with INSTALL_TARGET_IN_USE. Installs that fetch the
// same file name take turns, each keeping its copy until its flash has ended.
//
// The port controllers an install looks for its target among come from the
// caller (a provider asks the dispatcher), so this layer never calls back into
// the dispatcher that routes the service's class ids here.
#ifndef CPTA_UPDATE_SOFTWAREUPDATEHELPER_H
#define CPTA_UPDATE_SOFTWAREUPDATEHELPER_H

#include "framework/Array.h"
#include "framework/Instance.h"
#include "framework/Property.h"
#include "framework/String.h"
#include "gateway/ClassId.h"
#include "inventory/InventoryRecords.h"
#include "schema/generated/TAVRIN_PortController.h"

namespace CPTA {

// Return values of InstallFromURI.
enum Install_Result : uint32 {
    INSTALL_DONE = 0,
    INSTALL_FAILED = 2,
    INSTALL_TARGET_IN_USE = 6  // another install of the same adapter is running
};

// Install options a client may ask for (the first element of InstallOptions).
enum Install_Option : uint16 { INSTALL_OPTION_INSTALL = 4, INSTALL_OPTION_UPDATE = 5 };

class SoftwareUpdateHelper {
public:
    static SoftwareUpdateHelper* getSoftwareUpdateHelperInstance();

    // The service (class id 18) or its capabilities (19); empty for any
    // other class. `host` carries only the host name.
    Array<Instance*> getInstancesByClass(const _adapterData& host, classId_t classId);
    Instance* getHBASoftwareInstallationServiceInstance(const _adapterData& host);
    Instance* getHBASoftwareInstallationServiceCapabilitiesInstance(const _adapterData& host);

    // Hands `file` to the library's flash update of the port controller's
    // adapter: the library's status (0 done), or -1 when it gave no usable
    // answer.
    int UpdatePortControllerSoftware(const TAVRIN_PortController* pc, const char* file);

    // All instances of a class id, as the dispatcher answers; the caller
    // owns them.
    typedef Array<Instance*> (*Controller_Source)(classId_t classId);

    // InstallFromURI: checks the arguments, fetches a "tftp://" image, finds
    // the target among the port controllers of `controllers` and flashes.
    // Returns an Install_Result; never throws.
    uint32 installFromURI(const Property<String>& uri, const Instance* target,
                          const Property<Array<uint16>>& options,
                          Controller_Source controllers) noexcept;

private:
    SoftwareUpdateHelper() = default;
};

}  // namespace CPTA

#endif
