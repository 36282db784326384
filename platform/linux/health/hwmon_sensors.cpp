#include "hwmon_sensors.hpp"

#include "../text_files.hpp"
#include "health_state.hpp"
#include "sysfs_dir.hpp"

#include <algorithm>
#include <map>
#include <set>

namespace orv::linuxhost::health {

namespace {

struct KindPrefix {
    const char* prefix;
    SensorKind kind;
};

constexpr KindPrefix kKinds[] = {
    {"temp", SensorKind::Temperature}, {"in", SensorKind::Voltage}, {"fan", SensorKind::Fan},
    {"curr", SensorKind::Current},     {"power", SensorKind::Power},
};

// "temp1_input" -> kind Temperature, channel "temp1"; nothing for other files.
std::optional<std::pair<SensorKind, std::string>> channelOf(const std::string& file)
{
    const std::size_t underscore = file.find('_');
    if (underscore == std::string::npos) return std::nullopt;
    const std::string channel = file.substr(0, underscore);
    for (const KindPrefix& kind : kKinds) {
        const std::string prefix = kind.prefix;
        if (channel.size() <= prefix.size() || channel.rfind(prefix, 0) != 0) continue;
        const std::string number = channel.substr(prefix.size());
        if (number.find_first_not_of("0123456789") != std::string::npos) continue;
        return std::make_pair(kind.kind, channel);
    }
    return std::nullopt;
}

std::optional<bool> readFlag(const std::string& path)
{
    auto value = readNumber(path);
    if (!value) return std::nullopt;
    return *value != 0;
}

// The directory that holds a chip's attributes: the hwmon directory itself,
// or its `device` directory for drivers that still put them there.
std::string attributeDir(const std::string& hwmonDir)
{
    for (const std::string& name : directoryEntries(hwmonDir)) {
        if (channelOf(name)) return hwmonDir;
    }
    return hwmonDir + "/device";
}

// The chip's device path with the trailing "hwmon/hwmonN" or "hwmonN" cut.
std::optional<std::string> chipPath(const std::string& sysRoot, const std::string& hwmonDir, const std::string& entry)
{
    std::optional<std::string> path = devicePath(sysRoot, hwmonDir);
    if (!path) return std::nullopt;
    for (const std::string& tail : {"/hwmon/" + entry, "/" + entry}) {
        if (path->size() > tail.size() && path->compare(path->size() - tail.size(), tail.size(), tail) == 0) {
            std::string chip = path->substr(0, path->size() - tail.size());
            if (chip == "virtual/hwmon" || chip == "virtual") return std::nullopt;
            return chip;
        }
    }
    return std::nullopt;
}

// The files of a chip's folder, so that only attributes the chip has are opened.
using FileSet = std::set<std::string>;

HwmonSensor readChannel(const std::string& dir, const FileSet& files, SensorKind kind, const std::string& channel)
{
    // The path of an attribute the chip has, else empty (reading "" fails at once).
    auto at = [&](const char* suffix) {
        const std::string name = channel + "_" + suffix;
        return files.count(name) ? dir + "/" + name : std::string();
    };
    auto number = [&](const char* suffix) {
        std::string path = at(suffix);
        return path.empty() ? std::nullopt : readSignedNumber(path);
    };
    auto flag = [&](const char* suffix) {
        std::string path = at(suffix);
        return path.empty() ? std::nullopt : readFlag(path);
    };
    HwmonSensor sensor;
    sensor.kind = kind;
    sensor.channel = channel;
    if (std::string path = at("label"); !path.empty()) sensor.label = readLine(path);
    sensor.input = number("input");
    if (!sensor.input && kind == SensorKind::Power) sensor.input = number("average");
    sensor.min = number("min");
    sensor.max = number("max");
    sensor.lcrit = number("lcrit");
    sensor.crit = number("crit");
    sensor.emergency = number("emergency");
    sensor.alarm = flag("alarm");
    sensor.minAlarm = flag("min_alarm");
    sensor.maxAlarm = flag("max_alarm");
    sensor.lcritAlarm = flag("lcrit_alarm");
    sensor.critAlarm = flag("crit_alarm");
    sensor.emergencyAlarm = flag("emergency_alarm");
    sensor.fault = flag("fault");
    return sensor;
}

void readChip(const std::string& dir, const std::string& chip, const std::string& chipName,
              std::vector<HwmonSensor>& out)
{
    std::map<SensorKind, std::set<std::string, bool (*)(const std::string&, const std::string&)>> channels;
    FileSet files;
    for (const std::string& file : directoryEntries(dir)) {
        auto found = channelOf(file);
        if (!found) continue;
        files.insert(file);
        channels.try_emplace(found->first, naturalLess).first->second.insert(found->second);
    }
    for (const auto& [kind, names] : channels) {
        for (const std::string& channel : names) {
            if (files.count(channel + "_enable") && readNumber(dir + "/" + channel + "_enable") == std::uint64_t{0}) continue;
            HwmonSensor sensor = readChannel(dir, files, kind, channel);
            sensor.chip = chip;
            sensor.chipName = chipName;
            out.push_back(std::move(sensor));
        }
    }
}

bool set(const std::optional<bool>& flag) { return flag.value_or(false); }

bool over(const std::optional<std::int64_t>& input, const std::optional<std::int64_t>& limit)
{
    return input && limit && *limit != 0 && *input > *limit;
}

bool under(const std::optional<std::int64_t>& input, const std::optional<std::int64_t>& limit)
{
    return input && limit && *input < *limit;
}

bool judgeable(const HwmonSensor& s)
{
    const bool flags = s.alarm || s.minAlarm || s.maxAlarm || s.lcritAlarm || s.critAlarm || s.emergencyAlarm || s.fault;
    const bool upper = (s.max && *s.max != 0) || (s.crit && *s.crit != 0) || (s.emergency && *s.emergency != 0);
    const bool lower = s.min || s.lcrit;
    return flags || (s.input && (upper || lower));
}

}  // namespace

std::vector<HwmonSensor> readHwmonSensors(const std::string& sysRoot)
{
    std::vector<HwmonSensor> sensors;
    std::map<std::string, int> unnamedChips;
    const std::string classDir = sysRoot + "/class/hwmon";
    for (const std::string& entry : directoryEntries(classDir)) {
        const std::string hwmonDir = classDir + "/" + entry;
        const std::string dir = attributeDir(hwmonDir);
        std::string chipName = readLine(hwmonDir + "/name").value_or(readLine(dir + "/name").value_or(entry));
        std::optional<std::string> chip = chipPath(sysRoot, hwmonDir, entry);
        if (!chip) {
            int seen = unnamedChips[chipName]++;
            chip = "virtual/" + chipName + (seen ? "#" + std::to_string(seen + 1) : "");
        }
        readChip(dir, *chip, chipName, sensors);
    }
    return sensors;
}

SensorCondition sensorCondition(const HwmonSensor& s)
{
    if (!judgeable(s)) return {};
    // A faulty channel's reading means nothing: only the chip's flags count.
    const std::optional<std::int64_t> input = set(s.fault) ? std::nullopt : s.input;
    if (set(s.emergencyAlarm) || over(input, s.emergency)) return {kNonRecoverable, "Upper Fatal"};
    if (set(s.critAlarm) || over(input, s.crit)) return {kCriticalFailure, "Upper Critical"};
    if (set(s.lcritAlarm) || under(input, s.lcrit)) return {kCriticalFailure, "Lower Critical"};
    if (set(s.fault)) return {kMajorFailure, "Fault"};
    if (set(s.maxAlarm) || over(input, s.max)) return {kDegraded, "Upper Non-Critical"};
    if (set(s.minAlarm) || under(input, s.min)) return {kDegraded, "Lower Non-Critical"};
    if (set(s.alarm)) return {kDegraded, "Non-Critical"};
    return {kOk, "Normal"};
}

}  // namespace orv::linuxhost::health
