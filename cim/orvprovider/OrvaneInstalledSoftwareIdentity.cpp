// "Orvane_InstalledSoftwareIdentity": links the host's computer system to the
// hypervisor image that runs on it. The image in the alternate boot bank is
// installed but not running, so it is left out of enumerations and reference
// walks (its identity's InstanceID begins with "Alt Boot Bank:").
//
// The software identities are asked from the broker, which routes the request
// to the hypervisor software identity provider.
#include <strings.h>

#include <cstring>

#include <cmpi/CmpiInstanceMI.h>
#include <cmpi/CmpiResultPathToInstanceFilter.h>
#include <omc/ComputerSystem.h>
#include <omc/SimpleAssociationMI.h>

namespace {

constexpr const char* kAssociationClass = "Orvane_InstalledSoftwareIdentity";
constexpr const char* kSoftwareClass = "Orvane_HypervisorSoftwareIdentity";
constexpr const char* kSystemClass = "OMC_UnitaryComputerSystem";
// Namespace of the system path in names and instances, leading slash included.
constexpr const char* kSystemNameSpace = "/root/cimv2";
constexpr const char* kSystemRole = "System";
constexpr const char* kSoftwareRole = "InstalledSoftware";
constexpr const char* kAltBootBankPrefix = "Alt Boot Bank:";
constexpr std::size_t kSystemTextSize = 128;

const char* kKeyNames[] = {kSystemRole, kSoftwareRole, nullptr};

bool isGiven(const char* filter) { return filter != nullptr && *filter != '\0'; }

// An absent or empty role places no restriction; roles compare ignoring case.
bool roleAllows(const char* requested, const char* role) {
    return !isGiven(requested) || ::strcasecmp(requested, role) == 0;
}

// An absent or empty result class places no restriction.
bool resultClassAllows(const CmpiString& nameSpace, const char* resultClass, const char* endClass) {
    return !isGiven(resultClass) || CmpiObjectPath(nameSpace, endClass).classPathIsA(resultClass);
}

bool isAltBootBank(const CmpiObjectPath& software) {
    const CmpiData key = software.getKey("InstanceID");
    const char* instanceId = key;
    return instanceId != nullptr && std::strncmp(instanceId, kAltBootBankPrefix, std::strlen(kAltBootBankPrefix)) == 0;
}

void copyText(char (&field)[kSystemTextSize], const char* text) {
    std::strncpy(field, text == nullptr ? "" : text, sizeof field - 1);
    field[sizeof field - 1] = '\0';
}

CmpiInstance associationInstance(const CmpiString& nameSpace, const CmpiObjectPath& system,
                                 const CmpiObjectPath& software) {
    CmpiInstance instance(CmpiObjectPath(nameSpace, kAssociationClass));
    instance.setProperty(kSystemRole, CmpiData(system));
    instance.setProperty(kSoftwareRole, CmpiData(software));
    return instance;
}

class OrvaneInstalledSoftwareIdentity : public virtual CmpiInstanceMI, public virtual OMC::SimpleAssociationMI {
public:
    OrvaneInstalledSoftwareIdentity(const CmpiBroker& mbp, const CmpiContext& ctx)
        : CmpiBaseMI(mbp, ctx), CmpiInstanceMI(mbp, ctx), OMC::SimpleAssociationMI(mbp, ctx) {}

    // Keeps the computer system's keys for the life of the provider.
    CmpiStatus initialize(const CmpiContext& ctx) override {
        copyText(m_SystemCreationClassName, OMC::getComputerSystemClassName());
        copyText(m_SystemName, OMC::getComputerSystemName(ctx, *broker).charPtr());
        return CmpiStatus(CMPI_RC_OK);
    }

    CmpiStatus enumInstanceNames(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop) override {
        if (!cop.classPathIsA(kAssociationClass)) {
            return CmpiStatus(CMPI_RC_OK);
        }
        const CmpiObjectPath system = systemPath(kSystemNameSpace);
        const CmpiString nameSpace = cop.getNameSpace();
        const CmpiString className = cop.getClassName();
        const bool any = forEachRunningSoftware(ctx, nameSpace, [&](const CmpiObjectPath& software) {
            CmpiObjectPath name(nameSpace, className.charPtr());
            name.setKey(kSystemRole, CmpiData(system));
            name.setKey(kSoftwareRole, CmpiData(software));
            rslt.returnData(name);
        });
        if (any) {
            rslt.returnDone();
        }
        return CmpiStatus(CMPI_RC_OK);
    }

