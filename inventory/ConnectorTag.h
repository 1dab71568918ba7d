// The Tag of a physical connector: the optic's serial number, "_", the
// adapter number (from 1), "_", the port's position on the adapter (from 0),
// as in "UW1234_1_0". The inventory writes it; the associations that find a
// connector's adapter or port read it back with the same rule.
#ifndef CPTA_INVENTORY_CONNECTORTAG_H
#define CPTA_INVENTORY_CONNECTORTAG_H

#include "framework/String.h"

namespace CPTA {

String connectorTag(const String& serialNumber, unsigned adapterNumber, unsigned portPosition);

// The adapter number and port position of a tag; false for any other form.
// The serial number may itself hold "_", so the numbers are read from the end.
bool parseConnectorTag(const String& tag, unsigned& adapterNumber, unsigned& portPosition);

}  // namespace CPTA

#endif
