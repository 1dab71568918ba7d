// MOF text of values and instances, the form in which tvrncli prints what
// providers return:
//
//   instance of TAVRIN_FCPort {
//       DeviceID = "10000000C9A1B2C3";
//       OperationalStatus = {2};
//       Speed = 8000000000;
//   };
//
// Unlike the host's own text form (host/value.h) this carries no types and
// keeps the properties in the order in which the instance holds them.
#ifndef TVRN_HOST_MOF_H
#define TVRN_HOST_MOF_H

#include <string>
#include <string_view>

#include "host/value.h"

namespace tvrnhost {

// A MOF string literal: quoted, with \" \\ \n ... escapes and \xHHHH for other
// control characters.
std::string mofString(std::string_view s);

// A value as a MOF literal: 5, -1, 2.5, true, 'c', "text"; date-times and
// references (object paths) as quoted text; arrays as {a, b}; NULL. An
// embedded instance is its MOF text on one line, quoted.
std::string mofValue(const Value& v);

// "instance of <Class> {", one "    <Name> = <value>;" line per non-null
// property, "};" (every line ends in a newline).
std::string mofInstance(const Instance& inst);

}  // namespace tvrnhost

#endif
