// A small load client for a CIM broker (orv-cimhost, sfcb): N keep-alive connections send
// the same CIM-XML request for a fixed time; prints requests per second and p50 / p99
// latency.
//
//   cimhost_load --port 5988 --clients 8 --seconds 5 --op ei --class Raw_Element
//   cimhost_load --op gi --class Orvane_EthernetPort --key DeviceID=vmnic0,SystemName=h ...
#include <boost/asio/ip/tcp.hpp>
#include <boost/beast/core/detail/base64.hpp>
#include <boost/beast/core/flat_buffer.hpp>
#include <boost/beast/http/read.hpp>
#include <boost/beast/http/string_body.hpp>
#include <boost/beast/http/write.hpp>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <cstdio>
#include <cstdint>
#include <cstdlib>
#include <limits>
#include <string>
#include <thread>
#include <vector>

namespace {

namespace asio = boost::asio;
namespace beast = boost::beast;
namespace http = boost::beast::http;

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

// One keep-alive connection speaking HTTP/1.1 through Boost.Beast's synchronous calls:
// one write and, for a small answer, one read per request, so that the client takes as
// little of the machine as it can from the broker it measures.
class Connection {
public:
    Connection(const Options& options, std::string document) : options_(options) {
        request_.method(http::verb::post);
        request_.target("/cimom");
        request_.version(11);
        request_.set(http::field::host, options.host + ":" + std::to_string(options.port));
        request_.set(http::field::content_type, "application/xml; charset=\"utf-8\"");
        request_.set("CIMOperation", "MethodCall");
        request_.set("CIMMethod", options.op == "gi" ? "GetInstance" : "EnumerateInstances");
        request_.set("CIMObject", "root%2Fcimv2");
        if (!options.user.empty()) {
            request_.set(http::field::authorization, "Basic " + base64(options.user + ":" + options.password));
        }
        request_.keep_alive(true);
        request_.body() = std::move(document);
        request_.prepare_payload();
    }

    // True for a 200 answer without an ERROR element.
    bool exchange() {
        boost::system::error_code ec;
        if (!socket_.is_open() && !open()) {
            return false;
        }
        http::write(socket_, request_, ec);
        http::response_parser<http::string_body> parser;
        parser.body_limit(std::numeric_limits<std::uint64_t>::max());
        if (!ec) {
            http::read(socket_, buffer_, parser, ec);
        }
        if (ec) {
            close();
            return false;
        }
        const auto& response = parser.get();
        if (!response.keep_alive()) {
            close();
        }
        return response.result_int() == 200 && response.body().find("<ERROR") == std::string::npos;
    }

private:
    bool open() {
        boost::system::error_code ec;
        const auto address = asio::ip::make_address(options_.host, ec);
        if (ec) {
            return false;
        }
        socket_.connect(asio::ip::tcp::endpoint(address, static_cast<unsigned short>(options_.port)), ec);
        if (ec) {
            close();
            return false;
        }
        socket_.set_option(asio::ip::tcp::no_delay(true), ec);
        return true;
    }
    void close() {
        boost::system::error_code ignored;
        socket_.close(ignored);
        buffer_.clear();
    }
    static std::string base64(const std::string& text) {
        std::string out(beast::detail::base64::encoded_size(text.size()), '\0');
        out.resize(beast::detail::base64::encode(out.data(), text.data(), text.size()));
        return out;
    }

    const Options& options_;
    asio::io_context io_;
    asio::ip::tcp::socket socket_{io_};
    beast::flat_buffer buffer_;
    http::request<http::string_body> request_;
};

// One client's loop; latencies in microseconds.
void runClient(const Options& options, const std::string& body, std::chrono::steady_clock::time_point end,
               std::vector<double>& latencies, std::atomic<long>& failures) {
    Connection connection(options, body);
    while (std::chrono::steady_clock::now() < end) {
        const auto start = std::chrono::steady_clock::now();
        const bool answered = connection.exchange();
        const auto stop = std::chrono::steady_clock::now();
        if (!answered) {
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
