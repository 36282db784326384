// Runs one attack on the HTTP front end of an orv-cimhost listening on 127.0.0.1, then
// checks that a proper request is still answered; run_attack_memory.sh measures the host's
// memory around each one. Prints one line: the attack, what the host answered, and whether
// another client was served meanwhile.
//
//   cimhost_attack --port 5988 --attack chunked-100mb [--user user --password secret]
#include <atomic>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <functional>
#include <map>
#include <memory>
#include <string>
#include <thread>
#include <vector>

#include "raw_connection.hpp"

namespace {

using namespace std::chrono_literals;
using orv::e2e::RawConnection;

struct Target {
    int port = 5988;
    std::string authorization;  // "Authorization: ..." line of the right login, or ""
};

std::string statusText(const std::optional<orv::e2e::RawResponse>& response) {
    return response ? std::to_string(response->status) : std::string("no answer");
}

std::string properRequest(const Target& target, int id = 1) {
    return orv::e2e::cimPost(orv::e2e::enumerateClassNamesBody(id), "EnumerateClassNames", target.authorization);
}

// A proper request from another address; its status and how long it took.
std::string otherClient(const Target& target) {
    const auto start = std::chrono::steady_clock::now();
    RawConnection client(target.port, "127.0.0.200");
    client.send(properRequest(target));
    auto response = client.readResponse(30000ms);
    const auto ms = std::chrono::duration_cast<std::chrono::milliseconds>(std::chrono::steady_clock::now() - start);
    return "other client " + statusText(response) + " in " + std::to_string(ms.count()) + " ms";
}

std::vector<std::unique_ptr<RawConnection>> openMany(const Target& target, int count, const std::string& first) {
    std::vector<std::unique_ptr<RawConnection>> connections;
    for (int i = 0; i < count; ++i) {
        // 50 connections per address, below the host's per-address limit of 64.
        const std::string source = "127.0." + std::to_string(2 + i / 50 / 250) + "." + std::to_string(1 + i / 50 % 250);
        connections.push_back(std::make_unique<RawConnection>(target.port, source));
        if (!first.empty()) {
            connections.back()->send(first);
        }
    }
    return connections;
}

// `count` connections sending one header byte every 2 s for `seconds`, while another client asks.
std::string slowHeads(const Target& target, int count, int seconds) {
    auto slow = openMany(target, count, "POST /cimom HTTP/1.1\r\n");
    std::string other;
    for (int tick = 0; tick < seconds / 2; ++tick) {
        for (auto& connection : slow) {
            connection->send("X");
        }
        if (tick == 1) {
            other = otherClient(target);
        }
        std::this_thread::sleep_for(2s);
    }
    return std::to_string(count) + " slow heads held; " + other;
}

std::string chunkedBodies(const Target& target, int requests, int megabytes) {
    std::string head = properRequest(target);
    head = head.substr(0, head.find("Content-Length:")) + "Transfer-Encoding: chunked\r\n\r\n";
    const std::string chunk = "100000\r\n" + std::string(0x100000, 'x') + "\r\n";
    std::string answers;
    for (int request = 0; request < requests; ++request) {
        RawConnection client(target.port);
        client.send(head);
        int sent = 0;
        while (sent < megabytes && client.send(chunk)) {
            ++sent;
        }
        answers += statusText(client.readResponse(5000ms)) + " after " + std::to_string(sent) + " MB; ";
    }
    return answers + otherClient(target);
}

std::string manyHeaders(const Target& target) {
    const std::string field = "X-Big: " + std::string(8000, 'h') + "\r\n";
    std::string answers;
    for (int request = 0; request < 4; ++request) {
        RawConnection client(target.port);
        client.send("POST /cimom HTTP/1.1\r\nHost: 127.0.0.1\r\n" + target.authorization);
        int sent = 0;
        while (sent < 50000 && client.send(field)) {
            ++sent;
        }
        answers += statusText(client.readResponse(5000ms)) + " after " + std::to_string(sent) + " headers; ";
    }
    return answers + otherClient(target);
}

std::string pipelined(const Target& target) {
    RawConnection client(target.port);
    client.send(properRequest(target, 1) + properRequest(target, 2) + properRequest(target, 3));
    std::string answers;
    for (int id = 1; id <= 3; ++id) {
        answers += statusText(client.readResponse(5000ms)) + " ";
    }
    return "3 pipelined: " + answers;
}

std::string contentLengths(const Target& target) {
    std::string answers;
    for (const char* length : {"-1", "18446744073709551617", "10000000000"}) {
        std::string head = properRequest(target);
        head = head.substr(0, head.find("Content-Length:")) + "Content-Length: " + length + "\r\n\r\n";
        const auto start = std::chrono::steady_clock::now();
        RawConnection client(target.port);
        client.send(head);
        auto response = client.readResponse(60000ms);
        const auto ms = std::chrono::duration_cast<std::chrono::milliseconds>(std::chrono::steady_clock::now() - start);
        answers += std::string(length) + ": " + statusText(response) + " in " + std::to_string(ms.count()) + " ms; ";
    }
    return answers;
}

std::string lowerCaseScheme(const Target& target, const std::string& user, const std::string& password) {
    RawConnection client(target.port);
    client.send(orv::e2e::cimPost(orv::e2e::enumerateClassNamesBody(), "EnumerateClassNames",
                                  orv::e2e::basicAuthorizationLine(user, password, "basic")));
    return "basic scheme: " + statusText(client.readResponse(5000ms));
}

// Wrong passwords on keep-alive connections from 8 addresses for 5 s.
std::string passwordGuessing(const Target& target, const std::string& user) {
    std::atomic<long> answered{0};
    const auto end = std::chrono::steady_clock::now() + 5s;
    std::vector<std::thread> guessers;
    for (int i = 0; i < 8; ++i) {
        guessers.emplace_back([&, i] {
            const std::string request = orv::e2e::cimPost(orv::e2e::enumerateClassNamesBody(), "EnumerateClassNames",
                                                          orv::e2e::basicAuthorizationLine(user, "guess"));
            auto client = std::make_unique<RawConnection>(target.port, "127.0.3." + std::to_string(1 + i));
            while (std::chrono::steady_clock::now() < end) {
                if (!client->send(request) || !client->readResponse(10000ms)) {
                    client = std::make_unique<RawConnection>(target.port, "127.0.3." + std::to_string(1 + i));
                    continue;
                }
                ++answered;
            }
        });
    }
    std::string other = otherClient(target);
    for (auto& guesser : guessers) {
        guesser.join();
    }
    return std::to_string(answered.load()) + " wrong passwords answered in 5 s; " + other;
}

int usage() {
    std::fputs("usage: cimhost_attack --port N --attack NAME [--user U --password P]\n"
               "attacks: slow-heads-8, slow-heads-1000, idle-16, chunked-100mb, chunked-4x256mb, headers-50000,\n"
               "         pipelined, content-length, lower-case-basic, password-guessing\n",
               stderr);
    return 2;
}

}  // namespace

