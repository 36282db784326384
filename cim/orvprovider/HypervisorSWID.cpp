// The hypervisor's software identity: one "Orvane_HypervisorSoftwareIdentity"
// instance for the running image and, when the alternate boot bank holds an
// image, one for that image.
//
// Every request reads the running system's version record from the platform's
// version service and the alternate bank's from its boot.cfg afresh, under the
// provider's lock, and builds the instances from those two records.
#include <sys/sysinfo.h>
#include <syslog.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <memory>
#include <string>
#include <vector>

#include <cmpi/CmpiDateTime.h>
#include <cmpi/CmpiInstanceMI.h>
#include <ksi/HostType.h>
#include <omc/Mutex.h>
#include <orv/platform/HostInfo.h>
#include <orv/platform/Paths.h>
#include <tmkuser/Version.h>

#include "HypervisorSWID-Version.h"

namespace {

using VersionRecord = TmkuserVersion_SystemVersionInfo;

constexpr const char* kServedClass = "Orvane_HypervisorSoftwareIdentity";
constexpr const char* kBootConfig = "/altbootbank/boot.cfg";
constexpr const char* kManufacturer = "Orvane, Inc.";
constexpr CMPIUint64 kMicrosecondsPerSecond = 1000000;

// What the running image is called when the version service cannot tell.
constexpr const char* kOtherProduct = "Orvane Zolt";
constexpr const char* kFallbackVersion = "6.0.0";
// Read as a base-10 number this text gives 0, the fallback build number.
constexpr const char* kFallbackBuildText = "build-4192238";
constexpr std::size_t kStatusTextSize = 1024;

constexpr const char* kEnumInstancesRefusal =
    "ERR: Orvane_HypervisorSoftwareIdentityProvider::enumInstances::Throwing not supported error!!!!!";

// Keys stay in an instance whatever the property list asks.
const char* kKeyNames[] = {"InstanceID", nullptr};

void copyText(char (&field)[32], const char* text) {
    std::strncpy(field, text, sizeof field - 1);
    field[sizeof field - 1] = '\0';
}

// Values of the running image's record when the version service failed; the
// fields not named here keep what the failed call left in the record.
void putFallbackValues(VersionRecord& record) {
    copyText(record.product, HostType_OSIsTMK() ? HypervisorSWID::kKernelProduct : kOtherProduct);
    copyText(record.productVersion, kFallbackVersion);
    record.talmekBuild = static_cast<std::uint32_t>(std::strtoul(kFallbackBuildText, nullptr, 10));
}

void readRunningVersion(VersionRecord& record) {
    const TmkuserStatus_Code code = TmkuserVersion_GetSystemVersion(&record);
    if (code == TMKUSER_STATUS_OK) {
        return;
    }
    char message[kStatusTextSize] = {};
    TmkuserStatus_CodeToString(code, message, sizeof message);
    syslog(LOG_ERR, "Got error from TmkuserVersion_GetSystemVersion (%d): %s\n", TmkuserStatus_CodeToErrno(code),
           message);
    putFallbackValues(record);
}

// Replaces alternate with the record of the alternate bank's boot.cfg; leaves
// it as it is when the file cannot be opened.
void readAlternateVersion(std::unique_ptr<VersionRecord>& alternate) {
    std::FILE* file = std::fopen(orvRootPath(kBootConfig).c_str(), "r");
    if (file == nullptr) {
        return;
    }
    alternate = std::make_unique<VersionRecord>();
    HypervisorSWID::readAlternateBootConfig(file, *alternate);
    std::fclose(file);
}

// Logs a request for a class this provider does not serve and refuses it.
[[noreturn]] void refuseClass(const std::string& message) {
    syslog(LOG_ERR, "%s", message.c_str());
    throw CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED);
}

bool isServedClass(const CmpiString& className) { return className.equalsIgnoreCase(kServedClass); }

void requireServedClass(const CmpiObjectPath& cop, const char* operation) {
    const CmpiString className = cop.getClassName();
    if (!isServedClass(className)) {
        const char* requested = className.charPtr() == nullptr ? "" : className.charPtr();
        refuseClass(std::string("Orvane_HypervisorSoftwareIdentityProvider::") + operation + " was for " +
                    requested + ", not the One True Class, " + kServedClass + ".");
    }
}

// An instance on path restricted to the requested properties (the key kept).
CmpiInstance filteredInstance(const CmpiObjectPath& path, const char** properties) {
    CmpiInstance instance(path);
    instance.setPropertyFilter(properties, kKeyNames);
    return instance;
}

void setDate(CmpiInstance& instance, const char* name, CMPIUint64 microseconds) {
    instance.setProperty(name, CmpiData(CmpiDateTime(microseconds, false)));
}

void setText(CmpiInstance& instance, const char* name, const std::string& text) {
    instance.setProperty(name, CmpiData(text.c_str()));
}

// MajorVersion, MinorVersion and RevisionNumber, when productVersion reads as three numbers.
void setVersionNumbers(CmpiInstance& instance, const VersionRecord& record) {
    short major = 0;
    short minor = 0;
    short revision = 0;
    if (std::sscanf(HypervisorSWID::field(record.productVersion).c_str(), "%hd.%hd.%hd", &major, &minor,
                    &revision) != 3) {
        return;
    }
    instance.setProperty("MinorVersion", CmpiData(static_cast<CMPIUint16>(minor)));
    instance.setProperty("MajorVersion", CmpiData(static_cast<CMPIUint16>(major)));
    instance.setProperty("RevisionNumber", CmpiData(static_cast<CMPIUint16>(revision)));
}

