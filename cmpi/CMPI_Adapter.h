// The CMPI face of one provider: its static block of MI function tables, and
// the adapter object that the first MI request creates and that turns every
// CMPI request into provider operations.
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

class CMPI_Adapter : public Provider_Handle {
public:
    // Creates and loads the provider (within a thread context of this call)
    // and fills the static data.
    CMPI_Adapter(const CMPIBroker* broker, const CMPIContext* context, const char* provider_name,
                 const Registration* registration, CMPI_Static_Data* static_data);
    // Marks the static data dead and destroys the provider.
    ~CMPI_Adapter() override;

    const CMPIBroker* broker() const { return _broker; }
    const Meta_Class* meta_class() const { return _meta_class; }
    Mutex& mutex() { return _mutex; }

    void allow_unload(bool flag) { _unload_allowed = flag; }
    bool unload_allowed() const { return _unload_allowed; }

    // The adapter behind an MI handle, or null when the provider is gone.
    static CMPI_Adapter* from_handle(void* hdl);

    // Shared by the four cleanup entries.
    static CMPIStatus cleanup(CMPI_Adapter* adapter, const CMPIContext* context, bool terminating);

    // The entries of the four MI function tables.
    static CMPIStatus instanceCleanup(CMPIInstanceMI* mi, const CMPIContext* context,
                                      CMPIBoolean terminating);
    static CMPIStatus enumInstanceNames(CMPIInstanceMI* mi, const CMPIContext* context,
                                        const CMPIResult* result, const CMPIObjectPath* op);
    static CMPIStatus enumInstances(CMPIInstanceMI* mi, const CMPIContext* context,
                                    const CMPIResult* result, const CMPIObjectPath* op,
                                    const char** properties);
    static CMPIStatus getInstance(CMPIInstanceMI* mi, const CMPIContext* context,
                                  const CMPIResult* result, const CMPIObjectPath* op,
                                  const char** properties);
    static CMPIStatus createInstance(CMPIInstanceMI* mi, const CMPIContext* context,
                                     const CMPIResult* result, const CMPIObjectPath* op,
                                     const CMPIInstance* instance);
    static CMPIStatus modifyInstance(CMPIInstanceMI* mi, const CMPIContext* context,
                                     const CMPIResult* result, const CMPIObjectPath* op,
                                     const CMPIInstance* instance, const char** properties);
    static CMPIStatus deleteInstance(CMPIInstanceMI* mi, const CMPIContext* context,
                                     const CMPIResult* result, const CMPIObjectPath* op);
    static CMPIStatus execQuery(CMPIInstanceMI* mi, const CMPIContext* context,
                                const CMPIResult* result, const CMPIObjectPath* op,
                                const char* query, const char* lang);

    static CMPIStatus methodCleanup(CMPIMethodMI* mi, const CMPIContext* context,
                                    CMPIBoolean terminating);
    static CMPIStatus invokeMethod(CMPIMethodMI* mi, const CMPIContext* context,
                                   const CMPIResult* result, const CMPIObjectPath* op,
                                   const char* method, const CMPIArgs* in, CMPIArgs* out);

    static CMPIStatus indicationCleanup(CMPIIndicationMI* mi, const CMPIContext* context,
                                        CMPIBoolean terminating);
    static CMPIStatus authorizeFilter(CMPIIndicationMI* mi, const CMPIContext* context,
                                      const CMPISelectExp* filter, const char* class_name,
                                      const CMPIObjectPath* op, const char* owner);
    static CMPIStatus mustPoll(CMPIIndicationMI* mi, const CMPIContext* context,
                               const CMPISelectExp* filter, const char* class_name,
                               const CMPIObjectPath* class_path);
    static CMPIStatus activateFilter(CMPIIndicationMI* mi, const CMPIContext* context,
                                     const CMPISelectExp* filter, const char* class_name,
                                     const CMPIObjectPath* class_path,
                                     CMPIBoolean first_activation);
    static CMPIStatus deactivateFilter(CMPIIndicationMI* mi, const CMPIContext* context,
                                       const CMPISelectExp* filter, const char* class_name,
                                       const CMPIObjectPath* class_path,
                                       CMPIBoolean last_activation);
    static CMPIStatus enableIndications(CMPIIndicationMI* mi, const CMPIContext* context);
    static CMPIStatus disableIndications(CMPIIndicationMI* mi, const CMPIContext* context);

    static CMPIStatus associationCleanup(CMPIAssociationMI* mi, const CMPIContext* context,
                                         CMPIBoolean terminating);
    static CMPIStatus associators(CMPIAssociationMI* mi, const CMPIContext* context,
                                  const CMPIResult* result, const CMPIObjectPath* op,
                                  const char* assoc_class, const char* result_class,
                                  const char* role, const char* result_role,
                                  const char** properties);
    static CMPIStatus associatorNames(CMPIAssociationMI* mi, const CMPIContext* context,
                                      const CMPIResult* result, const CMPIObjectPath* op,
                                      const char* assoc_class, const char* result_class,
                                      const char* role, const char* result_role);
    static CMPIStatus references(CMPIAssociationMI* mi, const CMPIContext* context,
                                 const CMPIResult* result, const CMPIObjectPath* op,
                                 const char* result_class, const char* role,
                                 const char** properties);
    static CMPIStatus referenceNames(CMPIAssociationMI* mi, const CMPIContext* context,
                                     const CMPIResult* result, const CMPIObjectPath* op,
                                     const char* result_class, const char* role);

    // Hands an indication of the provider to the server in every name space
    // with an active filter (the callback given to enable_indications).
    static bool _indication_proc(Instance* indication, void* client_data);

private:
    friend int cimple_cmpi_adapter(CMPI_Static_Data*, const Registration*, const CMPIBroker*,
                                   const CMPIContext*, const char*, char, void**);

    void _fill_static_data(const char* provider_name);

    const CMPIBroker* _broker;
    CMPI_Static_Data* _static_data;
    uint32 _mi_count;
    std::atomic<bool> _unload_allowed;
    Array<Name_Space_Entry> _name_spaces;
    const Meta_Class* _meta_class;
    bool _indications_enabled;
    // Set while the provider's disable_indications runs, so that a delivery
    // waiting for the mutex gives up instead of blocking the provider, which
    // may be waiting for the delivering thread.
    std::atomic<bool> _disabling;
    Mutex _mutex;
};

// Creates the provider's adapter on the first call (else counts one more MI)
// and stores the MI record of the kind ('I' instance, 'M' method, 'A'
// association, 'N' indication) in *mi. 0, or -1 with *mi null.
int cimple_cmpi_adapter(CMPI_Static_Data* static_data, const Registration* registration,
                        const CMPIBroker* broker, const CMPIContext* context,
                        const char* provider_name, char kind, void** mi);

// What the exported MI factories do: the MI record of the kind, or null
// with *rc set to CMPI_RC_ERR_FAILED and a message. Never throws.
void* __create_mi(CMPI_Static_Data* static_data, const Registration* registration,
                  const CMPIBroker* broker, const CMPIContext* context, const char* provider_name,
                  char kind, CMPIStatus* rc);

// The name of a CMPI return code, for the log.
const char* _rc_to_str(int rc);

}  // namespace CPTA

#endif
