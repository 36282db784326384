#include "SwidFixture.h"

#include <unistd.h>

#include <cstdlib>
#include <ctime>
#include <fstream>

namespace swid {
namespace {

constexpr const char* kDefaultTimeZone = "UTC";

std::filesystem::path processRoot() {
    return std::filesystem::temp_directory_path() / ("orv-swid-root-" + std::to_string(::getpid()));
}

std::vector<NamedValue> identityProperties(const std::string& instanceId, const std::string& name,
                                           const std::string& buildNumber) {
    return {
        {"InstanceID", CMPI_string, instanceId},
        {"Name", CMPI_string, name},
        {"Caption", CMPI_string, name},
        {"Description", CMPI_string, name},
        {"ElementName", CMPI_string, instanceId},
        {"LargeBuildNumber", CMPI_uint64, buildNumber},
        {"VersionString", CMPI_string, "6.0.0 build-" + buildNumber},
        {"MinorVersion", CMPI_uint16, "0"},
        {"MajorVersion", CMPI_uint16, "6"},
        {"RevisionNumber", CMPI_uint16, "0"},
        {"Manufacturer", CMPI_string, "Orvane, Inc."},
        {"IsEntity", CMPI_boolean, "true"},
    };
}

}  // namespace

std::filesystem::path scratchFile(const std::string& name) {
    return std::filesystem::temp_directory_path() / (name + "-" + std::to_string(::getpid()));
}

Json versionSection(const VersionRecord& record) {
    return {{"product", record.product},           {"productVersion", record.productVersion},
            {"buildVersion", record.buildVersion}, {"buildDate", record.buildDate},
            {"buildTime", record.buildTime},       {"talmekBuild", record.talmekBuild}};
}

Json failingVersionSection() { return {{"failure", {{"code", 77}, {"errno", 16}, {"message", "Device busy"}}}}; }

Json hostWith(const Json& version, bool osIsTmk) {
    Json fixture = orv::providertest::SimHost::withHost({{"version", version}});
    fixture["host"]["osIsTmk"] = osIsTmk;
    fixture["host"]["uptimeSeconds"] = kUptimeSeconds;
    return fixture;
}

std::vector<NamedValue> primaryProperties() {
    std::vector<NamedValue> properties = identityProperties(kPrimaryId, "Orvane Zolti", "4192238");
    properties.insert(properties.begin(), {"ReleaseDate", CMPI_dateTime, "20160705000000.000000+000"});
    return properties;
}

std::vector<NamedValue> alternateProperties() {
    return identityProperties(kAlternateId, "Orvane Zolti Alternate Boot Bank", "4192238");
}

std::string textOf(const std::vector<NamedValue>& values, const std::string& name) {
    for (const NamedValue& value : values) {
        if (value.name == name) {
            return value.text;
        }
    }
    return "<absent>";
}

std::vector<NamedValue> withoutLastStartTime(const CMPIInstance* instance) {
    std::vector<NamedValue> properties = orv::providertest::propertiesOf(instance);
    std::erase_if(properties, [](const NamedValue& value) { return value.name == "LastStartTime"; });
    return properties;
}

std::optional<long long> lastStartSeconds(const CMPIInstance* instance) {
    const std::optional<NamedValue> value = orv::providertest::propertyOf(instance, "LastStartTime");
    if (!value) {
        return std::nullopt;
    }
    std::tm utc{};
    if (::strptime(value->text.c_str(), "%Y%m%d%H%M%S", &utc) == nullptr) {
        ADD_FAILURE() << "LastStartTime does not read as a date: " << value->text;
        return std::nullopt;
    }
    return static_cast<long long>(::timegm(&utc));
}

std::vector<std::string> instanceIdsOf(const orv::host::Reply& reply) {
    std::vector<std::string> ids;
    for (const CMPIObjectPath* path : reply.objectPaths()) {
        for (const NamedValue& key : orv::providertest::keysOf(path)) {
            if (key.name == "InstanceID") {
                ids.push_back(key.text);
            }
        }
    }
    for (const CMPIInstance* instance : reply.instances()) {
        const std::optional<NamedValue> id = orv::providertest::propertyOf(instance, "InstanceID");
        ids.push_back(id ? id->text : "<no InstanceID>");
    }
    return ids;
}

SwidTest::SwidTest() : root_(processRoot()) {
    std::filesystem::remove_all(root_);
    std::filesystem::create_directories(root_ / "altbootbank");
    ::setenv("ORV_ROOT", root_.c_str(), 1);
    setTimeZone(kDefaultTimeZone);
    provider_ = std::make_unique<orv::providertest::ProviderCore>();
}

SwidTest::~SwidTest() {
    provider_.reset();
    ::unsetenv("ORV_ROOT");
    std::error_code ignored;
    std::filesystem::remove_all(root_, ignored);
}

void SwidTest::writeBootCfg(const std::string& content) const {
    std::ofstream out(root_ / "altbootbank" / "boot.cfg", std::ios::binary | std::ios::trunc);
    out << content;
    ASSERT_TRUE(out.good());
}

void SwidTest::removeBootCfg() const { std::filesystem::remove(root_ / "altbootbank" / "boot.cfg"); }

void SwidTest::setTimeZone(const char* tz) {
    ::setenv("TZ", tz, 1);
    ::tzset();
}

void SwidTest::restartCore(const orv::providertest::ProviderCoreOptions& options) {
    provider_.reset();
    provider_ = std::make_unique<orv::providertest::ProviderCore>(options);
}

CMPIObjectPath* SwidTest::systemPath(const char* nameSpace) {
    return provider().path(kSystemClass,
                           {{"Name", orv::providertest::SimHost::kFqdn}, {"CreationClassName", kSystemClass}},
                           nameSpace);
}

CMPIObjectPath* SwidTest::softwarePath(const std::string& instanceId) {
    return provider().path(kSoftwareClass, {{"InstanceID", instanceId}});
}

}  // namespace swid
