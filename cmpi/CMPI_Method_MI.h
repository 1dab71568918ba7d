// The method MI of a provider: the entries of its function table.
#ifndef CPTA_CMPI_CMPI_METHOD_MI_H
#define CPTA_CMPI_CMPI_METHOD_MI_H

#include <cmpift.h>

namespace CPTA {

// Sets every entry of the table but cleanup (cmpi/CMPI_MI_Factory.h).
void set_method_entries(CMPIMethodMIFT& ft);

}  // namespace CPTA

#endif
