// The CMPI face of one provider: its static block of MI function tables, and
// the adapter object that the first MI creation makes.
#ifndef CPTA_CMPI_CMPI_ADAPTER_H
#define CPTA_CMPI_CMPI_ADAPTER_H

#include <cmpidt.h>
#include <cmpift.h>

#include <atomic>

#include "cmpi/Provider_Handle.h"
#include "framework/Array.h"
#include "framework/Mutex.h"

namespace CPTA {

class CMPI_Adapter;

const uint32 CMPI_STATIC_DATA_MAGIC = 0x5DE2B131;
const uint32 CMPI_STATIC_DATA_DEAD = 0xDDDDDDDD;
const size_t CMPI_MI_NAME_SIZE = 256;

// One block per provider, shared by its MIs; all zero until the first MI is
// created. Each MI record's handle points back at the block.
struct CMPI_Static_Data {
    uint32 magic;
    CMPI_Adapter* adapter;

    CMPIInstanceMIFT instance_ft;
    CMPIInstanceMI instance_mi;
    CMPIMethodMIFT method_ft;
    CMPIMethodMI method_mi;
    CMPIIndicationMIFT indication_ft;
    CMPIIndicationMI indication_mi;
    CMPIAssociationMIFT association_ft;
    CMPIAssociationMI association_mi;

    char instance_mi_name[CMPI_MI_NAME_SIZE];
    char method_mi_name[CMPI_MI_NAME_SIZE];
    char indication_mi_name[CMPI_MI_NAME_SIZE];
    char association_mi_name[CMPI_MI_NAME_SIZE];
};

// A name space with active indication filters and their number.
struct Name_Space_Entry {
    String name_space;
    uint32 count;
};

inline bool operator==(const Name_Space_Entry& a, const Name_Space_Entry& b) {
    return a.name_space == b.name_space;
}

// What the indication entries keep per provider, under the adapter's mutex
// (but for `disabling`, which a delivery reads without it).
struct Indication_State {
    // The name spaces with active filters.
    Array<Name_Space_Entry> name_spaces;
    bool enabled = false;
    // Set while the provider's disable_indications runs, so that a delivery
    // waiting for the mutex gives up instead of blocking the provider, which
    // may be waiting for the delivering thread.
    std::atomic<bool> disabling{false};
};

// The adapter of one provider: the provider object behind its MIs, the
// number of MIs the server holds, and the mutex that serialises the
// provider's requests. Created with the first MI and destroyed with the
// last (cmpi/CMPI_MI_Factory.h); the MI entries reach it through the handle
// of their MI (from_handle).
class CMPI_Adapter : public Provider_Handle {
public:
    // Creates the provider object and binds the adapter to its static data.
    // The provider is not loaded yet.
    CMPI_Adapter(const CMPIBroker* broker, const Registration* registration,
                 CMPI_Static_Data* static_data);
    // Marks the static data dead and destroys the provider.
    ~CMPI_Adapter() override;

    const CMPIBroker* broker() const { return _broker; }
    const Meta_Class* meta_class() const { return _meta_class; }
    Mutex& mutex() { return _mutex; }

    void allow_unload(bool flag) { _unload_allowed = flag; }
    bool unload_allowed() const { return _unload_allowed; }

    // The MIs of the provider that the server holds (1 at creation).
    uint32 mi_count() const { return _mi_count; }
    void add_mi() { _mi_count++; }
    void drop_mi() { _mi_count--; }

    Indication_State& indications() { return _indications; }

    // The adapter behind an MI handle, or null when the provider is gone.
    static CMPI_Adapter* from_handle(void* hdl);

private:
    const CMPIBroker* _broker;
    CMPI_Static_Data* _static_data;
    uint32 _mi_count;
    std::atomic<bool> _unload_allowed;
    const Meta_Class* _meta_class;
    Indication_State _indications;
    Mutex _mutex;
};

}  // namespace CPTA

#endif
