#include "HwHealthFixture.h"

#include <cmpift.h>

namespace hwhealth_test {

Json element(const std::string& watchedClass, const std::string& className, const Json& keys,
             std::optional<int> healthState) {
    Json out = {{"watchedClass", watchedClass}, {"class", className}, {"keys", keys}};
    if (healthState) {
        out["healthState"] = *healthState;
    }
    return out;
}

void HwHealthTest::serve(const std::vector<Json>& elements, const Json& sections, const Json& faults) {
    Json all = sections;
    Json health = Json::array();
    for (const Json& item : elements) {
        health.push_back(item);
    }
    all["health"] = health;
    all["faults"] = faults;
    host_.write(orv::providertest::SimHost::withHost(all));
}

orv::providertest::ProviderCore& HwHealthTest::provider() {
    if (!provider_) {
        const std::filesystem::path source = orv::providertest::ProviderCore::sourceDir();
        orv::providertest::ProviderCoreOptions options;
        options.registrations = {source / "companion/mof/orvhwhealth.reg"};
        options.mofs = {source / "companion/mof/orvhwhealth.mof",
                        source / "tests/providers/latchedhealth/data/numberedsensor.mof"};
        provider_ = std::make_unique<orv::providertest::ProviderCore>(options);
    }
    return *provider_;
}

std::string pathText(const CMPIObjectPath* path) {
    std::string text = orv::providertest::nameSpaceOf(path) + ":" + orv::providertest::classNameOf(path);
    const char* separator = ".";
    for (const NamedValue& key : orv::providertest::keysOf(path)) {
        text += separator + key.name + "=" + key.text;
        separator = ",";
    }
    return text;
}

std::vector<std::string> HwHealthTest::pathsOf(const orv::host::Reply& reply) {
    std::vector<std::string> out;
    for (const CMPIObjectPath* path : reply.objectPaths()) {
        out.push_back(pathText(path));
    }
    return out;
}

std::vector<std::string> HwHealthTest::instancePathsOf(const orv::host::Reply& reply) {
    std::vector<std::string> out;
    for (const CMPIInstance* instance : reply.instances()) {
        CMPIObjectPath* path = instance->ft->getObjectPath(instance, nullptr);
        out.push_back(pathText(path));
        path->ft->release(path);
    }
    return out;
}

}  // namespace hwhealth_test
