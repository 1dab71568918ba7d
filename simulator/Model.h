// The simulated host: adapters, their FC and Ethernet ports, remote ports,
// LUNs and virtual ports, held as the JSON the fixture describes (after
// validation and filling of defaults) plus look-up tables by key.
#ifndef TVRN_SIMULATOR_MODEL_H
#define TVRN_SIMULATOR_MODEL_H

#include <json/json.h>

#include <stdexcept>
#include <string>
#include <unordered_map>

namespace tvrnsim {

// A fixture that cannot be used; the text names the place and the reason.
struct FixtureError : std::runtime_error {
    using std::runtime_error::runtime_error;
};

std::string lowerCase(std::string s);
// Pairs of hexadecimal digits separated by colons: 8 pairs for a WWN, 6 for a MAC.
bool isColonKey(const std::string& s, int pairs);
inline bool isWwn(const std::string& s) {
    return isColonKey(s, 8);
}
inline bool isMac(const std::string& s) {
    return isColonKey(s, 6);
}

struct FcPortRef {
    int a = -1;
    int p = -1;
};
struct EthPortRef {
    int a = -1;
    int e = -1;
};
struct VPortRef {
    int a = -1;
    int p = -1;
    int v = -1;
};

class Model {
public:
    // Replaces the host with the one described by the fixture. Throws
    // FixtureError and leaves the previous host in place when it is unusable.
    void load(const Json::Value& fixture);
    // A host without adapters.
    void clear();

    const Json::Value& root() const { return root_; }
    Json::Value& host() { return root_["host"]; }
    Json::Value& adapters() { return root_["adapters"]; }
    Json::Value& adapter(int a) { return root_["adapters"][Json::ArrayIndex(a)]; }
    Json::Value& fcPort(int a, int p) { return adapter(a)["fcPorts"][Json::ArrayIndex(p)]; }
    Json::Value& ethPort(int a, int e) { return adapter(a)["ethPorts"][Json::ArrayIndex(e)]; }
    Json::Value& vport(const VPortRef& r) {
        return fcPort(r.a, r.p)["vports"][Json::ArrayIndex(r.v)];
    }

    int adapterCount() const { return static_cast<int>(root_["adapters"].size()); }
    // The index string of an adapter: its MAC for a CNA, else its WWN.
    std::string adapterKey(int a) const;

    // Look-ups by key (any case, colon format). -1 / false when unknown.
    int findAdapter(const std::string& key) const;
    // The adapter with this key, or the one owning a port or virtual port with it.
    int findOwner(const std::string& key) const;
    bool findFcPort(const std::string& key, FcPortRef& out) const;  // port WWN or FCoE MAC
    bool findEthPort(const std::string& key, EthPortRef& out) const;
    bool findVPort(const std::string& key, VPortRef& out) const;
    // True when some adapter, port, virtual port or remote port uses this WWN.
    bool wwnInUse(const std::string& key) const;

    // Rebuilds the look-up tables after ports or virtual ports changed.
    void reindex();

private:
    Json::Value root_{Json::objectValue};
    std::unordered_map<std::string, int> adapters_;
    std::unordered_map<std::string, FcPortRef> fcPorts_;
    std::unordered_map<std::string, FcPortRef> fcoeMacs_;
    std::unordered_map<std::string, EthPortRef> ethPorts_;
    std::unordered_map<std::string, VPortRef> vports_;
};

// Adapters described by generation parameters (see README.md).
Json::Value generateAdapters(const Json::Value& params);

}  // namespace tvrnsim

#endif
