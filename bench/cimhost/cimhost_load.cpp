// A small load client for orv-cimhost: N keep-alive connections send the same CIM-XML
// request for a fixed time; prints requests per second and p50 / p99 latency.
//
//   cimhost_load --port 5988 --clients 8 --seconds 5 --op ei --class Raw_Element
//   cimhost_load --op gi --class Orvane_EthernetPort --key DeviceID=vmnic0,SystemName=h ...
#include <httplib.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <thread>
#include <vector>

namespace {

struct Options {
    std::string host = "127.0.0.1";
    int port = 5988;
    int clients = 1;
    int seconds = 5;
    std::string op = "ei";
    std::string className = "Raw_Element";
    std::string key;  // Name=value[,Name=value...] for gi
    std::string user;
    std::string password;
};

// KEYBINDING elements of string keys given as "Name=value,Name=value".
std::string keyBindings(const std::string& keys) {
    std::string out;
    std::size_t start = 0;
    while (start < keys.size()) {
        std::size_t comma = keys.find(',', start);
        if (comma == std::string::npos) {
            comma = keys.size();
        }
        const std::string binding = keys.substr(start, comma - start);
        const auto equals = binding.find('=');
        out += "<KEYBINDING NAME=\"" + binding.substr(0, equals) + "\"><KEYVALUE VALUETYPE=\"string\">" +
               binding.substr(equals + 1) + "</KEYVALUE></KEYBINDING>";
        start = comma + 1;
    }
    return out;
}

std::string requestBody(const Options& options) {
    std::string params;
    if (options.op == "gi") {
        params = "<IPARAMVALUE NAME=\"InstanceName\"><INSTANCENAME CLASSNAME=\"" + options.className + "\">" +
                 keyBindings(options.key) + "</INSTANCENAME></IPARAMVALUE>";
    } else {
        params = "<IPARAMVALUE NAME=\"ClassName\"><CLASSNAME NAME=\"" + options.className + "\"/></IPARAMVALUE>";
    }
    return "<?xml version=\"1.0\" encoding=\"utf-8\"?><CIM CIMVERSION=\"2.0\" DTDVERSION=\"2.0\"><MESSAGE ID=\"1\" "
           "PROTOCOLVERSION=\"1.0\"><SIMPLEREQ><IMETHODCALL NAME=\"" + std::string(options.op == "gi" ? "GetInstance" : "EnumerateInstances") +
           "\"><LOCALNAMESPACEPATH><NAMESPACE NAME=\"root\"/><NAMESPACE NAME=\"cimv2\"/></LOCALNAMESPACEPATH>" +
           params + "</IMETHODCALL></SIMPLEREQ></MESSAGE></CIM>";
}

Options parse(int argc, char** argv) {
    Options options;
    for (int i = 1; i + 1 < argc; i += 2) {
        const std::string name = argv[i];
        const std::string value = argv[i + 1];
        if (name == "--host") options.host = value;
        else if (name == "--port") options.port = std::atoi(value.c_str());
        else if (name == "--clients") options.clients = std::max(1, std::atoi(value.c_str()));
        else if (name == "--seconds") options.seconds = std::max(1, std::atoi(value.c_str()));
        else if (name == "--op") options.op = value;
        else if (name == "--class") options.className = value;
        else if (name == "--key") options.key = value;
        else if (name == "--user") options.user = value;
        else if (name == "--password") options.password = value;
        else {
            std::fprintf(stderr, "unknown option %s\n", name.c_str());
            std::exit(2);
        }
    }
    return options;
}

// One client's loop; latencies in microseconds.
void runClient(const Options& options, const std::string& body, std::chrono::steady_clock::time_point end,
               std::vector<double>& latencies, std::atomic<long>& failures) {
    httplib::Client client(options.host, options.port);
    client.set_keep_alive(true);
    client.set_tcp_nodelay(true);
    if (!options.user.empty()) {
        client.set_basic_auth(options.user.c_str(), options.password.c_str());
    }
    const std::string method = options.op == "gi" ? "GetInstance" : "EnumerateInstances";
    const httplib::Headers headers{{"CIMOperation", "MethodCall"}, {"CIMMethod", method}, {"CIMObject", "root%2Fcimv2"}};
    while (std::chrono::steady_clock::now() < end) {
        const auto start = std::chrono::steady_clock::now();
        auto result = client.Post("/cimom", headers, body, "application/xml; charset=\"utf-8\"");
        const auto stop = std::chrono::steady_clock::now();
        if (!result || result->status != 200 || result->body.find("<ERROR") != std::string::npos) {
            ++failures;
            continue;
        }
        latencies.push_back(std::chrono::duration<double, std::micro>(stop - start).count());
    }
}

double percentile(std::vector<double>& values, double p) {
    if (values.empty()) {
        return 0;
    }
    const auto index = static_cast<std::size_t>(p * static_cast<double>(values.size() - 1));
    std::nth_element(values.begin(), values.begin() + static_cast<long>(index), values.end());
    return values[index];
}

}  // namespace

int main(int argc, char** argv) {
    const Options options = parse(argc, argv);
    const std::string body = requestBody(options);
    std::vector<std::vector<double>> perClient(static_cast<std::size_t>(options.clients));
    std::atomic<long> failures{0};
    const auto end = std::chrono::steady_clock::now() + std::chrono::seconds(options.seconds);
    std::vector<std::thread> threads;
    for (auto& latencies : perClient) {
        threads.emplace_back([&, end] { runClient(options, body, end, latencies, failures); });
    }
    for (auto& thread : threads) {
        thread.join();
    }
    std::vector<double> all;
    for (const auto& latencies : perClient) {
        all.insert(all.end(), latencies.begin(), latencies.end());
    }
    std::printf("%s %s clients=%d requests=%zu failures=%ld rps=%.0f p50=%.0fus p99=%.0fus\n", options.op.c_str(),
                options.className.c_str(), options.clients, all.size(), failures.load(),
                static_cast<double>(all.size()) / options.seconds, percentile(all, 0.50), percentile(all, 0.99));
    return failures.load() == 0 && !all.empty() ? 0 : 1;
}