int main(int argc, char** argv) {
    Target target;
    std::string attack;
    std::string user;
    std::string password;
    for (int i = 1; i + 1 < argc; i += 2) {
        const std::string option = argv[i];
        const std::string value = argv[i + 1];
        if (option == "--port") {
            target.port = std::atoi(value.c_str());
        } else if (option == "--attack") {
            attack = value;
        } else if (option == "--user") {
            user = value;
        } else if (option == "--password") {
            password = value;
        } else {
            return usage();
        }
    }
    if (!user.empty()) {
        target.authorization = orv::e2e::basicAuthorizationLine(user, password);
    }
    const std::map<std::string, std::function<std::string()>> attacks = {
        {"slow-heads-8", [&] { return slowHeads(target, 8, 10); }},
        {"slow-heads-1000", [&] { return slowHeads(target, 1000, 10); }},
        {"idle-16",
         [&] {
             auto idle = openMany(target, 16, "");
             return "16 idle; " + otherClient(target);
         }},
        {"chunked-100mb", [&] { return chunkedBodies(target, 1, 100); }},
        {"chunked-4x256mb", [&] { return chunkedBodies(target, 4, 256); }},
        {"headers-50000", [&] { return manyHeaders(target); }},
        {"pipelined", [&] { return pipelined(target); }},
        {"content-length", [&] { return contentLengths(target); }},
        {"lower-case-basic", [&] { return lowerCaseScheme(target, user, password); }},
        {"password-guessing", [&] { return passwordGuessing(target, user.empty() ? "user" : user); }},
    };
    const auto found = attacks.find(attack);
    if (found == attacks.end()) {
        return usage();
    }
    std::printf("%s: %s\n", attack.c_str(), found->second().c_str());
    return 0;
}
