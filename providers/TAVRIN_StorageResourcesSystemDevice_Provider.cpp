// The provider of TAVRIN_StorageResourcesSystemDevice: each host instance with
// every storage extent and then every tape drive (logical disks are not
// included).
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_StorageResourcesSystemDevice_Methods.h"

namespace CPTA {

namespace {

constexpr Pairing kHosted = TVRN_PAIRING
                                .fetch(CID_COMPUTER_SYSTEM)                            // 0
                                .fetch_discovered(CID_STORAGE_EXTENT, CID_TAPE_DRIVE)  // 1
                                .for_each(0)
                                .as("GroupComponent")
                                .with_every(1, "PartComponent");

constexpr Object_Scopes kScopes = Object_Scopes()
                                      .from(CID_STORAGE_EXTENT, Narrowing::WHOLE, Narrowing::OBJECT)
                                      .from(CID_TAPE_DRIVE, Narrowing::WHOLE, Narrowing::OBJECT);

}  // namespace

class TAVRIN_StorageResourcesSystemDevice_Provider
    : public Keyed_Pairing_Provider<TAVRIN_StorageResourcesSystemDevice, kHosted, kScopes>,
      public TAVRIN_StorageResourcesSystemDevice_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(StorageResourcesSystemDevice)
