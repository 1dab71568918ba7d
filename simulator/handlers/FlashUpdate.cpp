// Simulated entry points: flash update.
#include "simulator/handlers/Requests.h"

#include <cerrno>
#include <cstring>
#include <fstream>
#include <memory>

namespace tvrnsim {

namespace {

Json::Value adapterUpdateFlash(Call& c) {
    const std::string k = key(c.req, "indexStr", Form::Any);
    Json::Value& ad = c.st.model.adapter(adapterExact(c, k));
    const std::string file = text(c.req, "file");
    Json::Value r(Json::objectValue);
    std::ifstream in(file, std::ios::binary);
    if (!in) {
        r["status"] = 2;
        r["message"] = "cannot open " + file + ": " + std::strerror(errno);
        return r;
    }
    std::string content(64 * 1024, '\0');
    in.read(&content[0], static_cast<std::streamsize>(content.size()));
    content.resize(static_cast<size_t>(in.gcount()));

    // A JSON image names its version (and may ask for a failure); any other
    // file is named after the version it carries: fw-3.2.7.bin flashes fw-3.2.7.
    Json::Value image;
    Json::CharReaderBuilder builder;
    std::unique_ptr<Json::CharReader> reader(builder.newCharReader());
    std::string version, bios;
    int status = 0;
    std::string message = "Flash update successful";
    if (reader->parse(content.data(), content.data() + content.size(), &image, nullptr) &&
        image.isObject()) {
        version = image.get("version", "").asString();
        bios = image.get("biosVersion", "").asString();
        status = image.get("status", 0).asInt();
        message = image.get("message", status == 0 ? message : "flash update failed").asString();
    } else {
        std::string base = file.substr(
            file.find_last_of('/') == std::string::npos ? 0 : file.find_last_of('/') + 1);
        version = base.substr(0, base.find_last_of('.'));
    }
    if (status == 0 && version.empty()) {
        status = 3;
        message = "no firmware version in " + file;
    }
    r["status"] = status;
    r["message"] = message;
    if (status != 0)
        return r;
    ad["firmware"]["version"] = version;
    if (!bios.empty())
        ad["firmware"]["biosVersion"] = bios;
    ad["flash"]["flashStatus"] = true;
    r["firmwareVersion"] = version;
    c.log(2, __FILE__, __LINE__,
          "adapter " + k + " flashed with firmware " + version + " from " + file);
    return r;
}

const HandlerRow kRows[] = {
    {EP_adapterUpdateFlash, adapterUpdateFlash},
};

}  // namespace

Handler flashUpdateHandler(EntryId id) {
    return findHandler(kRows, id);
}

}  // namespace tvrnsim
