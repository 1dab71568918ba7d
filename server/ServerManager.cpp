#include "server/ServerManager.h"

#include <cstdio>
#include <iterator>

#include "cmpi/cimom.h"
#include "framework/Log.h"
#include "gateway/ProviderUtil.h"
#include "inventory/FCHBAManager.h"
#include "inventory/InventoryCommon.h"
#include "schema/generated/CIM_ObjectManager.h"
#include "schema/generated/TAVRIN_AgentService.h"
#include "schema/generated/TAVRIN_CIMXMLCommunicationMechanism.h"
#include "schema/generated/TAVRIN_Namespace.h"
#include "schema/generated/TAVRIN_ObjectManager.h"
#include "schema/generated/TAVRIN_ProfileSoftwareIdentity.h"
#include "schema/generated/TAVRIN_RegisteredProfile.h"
#include "schema/generated/TAVRIN_RegisteredSubProfile.h"
#include "server/AccessPointHelper.h"

namespace CPTA {

namespace {

// Where the CIM server keeps its own object manager.
const char kServerNamespace[] = "root/PG_InterOp";
// The object manager's name, caption and description when the server names none.
const char kUnnamedServer[] = "CIM Server";
// The module's build version; its first three numbers are the version parts.
const char kModuleVersion[] = "3.2.1.0_beta_bld01";
const char kProviderTitle[] = "Tavrin Adapter CIM Provider";

// RegisteredOrganization
const uint16 kSNIA = 11;
const uint16 kDMTF = 2;
// AdvertiseTypes: SLP
const uint16 kAdvertisedBySLP = 3;

struct Profile_Row {
    const char* name;     // InstanceID and RegisteredName
    const char* caption;  // Caption and ElementName
    const char* description;
    uint16 organization;
    const char* version;
};

const Profile_Row kProfiles[] = {
    {"SMI-S", "SMI-S", "This instance models the SMI-S standard as such", kSNIA, "1.2.0"},
    {"FC HBA", "FC HBA Profile", "The FC HBA Profile models the HBA device", kSNIA, "1.2.0"},
    {"Server", "Server Profile", "The Server Profile models the CIM Server", kSNIA, "1.2.0"},
    {"Host Discovered Resources", "Host Discovered Resources Profile",
     "The HDR profile models the discovered storage resources", kSNIA, "1.2.0"},
    {"Storage HBA", "Storage HBA Profile",
     "The Storage HBA Profile models the manageable elements of an HBA", kSNIA, "1.3.0"},
};

const Profile_Row kSubProfiles[] = {
    {"FC Initiator Ports", "FC Initiator Ports subprofile",
     "The FC Initiator Ports subprofile models the ports present in the HBA device", kSNIA,
     "1.2.0"},
    {"Profile Registration", "Profile Registration Profile",
     "The Profile Registration Profile models the profiles registered in the object manager.",
     kSNIA, "1.0.0"},
    {"Access Points", "Access Points subprofile",
     "This models the management service(s) points available to the user.", kSNIA, "1.2.0"},
    {"Software Update", "Software Update profile",
     "This models the software installation service available to the user.", kDMTF, "1.0.0"},
    {"Software Inventory", "Software Inventory profile",
     "This models the softwares installed and available for installation on the system.", kDMTF,
     "1.0.0"},
    {"Physical Asset", "Physical Asset profile",
     "This models the physical aspects of the adapter hardware.", kDMTF, "1.0.2"},
    {"Ethernet Port", "Ethernet Port profile",
     "This models the ethernet characteristics of the port present in the adapter.", kDMTF,
     "1.0.0"},
    {"Diagnostics Profile", "Diagnostics Profile",
     "This models the diagnostic services available for the adapters and its ports.", kDMTF,
     "2.0.0"},
    {"Host LAN Network Port", "Host LAN Network Port Profile",
     "This models the network interfaces associated with the network ports", kDMTF, "1.0.0"},
    {"FCoE Initiator Ports", "FCoE Initiator Ports Profile",
     "This models the FCoE functionality of CNAs", kSNIA, "1.0.0"},
};

// The sub-profiles each profile requires, in order. A profile not listed
// requires none.
const struct {
    const char* profile;
    const char* subProfile;
} kRequirements[] = {
    {"FC HBA", "FC Initiator Ports"},   {"FC HBA", "Software Update"},
    {"FC HBA", "Software Inventory"},   {"FC HBA", "Access Points"},
    {"FC HBA", "Physical Asset"},       {"FC HBA", "Ethernet Port"},
    {"FC HBA", "Diagnostics Profile"},  {"FC HBA", "Host LAN Network Port"},
    {"Server", "Profile Registration"}, {"Storage HBA", "FCoE Initiator Ports"},
};

// ---- builders ---------------------------------------------------------------

template <class C>
void profiles(const Profile_Row* rows, size_t count, InstanceList& out) {
    for (size_t i = 0; i < count; i++) {
        C* profile = create<C>(true);
        out.add(profile);
        if (profile == nullptr)
            return;
        const Profile_Row& row = rows[i];
        profile->InstanceID.set(String(row.name));
        profile->RegisteredName.set(String(row.name));
        profile->Caption.set(String(row.caption));
        profile->ElementName.set(String(row.caption));
        profile->Description.set(String(row.description));
        profile->RegisteredOrganization.set(row.organization);
        profile->RegisteredVersion.set(String(row.version));
        profile->AdvertiseTypes.set(arrayOf<uint16>({kAdvertisedBySLP}));
    }
}

void getRegisteredProfileInstances(InstanceList& out) {
    profiles<TAVRIN_RegisteredProfile>(kProfiles, std::size(kProfiles), out);
}

void getRegisteredSubProfileInstances(InstanceList& out) {
    profiles<TAVRIN_RegisteredSubProfile>(kSubProfiles, std::size(kSubProfiles), out);
}

void getNamespaceInstances(InstanceList& out) {
    auto* ns = create<TAVRIN_Namespace>(true);
    out.add(ns);
    if (ns == nullptr)
        return;
    ns->SystemCreationClassName.set(String("TAVRIN_ComputerSystem"));
    ns->SystemName.set(HostIdentityScope::hostText());
    ns->ObjectManagerCreationClassName.set(String(TAVRIN_ObjectManager::static_meta_class.name));
    ns->ObjectManagerName = ObjectManagerScope::identity().name;
    ns->CreationClassName.set(String(TAVRIN_Namespace::static_meta_class.name));
    ns->Name.set(String(ProviderUtil::NAMESPACE));
    ns->ClassInfo.set(11);
    ns->ClassType.set(2);
    ns->ClassTypeVersion.set(String("2.26.0"));
}

void getObjectManagerInstance(InstanceList& out) {
    auto* om = create<TAVRIN_ObjectManager>(true);
    out.add(om);
    if (om == nullptr)
        return;
    const ObjectManagerIdentity identity = ObjectManagerScope::identity();
    setEndpointKeys(om, TAVRIN_ObjectManager::static_meta_class.name,
                    HostIdentityScope::hostText());
    om->Name = identity.name;
    om->Caption = identity.caption;
    om->Description = identity.description;
    om->ElementName.set(String(kUnnamedServer));
    om->OperationalStatus.set(arrayOf<uint16>({2}));
    om->Started.set(true);
}

void getCIMXMLCommunicationMechanismInstance(InstanceList& out) {
    auto* mech = create<TAVRIN_CIMXMLCommunicationMechanism>(true);
    out.add(mech);
    if (mech == nullptr)
        return;
    setEndpointKeys(mech, TAVRIN_CIMXMLCommunicationMechanism::static_meta_class.name,
                    HostIdentityScope::hostText());
    mech->Name.set(String("CIM-XML"));
    mech->ElementName.set(String("CIM-XML Communication Mechanism"));
    mech->CommunicationMechanism.set(2);
    mech->Version.set(String("1.2"));
    mech->CIMValidated.set(true);
    mech->MultipleOperationsSupported.set(true);
    mech->FunctionalProfilesSupported.set(arrayOf<uint16>({2, 3, 4, 5, 6, 8, 9}));
    mech->AuthenticationMechanismsSupported.set(arrayOf<uint16>({3}));
    mech->OperationalStatus.set(arrayOf<uint16>({2}));
}

void getProfileSoftwareIdentityInstances(InstanceList& out) {
    auto* software = create<TAVRIN_ProfileSoftwareIdentity>(true);
    out.add(software);
    if (software == nullptr)
        return;
    const String title(kProviderTitle);
    software->InstanceID.set(title);
    software->Caption.set(title);
    software->ElementName.set(title);
    software->Description.set(title);
    software->Name.set(String("TVRN Adapter CIM provider"));
    software->Manufacturer.set(String("TVRN"));
    software->VersionString.set(String(kModuleVersion));
    int major = 0, minor = 0, revision = 0;
    if (std::sscanf(kModuleVersion, "%d.%d.%d", &major, &minor, &revision) == 3) {
        software->MajorVersion.set(uint16(major));
        software->MinorVersion.set(uint16(minor));
        software->RevisionNumber.set(uint16(revision));
    }
    software->Classifications.set(arrayOf<uint16>({32775}));
    software->IdentityInfoType.set(stringsOf({"SoftwareID", "SoftwareStatus"}));
    software->IdentityInfoValue.set(stringsOf({kProviderTitle, "Primary"}));
}

void getAgentServiceInstances(InstanceList& out) {
    auto* service = create<TAVRIN_AgentService>(true);
    out.add(service);
    if (service != nullptr)
        service->Name.set(String("Tavrin Agent Service Provider"));
}

typedef void (*Builder)(InstanceList& out);

const struct {
    classId_t classId;
    Builder build;
} kRoutes[] = {
    {CID_REGISTERED_PROFILE, getRegisteredProfileInstances},
    {CID_REGISTERED_SUB_PROFILE, getRegisteredSubProfileInstances},
    {CID_NAMESPACE, getNamespaceInstances},
    {CID_OBJECT_MANAGER, getObjectManagerInstance},
    {CID_CIMXML_COMMUNICATION_MECHANISM, getCIMXMLCommunicationMechanismInstance},
    {CID_PROFILE_SOFTWARE_IDENTITY, getProfileSoftwareIdentityInstances},
    {CID_AGENT_SERVICE, getAgentServiceInstances},
};

Builder builderOf(classId_t classId) {
    for (const auto& route : kRoutes)
        if (route.classId == classId)
            return route.build;
    return nullptr;
}

// The instances of a class id this manager builds, as one request.
Array<Instance*> build(Builder builder) {
    ObjectManagerScope request;
    return runWalk("ServerManager::getInstances", [&](InstanceList& out) {
        if (builder != nullptr)
            builder(out);
    });
}

// ---- the dispatcher's routes --------------------------------------------------

// FCHBAManager answers for these classes too (its own request log, no driver
// gate), so association providers find them where they find the host.
Array<Instance*> profileRoute(classId_t classId) {
    return build(builderOf(classId));
}

Array<Instance*> accessPointRoute(classId_t classId) {
    return AccessPointHelper::getAccessPointHelperInstance()->getInstancesByClass(classId);
}

struct RoutesFilledAtLoad {
    RoutesFilledAtLoad() {
        FCHBAManager::fillRoute(CID_REGISTERED_PROFILE, profileRoute);
        FCHBAManager::fillRoute(CID_REMOTE_SERVICE_ACCESS_POINT, accessPointRoute);
        FCHBAManager::fillRoute(CID_AGENT_SERVICE, profileRoute);
    }
} routesFilledAtLoad;

// ---- the object manager's identity ----------------------------------------

// Plain data, so that nothing is left to destroy when a thread ends.
struct ThreadIdentity {
    unsigned depth = 0;
    ObjectManagerIdentity* known = nullptr;
};

thread_local ThreadIdentity tIdentity;

ObjectManagerIdentity askServer() {
    TVRN_LOG(LL_DBG, "Asking the CIM server for its object manager in %s", kServerNamespace);
    ObjectManagerIdentity identity;
    Ref<CIM_ObjectManager> model(create<CIM_ObjectManager>(false));
    Instance_Enumerator found;
    if (model && cimom::enum_instances(kServerNamespace, model.ptr(), found) == 0 && found) {
        Ref<CIM_ObjectManager> first(static_cast<CIM_ObjectManager*>(found()));
        identity.name = first->Name;
        identity.caption = first->ElementName;
        identity.description = first->Description;
    }
    if (identity.name.null) {
        TVRN_LOG(LL_INFO, "No object manager found in %s; it is named \"%s\"", kServerNamespace,
                 kUnnamedServer);
        const String unnamed(kUnnamedServer);
        identity.name.set(unnamed);
        identity.caption.set(unnamed);
        identity.description.set(unnamed);
    }
    return identity;
}

}  // namespace

// ---- ServerManager ------------------------------------------------------------

ServerManager::ServerManager() {
    TVRN_LOG(LL_DBG, "Inside ServerManager Constructor");
    TVRN_LOG(LL_DBG, "Loading HBA API Library");
}

ServerManager* ServerManager::getServerManager() {
    static ServerManager gServerManagerObj;
    return &gServerManagerObj;
}

Array<Instance*> ServerManager::getInstances(classId_t classId) {
    TVRN_LOG(LL_INFO, "Requested classId : %d", int(classId));
    TVRN_LOG(LL_INFO, "Requested class is: %s", ProviderUtil::getClassName(classId).c_str());
    Builder builder = builderOf(classId);
    if (builder == nullptr) {
        TVRN_LOG(LL_INFO, "Requested class is NOT supported.");
        return Array<Instance*>();
    }
    return build(builder);
}

Array<String> ServerManager::getSubProfilesOfProfile(const String& profile) {
    Array<String> subProfiles;
    for (const auto& requirement : kRequirements)
        if (profile.equali(requirement.profile))
            subProfiles.append(String(requirement.subProfile));
    return subProfiles;
}

// ---- ObjectManagerScope ----------------------------------------------------------

ObjectManagerScope::ObjectManagerScope() noexcept {
    tIdentity.depth++;
}

ObjectManagerScope::~ObjectManagerScope() {
    if (--tIdentity.depth == 0) {
        delete tIdentity.known;
        tIdentity.known = nullptr;
    }
}

ObjectManagerIdentity ObjectManagerScope::identity() {
    if (tIdentity.depth == 0)
        return askServer();
    if (tIdentity.known == nullptr)
        tIdentity.known = new ObjectManagerIdentity(askServer());
    return *tIdentity.known;
}

}  // namespace CPTA