    CmpiStatus enumInstances(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop,
                             const char** properties) override {
        CmpiResultPathToInstanceFilter instances(rslt, properties);
        return enumInstanceNames(ctx, instances, cop);
    }

    // Names any software identity the broker finds, the alternate bank's included.
    CmpiStatus getInstance(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop,
                           const char** properties) override {
        if (!cop.classPathIsA(kAssociationClass)) {
            return CmpiStatus(CMPI_RC_OK);
        }
        const CmpiObjectPath software = cop.getKey(kSoftwareRole);
        if (!software.classPathIsA(kSoftwareClass)) {
            return CmpiStatus(CMPI_RC_OK);
        }
        // A software identity the broker cannot give fails the request with the broker's status.
        (void)broker->getInstance(ctx, software, nullptr);
        CmpiInstance instance(cop);
        instance.setPropertyFilter(properties, kKeyNames);
        instance.setProperty(kSystemRole, CmpiData(systemPath(kSystemNameSpace)));
        instance.setProperty(kSoftwareRole, CmpiData(software));
        rslt.returnData(instance);
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }

    // The association class is not examined: this provider serves one.
    CmpiStatus doReferences(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& path, const char*,
                            const char* resultClass, const char* role, const char* resultRole) override {
        const CmpiString nameSpace = path.getNameSpace();
        if (path.classPathIsA(kSystemClass)) {
            if (roleAllows(role, kSystemRole) && roleAllows(resultRole, kSoftwareRole) &&
                resultClassAllows(nameSpace, resultClass, kSoftwareClass)) {
                referencesOfSystem(ctx, rslt, path);
            }
        } else if (path.classPathIsA(kSoftwareClass)) {
            if (roleAllows(role, kSoftwareRole) && roleAllows(resultRole, kSystemRole) &&
                resultClassAllows(nameSpace, resultClass, kSystemClass) && !isAltBootBank(path)) {
                rslt.returnData(associationInstance(nameSpace, systemPath(nameSpace), path));
                rslt.returnDone();
            }
        }
        return CmpiStatus(CMPI_RC_OK);
    }

private:
    // One association per running software identity, with System = the request's path.
    void referencesOfSystem(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& system) {
        const CmpiString nameSpace = system.getNameSpace();
        const bool any = forEachRunningSoftware(ctx, nameSpace, [&](const CmpiObjectPath& software) {
            rslt.returnData(associationInstance(nameSpace, system, software));
        });
        if (any) {
            rslt.returnDone();
        }
    }

    // Calls deliver with every software identity name the broker returns that
    // is not the alternate bank's; true when the broker returned any name.
    template <class Deliver>
    bool forEachRunningSoftware(const CmpiContext& ctx, const CmpiString& nameSpace, Deliver deliver) {
        CmpiEnumeration names = broker->enumInstanceNames(ctx, CmpiObjectPath(nameSpace, kSoftwareClass));
        bool any = false;
        while (names.hasNext()) {
            const CmpiObjectPath software = names.getNext();
            any = true;
            if (!isAltBootBank(software)) {
                deliver(software);
            }
        }
        return any;
    }

    CmpiObjectPath systemPath(const CmpiString& nameSpace) const { return systemPath(nameSpace.charPtr()); }

    CmpiObjectPath systemPath(const char* nameSpace) const {
        CmpiObjectPath system(nameSpace, kSystemClass);
        system.setKey("Name", CmpiData(m_SystemName));
        system.setKey("CreationClassName", CmpiData(m_SystemCreationClassName));
        return system;
    }

    char m_SystemCreationClassName[kSystemTextSize] = {};
    char m_SystemName[kSystemTextSize] = {};
};

}  // namespace

CMProviderBase(OrvaneInstalledSoftwareIdentity);

CMInstanceMIFactory(OrvaneInstalledSoftwareIdentity, OrvaneInstalledSoftwareIdentity)

CMAssociationMIFactory(OrvaneInstalledSoftwareIdentity, OrvaneInstalledSoftwareIdentity)
