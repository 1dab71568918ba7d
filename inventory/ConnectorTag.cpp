#include "inventory/ConnectorTag.h"

#include <cstdio>
#include <cstdlib>
#include <string>

namespace CPTA {

namespace {

// The decimal number that ends text[0..end), and where it begins; false when
// there is none.
bool numberBefore(const char* text, size_t end, unsigned& value, size_t& begin) {
    begin = end;
    while (begin > 0 && text[begin - 1] >= '0' && text[begin - 1] <= '9')
        begin--;
    if (begin == end || end - begin > 9)
        return false;
    value = unsigned(strtoul(std::string(text + begin, end - begin).c_str(), nullptr, 10));
    return true;
}

}  // namespace

String connectorTag(const String& serialNumber, unsigned adapterNumber, unsigned portPosition) {
    char numbers[32];
    snprintf(numbers, sizeof(numbers), "_%u_%u", adapterNumber, portPosition);
    String tag = serialNumber;
    tag.append(numbers);
    return tag;
}

bool parseConnectorTag(const String& tag, unsigned& adapterNumber, unsigned& portPosition) {
    const char* text = tag.c_str();
    size_t begin = 0;
    if (!numberBefore(text, tag.size(), portPosition, begin) || begin == 0 ||
        text[begin - 1] != '_')
        return false;
    if (!numberBefore(text, begin - 1, adapterNumber, begin) || begin == 0 ||
        text[begin - 1] != '_')
        return false;
    return true;
}

}  // namespace CPTA
