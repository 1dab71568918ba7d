// The host itself: the one TAVRIN_ComputerSystem instance, built from the
// host's name services alone (no adapter library call).
#ifndef CPTA_INVENTORY_COMMONHELPER_H
#define CPTA_INVENTORY_COMMONHELPER_H

#include "framework/Array.h"
#include "framework/Instance.h"
#include "gateway/ClassId.h"

namespace CPTA {

class CommonHelper {
public:
    static CommonHelper* getCommonHelperObject();

    // Exactly one new TAVRIN_ComputerSystem (none only when memory runs out).
    Array<Instance*> getComputerSystemInstances(classId_t classId);

private:
    CommonHelper() = default;
};

}  // namespace CPTA

#endif
