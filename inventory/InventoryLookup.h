// Key-addressed get for the inventory classes.
//
// A client that gets one object names it by its keys. For most inventory
// classes those keys name the adapter, port, remote port or Ethernet port
// behind the instance, so it can be built by asking the library about that
// object alone, with the same code as the walk of the class. lookupInventory
// does that: it reads the keys, answers what it can without the library (a
// key that is not a WWN or MAC, another host's SystemName, an unusable
// driver), narrows the class's walk to the object the keys name and hands
// back what the narrowed walk built. The caller keeps the instance whose keys
// equal the ones asked for, so the answer is the one that enumerating the
// class and comparing keys gives.
//
// The physical connector is named by its adapter's number and its port's
// position; a driver's software identity by the driver, which the walk
// reports from the first adapter that has it, so its look-up visits the
// adapters in order until then. Classes whose keys name no single library
// object are not looked up, and the caller enumerates: the physical package
// and the product (named by the UUID or serial number the adapter reports),
// the logical port group (by node WWN, a member of each port's record), the
// LAN endpoint (by interface name, likewise), the host itself (it needs no
// library), and every class that the inventory does not build.
#ifndef CPTA_INVENTORY_INVENTORYLOOKUP_H
#define CPTA_INVENTORY_INVENTORYLOOKUP_H

#include "framework/Array.h"
#include "framework/Instance.h"
#include "gateway/ClassId.h"

namespace CPTA {

// False when the instance of `classId` named by `keys` cannot be looked up
// by its keys. Otherwise true, with `found` holding the instances built for
// the object the keys name (none when they name nothing); the caller owns
// them. Never throws.
bool lookupInventory(classId_t classId, const Instance* keys, Array<Instance*>& found);

}  // namespace CPTA

#endif
