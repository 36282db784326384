#include "orv/http/pam_authentication.hpp"

#include <security/pam_appl.h>

#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <memory>
#include <stdexcept>

namespace orv::http {

namespace {

struct LoginAnswers {
    std::string user;
    std::string password;
};

// strdup that PAM may free(); nullptr when out of memory.
char* copyForPam(const std::string& text) {
    return strdup(text.c_str());
}

// Answers the modules' prompts: the password to a hidden prompt, the user name to a visible
// one; messages for a terminal are acknowledged without an answer.
int converse(int count, const struct pam_message** messages, struct pam_response** responses, void* data) {
    if (count <= 0 || count > PAM_MAX_NUM_MSG) {
        return PAM_CONV_ERR;
    }
    const auto* answers = static_cast<const LoginAnswers*>(data);
    auto* replies = static_cast<pam_response*>(calloc(static_cast<std::size_t>(count), sizeof(pam_response)));
    if (replies == nullptr) {
        return PAM_BUF_ERR;
    }
    for (int i = 0; i < count; ++i) {
        const int style = messages[i]->msg_style;
        if (style == PAM_PROMPT_ECHO_OFF || style == PAM_PROMPT_ECHO_ON) {
            replies[i].resp = copyForPam(style == PAM_PROMPT_ECHO_OFF ? answers->password : answers->user);
            if (replies[i].resp == nullptr) {
                for (int j = 0; j < i; ++j) {
                    free(replies[j].resp);
                }
                free(replies);
                return PAM_BUF_ERR;
            }
        }
    }
    *responses = replies;
    return PAM_SUCCESS;
}

// The server delays repeated failures per client address itself; the modules' own delay
// (two seconds after a wrong password with pam_unix) would hold a worker instead.
void noFailDelay(int, unsigned, void*) {}

bool serviceFileExists(const std::string& service) {
    for (const char* dir : {"/etc/pam.d", "/usr/lib/pam.d"}) {
        std::error_code ignored;
        if (std::filesystem::is_regular_file(std::filesystem::path(dir) / service, ignored)) {
            return true;
        }
    }
    return false;
}

}  // namespace

PamAuthentication::PamAuthentication(std::string service) : service_(std::move(service)) {
    if (service_.empty() || service_.find('/') != std::string::npos || !serviceFileExists(service_)) {
        throw std::runtime_error("PAM service '" + service_ + "' has no file in /etc/pam.d");
    }
}

bool PamAuthentication::check(std::string_view user, std::string_view password) const {
    if (user.empty() || user.find('\0') != std::string_view::npos || password.find('\0') != std::string_view::npos) {
        return false;
    }
    LoginAnswers answers{std::string(user), std::string(password)};
    const pam_conv conversation{converse, &answers};
    pam_handle_t* handle = nullptr;
    if (pam_start(service_.c_str(), answers.user.c_str(), &conversation, &handle) != PAM_SUCCESS) {
        return false;
    }
    int status = pam_set_item(handle, PAM_FAIL_DELAY, reinterpret_cast<const void*>(&noFailDelay));
    if (status == PAM_SUCCESS) {
        status = pam_authenticate(handle, PAM_SILENT | PAM_DISALLOW_NULL_AUTHTOK);
    }
    if (status == PAM_SUCCESS) {
        status = pam_acct_mgmt(handle, PAM_SILENT | PAM_DISALLOW_NULL_AUTHTOK);
    }
    pam_end(handle, status);
    return status == PAM_SUCCESS;
}

}  // namespace orv::http
