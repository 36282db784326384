#include "cpuid_reader.hpp"

#include "linux_call_error.hpp"

#include <cerrno>
#include <cpuid.h>
#include <fcntl.h>
#include <pthread.h>
#include <sched.h>
#include <thread>
#include <unistd.h>

namespace orv::linuxhost {

namespace {

// The cpuid device answers 16 bytes (EAX, EBX, ECX, EDX) at the offset of the leaf.
bool readFromDevice(unsigned cpu, const std::string& devRoot, CpuidLeaves& out)
{
    const std::string path = devRoot + "/cpu/" + std::to_string(cpu) + "/cpuid";
    int fd = ::open(path.c_str(), O_RDONLY | O_CLOEXEC);
    if (fd < 0) return false;
    bool ok = true;
    for (std::size_t i = 0; i < kRecordLeaves.size() && ok; ++i) {
        ok = ::pread(fd, &out.leaves[i], sizeof(CpuidRegisters), kRecordLeaves[i]) == sizeof(CpuidRegisters);
    }
    ::close(fd);
    return ok;
}

CpuidLeaves executeHere()
{
    CpuidLeaves out;
    for (std::size_t i = 0; i < kRecordLeaves.size(); ++i) {
        auto& r = out.leaves[i];
        __cpuid_count(kRecordLeaves[i], 0, r.eax, r.ebx, r.ecx, r.edx);
    }
    return out;
}

// A helper thread pinned to the CPU executes the instruction there.
int executeOn(unsigned cpu, CpuidLeaves& out)
{
    int error = 0;
    std::thread helper([&] {
        cpu_set_t set;
        CPU_ZERO(&set);
        CPU_SET(cpu, &set);
        error = pthread_setaffinity_np(pthread_self(), sizeof set, &set);
        if (error == 0) out = executeHere();
    });
    helper.join();
    return error;
}

}  // namespace

const CpuidRegisters& CpuidLeaves::leaf(std::uint32_t number) const
{
    static const CpuidRegisters none{};
    for (std::size_t i = 0; i < kRecordLeaves.size(); ++i) {
        if (kRecordLeaves[i] == number) return leaves[i];
    }
    return none;
}

CpuSignature decodeSignature(std::uint32_t eax)
{
    CpuSignature signature;
    const std::uint32_t baseFamily = (eax >> 8) & 0xF;
    const std::uint32_t baseModel = (eax >> 4) & 0xF;
    signature.stepping = eax & 0xF;
    signature.type = (eax >> 12) & 0x3;
    signature.family = baseFamily == 0xF ? baseFamily + ((eax >> 20) & 0xFF) : baseFamily;
    signature.model = (baseFamily == 0x6 || baseFamily == 0xF) ? baseModel | (((eax >> 16) & 0xF) << 4) : baseModel;
    return signature;
}

CpuidLeaves clampToAnnounced(CpuidLeaves leaves)
{
    const std::uint32_t maxBasic = leaves.leaf(0).eax;
    const std::uint32_t maxExtended = leaves.leaf(0x80000000).eax;
    for (std::size_t i = 0; i < kRecordLeaves.size(); ++i) {
        const std::uint32_t number = kRecordLeaves[i];
        const bool extended = number >= 0x80000000;
        const bool announced = extended ? (maxExtended >= 0x80000000 && number <= maxExtended) : number <= maxBasic;
        if (!announced) leaves.leaves[i] = CpuidRegisters{};
    }
    return leaves;
}

CpuidLeaves readCpuidLeaves(unsigned cpu, const std::string& devRoot)
{
    CpuidLeaves leaves;
    if (readFromDevice(cpu, devRoot, leaves)) return clampToAnnounced(leaves);
    if (int error = executeOn(cpu, leaves)) throw LinuxCallError("sched_setaffinity", "cpu" + std::to_string(cpu), error);
    return clampToAnnounced(leaves);
}

}  // namespace orv::linuxhost