void setReleaseDate(CmpiInstance& instance, const VersionRecord& record) {
    std::uint64_t released = 0;
    if (HypervisorSWID::releaseDateOf(HypervisorSWID::field(record.buildDate).c_str(), released)) {
        setDate(instance, "ReleaseDate", released);
    }
}

class HypervisorSoftwareIdentity : public CmpiInstanceMI {
public:
    HypervisorSoftwareIdentity(const CmpiBroker& mbp, const CmpiContext& ctx)
        : CmpiBaseMI(mbp, ctx), CmpiInstanceMI(mbp, ctx) {}

    CmpiStatus initialize(const CmpiContext&) override {
        initLastStartTime();
        return CmpiStatus(CMPI_RC_OK);
    }

    CmpiStatus enumInstanceNames(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& cop) override {
        OMC::MutexLock lock(_infolock);
        requireServedClass(cop, "enumInstanceNames");
        populateVersionInfo();
        const CmpiString className = cop.getClassName();
        for (const VersionRecord* record : records()) {
            CmpiObjectPath path(cop.getNameSpace(), className.charPtr());
            path.setKey("InstanceID", CmpiData(HypervisorSWID::buildInstanceId(*record).c_str()));
            rslt.returnData(path);
        }
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }

    CmpiStatus enumInstances(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& cop,
                             const char** properties) override {
        OMC::MutexLock lock(_infolock);
        if (!isServedClass(cop.getClassName())) {
            refuseClass(kEnumInstancesRefusal);
        }
        populateVersionInfo();
        for (const VersionRecord* record : records()) {
            CmpiInstance instance = filteredInstance(cop, properties);
            fillInstance(instance, *record);
            rslt.returnData(instance);
        }
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }

    CmpiStatus getInstance(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& cop,
                           const char** properties) override {
        OMC::MutexLock lock(_infolock);
        requireServedClass(cop, "getInstance");
        populateVersionInfo();
        CmpiInstance instance = filteredInstance(CmpiObjectPath(cop.getNameSpace(), kServedClass), properties);
        const CmpiData key = cop.getKey("InstanceID");
        const char* instanceId = key;
        const VersionRecord* record = recordWithId(instanceId == nullptr ? "" : instanceId);
        if (record == nullptr) {
            syslog(LOG_ERR, "Orvane_HypervisorSoftwareIdentityProvider::getInstance: Software instance not found "
                            "with InstanceID = %s", instanceId);
            throw CmpiStatus(CMPI_RC_ERR_NOT_FOUND);
        }
        fillInstance(instance, *record);
        rslt.returnData(instance);
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }

private:
    // The host's start time: now less the uptime the platform reports.
    void initLastStartTime() {
        struct sysinfo info {};
        OrvHost_Sysinfo(&info);
        const std::time_t started = std::time(nullptr) - info.uptime;
        m_LastStartTime = static_cast<CMPIUint64>(started) * kMicrosecondsPerSecond;
    }

    // Refreshes both records; called with _infolock held.
    void populateVersionInfo() {
        readRunningVersion(m_PrimaryVersionInfo);
        if (!HostType_OSIsTMK()) {
            return;
        }
        readAlternateVersion(m_AlternateVersionInfo);
    }

    // The running image's record, then the alternate bank's when there is one.
    std::vector<const VersionRecord*> records() const {
        std::vector<const VersionRecord*> all{&m_PrimaryVersionInfo};
        if (m_AlternateVersionInfo) {
            all.push_back(m_AlternateVersionInfo.get());
        }
        return all;
    }

    // The record whose InstanceID is instanceId, or null. An id that is not
    // the running image's is unknown when there is no alternate record.
    const VersionRecord* recordWithId(const std::string& instanceId) const {
        for (const VersionRecord* record : records()) {
            if (HypervisorSWID::buildInstanceId(*record) == instanceId) {
                return record;
            }
        }
        return nullptr;
    }

    void fillInstance(CmpiInstance& instance, const VersionRecord& record) const {
        const std::string instanceId = HypervisorSWID::buildInstanceId(record);
        const std::string name = HypervisorSWID::displayName(record);
        setReleaseDate(instance, record);
        setText(instance, "InstanceID", instanceId);
        setText(instance, "Name", name);
        setText(instance, "Caption", name);
        setText(instance, "Description", name);
        setText(instance, "ElementName", instanceId);
        instance.setProperty("LargeBuildNumber", CmpiData(static_cast<CMPIUint64>(record.talmekBuild)));
        if (!HypervisorSWID::isAltBootBank(record)) {
            setDate(instance, "LastStartTime", m_LastStartTime);
        }
        setText(instance, "VersionString", HypervisorSWID::versionString(record));
        setVersionNumbers(instance, record);
        setText(instance, "Manufacturer", kManufacturer);
        instance.setProperty("IsEntity", CmpiData(true));
    }

    VersionRecord m_PrimaryVersionInfo{};
    std::unique_ptr<VersionRecord> m_AlternateVersionInfo;
    OMC::Mutex _infolock;
    CMPIUint64 m_LastStartTime = 0;
};

}  // namespace

CMProviderBase(HypervisorSoftwareIdentity);

CMInstanceMIFactory(HypervisorSoftwareIdentity, HypervisorSoftwareIdentity)
