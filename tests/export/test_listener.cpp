#include "test_listener.hpp"

#include "orv/cimxml/xml_writer.hpp"
#include "orv/exporter/export_message.hpp"

namespace orv::exporter::test {

namespace {
constexpr std::chrono::seconds kWait{10};
}

TestListener::TestListener(std::chrono::seconds keepAlive) {
    http::ServerOptions options;
    options.keepAliveTimeout = keepAlive;
    options.port = 0;
    options.path.clear();  // any path
    options.threads = 4;
    server_ = std::make_unique<http::HttpServer>(options, [this](const http::Request& request) { return serve(request); });
    server_->bind();
    thread_ = std::thread([this] { server_->run(); });
    while (!server_->running()) {
        std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }
}

TestListener::~TestListener() {
    release();
    server_->stop();
    thread_.join();
}

std::string TestListener::url() const {
    return "http://127.0.0.1:" + std::to_string(server_->port()) + "/listener";
}

void TestListener::answer(Answer answer) {
    std::lock_guard lock(mutex_);
    answer_ = answer;
}

void TestListener::hold() {
    std::lock_guard lock(mutex_);
    holding_ = true;
}

void TestListener::release() {
    std::lock_guard lock(mutex_);
    holding_ = false;
    changed_.notify_all();
}

bool TestListener::waitForRequests(std::size_t count) {
    std::unique_lock lock(mutex_);
    return changed_.wait_for(lock, kWait, [&] { return raw_.size() >= count; });
}

bool TestListener::waitForHeld() {
    std::unique_lock lock(mutex_);
    return changed_.wait_for(lock, kWait, [&] { return held_ > 0; });
}

std::vector<std::string> TestListener::accepted() const {
    std::lock_guard lock(mutex_);
    return accepted_;
}

std::size_t TestListener::requests() const {
    std::lock_guard lock(mutex_);
    return raw_.size();
}

std::vector<http::Request> TestListener::rawRequests() const {
    std::lock_guard lock(mutex_);
    return raw_;
}

http::Response TestListener::serve(const http::Request& request) {
    std::unique_lock lock(mutex_);
    ++held_;
    changed_.notify_all();
    changed_.wait(lock, [this] { return !holding_; });
    --held_;
    raw_.push_back(request);
    changed_.notify_all();
    http::Response response;
    if (answer_ == Answer::HttpError) {
        response.status = 500;
        return response;
    }
    response.headers.emplace_back("CIMExport", "MethodResponse");
    response.contentType = "application/xml";
    if (answer_ == Answer::Garbage) {
        response.body = "<not-cim/>";
        return response;
    }
    ExportRequest parsed = parseExportRequest(request.body);
    if (answer_ == Answer::CimError) {
        response.body = buildExportResponse(parsed.messageId, 1, "refused by the test");
        return response;
    }
    accepted_.emplace_back(*parsed.indication->attribute("CLASSNAME"));
    response.body = buildExportResponse(parsed.messageId);
    return response;
}

std::string indicationXml(const std::string& className, const std::string& text) {
    cimxml::XmlWriter xml;
    xml.open("INSTANCE").attr("CLASSNAME", className)
        .open("PROPERTY").attr("NAME", "Description").attr("TYPE", "string").leaf("VALUE", text).close()
        .close();
    return xml.take();
}

}  // namespace orv::exporter::test
