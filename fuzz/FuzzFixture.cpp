#include "fuzz/FuzzFixture.h"

#include <memory>

#include <json/json.h>

namespace tvrnfuzz {

std::string quickFixture(const uint8_t* data, size_t size) {
    const char* begin = reinterpret_cast<const char*>(data);
    const std::string text(begin, size);
    Json::Value fixture;
    Json::CharReaderBuilder builder;
    std::unique_ptr<Json::CharReader> reader(builder.newCharReader());
    std::string errors;
    if (!reader->parse(begin, begin + size, &fixture, &errors) || !fixture.isObject())
        return text;
    Json::Value& generate = fixture["generate"];
    if (generate.isObject())
        for (const std::string& name : generate.getMemberNames())
            if (generate[name].isUInt() && generate[name].asUInt() > 4)
                generate[name] = 4;
    if (generate.isNull())
        fixture.removeMember("generate");
    Json::Value& faults = fixture["faults"];
    if (faults.isArray()) {
        Json::Value kept(Json::arrayValue);
        for (const Json::Value& fault : faults)
            if (!fault.isObject() || !(fault["kind"] == "delay"))
                kept.append(fault);
        faults = kept;
    } else if (faults.isNull()) {
        fixture.removeMember("faults");
    }
    fixture.removeMember("diagnosticDurationMs");
    Json::StreamWriterBuilder writer;
    writer["indentation"] = "";
    return Json::writeString(writer, fixture);
}

}  // namespace tvrnfuzz
