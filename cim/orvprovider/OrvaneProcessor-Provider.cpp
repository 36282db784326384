// Processor packages: one "Orvane_Processor" instance per CPU package (socket)
// of the host, built from the records that the CPU detail collection gathers
// afresh on every request. Read-only; nothing is kept between requests.
#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

#include <cmpi/CmpiArray.h>
#include <cmpi/CmpiInstanceMI.h>
#include <cmpi/CmpiResultInstanceToPathFilter.h>
#include <omc/ComputerSystem.h>

#include "OrvaneProcessor-Collection.h"
#include "OrvaneProcessor-Values.h"

namespace {

using OrvaneProcessor::CpuDetails;

constexpr const char* kProcessorClass = "Orvane_Processor";

// OperationalStatus: OK.
constexpr CMPIUint16 kStatusOk = 2;
// Characters of the DeviceID key's number that are read.
constexpr std::size_t kDeviceNumberLength = 64;

// One-element string array.
CmpiArray singleText(const char* text) {
    CmpiArray array(1, CMPI_string);
    array[0] = CmpiData(CmpiString(text));
    return array;
}

// The characteristic codes and enabled states of the package's features, null
// elements for the features it lacks.
void fillCharacteristics(const CpuDetails& record, CmpiArray& codes, CmpiArray& states) {
    const OrvaneProcessor::CharacteristicSlots slots = OrvaneProcessor::characteristicSlots(record);
    for (std::size_t i = 0; i < slots.size(); ++i) {
        if (slots[i]) {
            codes[static_cast<int>(i)] = CmpiData(static_cast<CMPIUint16>(slots[i]->code));
            states[static_cast<int>(i)] = CmpiData(static_cast<CMPIUint16>(slots[i]->state));
        }
    }
}

// The package named by a DeviceID of the form "<anything>-<number>": the
// number after the last "-" read in base 10, as a position in the collected
// list. -1 when the key is absent or has no "-".
long packagePosition(const CmpiObjectPath& ref) {
    CmpiData key;
    try {
        key = ref.getKey("DeviceID");
    } catch (const CmpiStatus&) {
        return -1;
    }
    if (key.isNullValue() || key.getType() != CMPI_string) {
        return -1;
    }
    const CmpiString deviceId = key;
    const char* dash = deviceId.charPtr() == nullptr ? nullptr : std::strrchr(deviceId.charPtr(), '-');
    if (dash == nullptr) {
        return -1;
    }
    char number[kDeviceNumberLength + 1] = {};
    std::strncpy(number, dash + 1, kDeviceNumberLength);
    return std::strtol(number, nullptr, 10);
}

// What a request for a class finds.
enum class Collection { OtherClass, NoPackages, Packages };

// Collects the host's packages when `cop` names the processor class (in any
// letter case). A failed collection counts as no packages.
Collection collectFor(const CmpiObjectPath& cop, std::vector<CpuDetails>& records) {
    if (!cop.getClassName().equalsIgnoreCase(kProcessorClass)) {
        return Collection::OtherClass;
    }
    if (OrvaneProcessor::getCpuDetails(records) != 0 || records.empty()) {
        return Collection::NoPackages;
    }
    return Collection::Packages;
}

class OrvaneProcessorProvider : public CmpiInstanceMI {
public:
    OrvaneProcessorProvider(const CmpiBroker& mbp, const CmpiContext& ctx)
        : CmpiBaseMI(mbp, ctx), CmpiInstanceMI(mbp, ctx) {}

    CmpiStatus enumInstanceNames(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop) override {
        CmpiResultInstanceToPathFilter paths(rslt);
        return enumInstances(ctx, paths, cop, nullptr);
    }

    // Every package, in collection order. A failed collection is not
    // reported: the answer is then OK with nothing and no returnDone.
    CmpiStatus enumInstances(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop,
                             const char** properties) override {
        CmpiString nameSpace = cop.getNameSpace();
        std::vector<CpuDetails> records;
        if (collectFor(cop, records) != Collection::Packages) {
            return CmpiStatus(CMPI_RC_OK);
        }
        for (CpuDetails& record : records) {
            rslt.returnData(buildInstance(ctx, record, nameSpace, properties));
        }
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }

    // Looks the package up by the number in its DeviceID alone; the other
    // keys are not compared.
    CmpiStatus getInstance(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& cop,
                           const char** properties) override {
        CmpiString nameSpace = cop.getNameSpace();
        std::vector<CpuDetails> records;
        const Collection collection = collectFor(cop, records);
        if (collection == Collection::OtherClass) {
            return CmpiStatus(CMPI_RC_OK);
        }
        const long position = collection == Collection::Packages ? packagePosition(cop) : -1;
        if (position < 0 || static_cast<unsigned long>(position) >= records.size()) {
            return CmpiStatus(CMPI_RC_ERR_NOT_FOUND);
        }
        rslt.returnData(buildInstance(ctx, records[static_cast<std::size_t>(position)], nameSpace, properties));
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }

private:
    // The path carries ElementName as a fifth key, after the four keys of a
    // logical device.
    CmpiObjectPath buildPath(const CmpiContext& ctx, const CpuDetails& record, const CmpiString& nameSpace) const {
        CmpiObjectPath path(nameSpace, kProcessorClass);
        path.setKey("SystemCreationClassName", CmpiData(OMC::getComputerSystemClassName()));
        path.setKey("SystemName", CmpiData(OMC::getComputerSystemName(ctx, *broker)));
        path.setKey("CreationClassName", CmpiData(kProcessorClass));
        path.setKey("DeviceID", CmpiData(record.DeviceID));
        path.setKey("ElementName", CmpiData(record.DeviceID));
        return path;
    }

    static void setIdentification(CmpiInstance& instance, const CpuDetails& record) {
        // The array is made with the array type code itself; the broker keeps
        // the element type either way.
        CmpiArray operationalStatus(1, CMPI_uint16A);
        operationalStatus[0] = CmpiData(kStatusOk);
        instance.setProperty("OperationalStatus", CmpiData(operationalStatus));
        instance.setProperty("Vendor", CmpiData(static_cast<CMPIUint16>(record.Vendor)));
        instance.setProperty("NumberOfEnabledCores", CmpiData(static_cast<CMPIUint16>(record.NumberOfEnabledCores)));
        instance.setProperty("Stepping", CmpiData(record.Stepping));
        instance.setProperty("ModelName", CmpiData(record.ModelName));
        instance.setProperty("OtherIdentifyingInfo", CmpiData(singleText(OrvaneProcessor::brandText(record.BrandID).c_str())));
        instance.setProperty("IdentifyingDescriptions", CmpiData(singleText("Brand ID")));
    }

    static void setStatusAndFeatures(CmpiInstance& instance, const CpuDetails& record) {
        instance.setProperty("CPUStatus", CmpiData(static_cast<CMPIUint16>(record.CPUStatus)));
        CmpiArray codes(OrvaneProcessor::kCharacteristicSlots, CMPI_uint16);
        CmpiArray states(OrvaneProcessor::kCharacteristicSlots, CMPI_uint16);
        fillCharacteristics(record, codes, states);
        instance.setProperty("Characteristics", CmpiData(codes));
        instance.setProperty("EnabledProcessorCharacteristics", CmpiData(states));
    }

    // The instance of one package with only the requested properties (all
    // when `properties` is null). The filter is applied before any property
    // is set.
    CmpiInstance buildInstance(const CmpiContext& ctx, CpuDetails& record, CmpiString& nameSpace,
                               const char** properties) const {
        CmpiInstance instance(buildPath(ctx, record, nameSpace));
        instance.setPropertyFilter(properties, nullptr);
        instance.setProperty("SystemCreationClassName", CmpiData(OMC::getComputerSystemClassName()));
        instance.setProperty("SystemName", CmpiData(OMC::getComputerSystemName(ctx, *broker)));
        instance.setProperty("CreationClassName", CmpiData(kProcessorClass));
        instance.setProperty("DeviceID", CmpiData(record.DeviceID));
        instance.setProperty("ElementName", CmpiData(record.DeviceID));
        setIdentification(instance, record);
        setStatusAndFeatures(instance, record);
        return instance;
    }
};

}  // namespace

CMProviderBase(OrvaneProcessorProvider);

CMInstanceMIFactory(OrvaneProcessorProvider, OrvaneProcessorProvider)
