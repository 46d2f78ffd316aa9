#include "console/commands/SettingsList.h"

namespace QVSa::console {

namespace {

constexpr Setting<String> texts[] = {
    {"name", "Company", &Home::homeName, &Home::homeName},
    {"english-name", "English name", &Home::enName, &Home::enName},
    {"address", "Address", &Home::Address, &Home::Address},
    {"zip", "Zip code", &Home::zipcode, &Home::zipcode},
    {"tel", "Telephone", &Home::Tel, &Home::Tel},
    {"fax", "Fax", &Home::Fax, &Home::Fax},
    {"email", "E-mail", &Home::Email, &Home::Email},
    {"website", "Web site", &Home::website, &Home::website},
    {"bank", "Bank", &Home::bankName, &Home::bankName},
    {"bank-account", "Bank account", &Home::bankAccount, &Home::bankAccount},
    {"tax-number", "Tax number", &Home::taxNo, &Home::taxNo},
    {"person", "Person in charge", &Home::jPerson, &Home::jPerson},
    {"att-limit", "attLimit", &Home::attLimit, &Home::attLimit},
    {"login-title", "Title of the login screen", &Home::loginTitle, &Home::loginTitle},
    {"login-news", "News page of the login screen", &Home::LoginNewsUrl, &Home::LoginNewsUrl},
    {"registration-prompt", "Prompt of the registration", &Home::regPrompt, &Home::regPrompt},
    {"mail-server", "Mail server", &Home::smtpServer, &Home::smtpServer},
    {"mail-sender", "Sender", &Home::emailSender, &Home::emailSender},
    {"mail-address", "Sender's address", &Home::emailAddress, &Home::emailAddress},
    {"letter-subject", "Subject of the letters", &Home::emailSubject, &Home::emailSubject},
    {"letter", "General letter", &Home::emailContent, &Home::emailContent},
    {"letter-accepted", "Letter to those accepted", &Home::emailPContent, &Home::emailPContent},
    {"letter-refused", "Letter to those refused", &Home::emailRContent, &Home::emailRContent},
    {"directory-name", "Directory, name", &Home::ldServerName, &Home::ldServerName},
    {"directory-host", "Directory, host", &Home::ldHost, &Home::ldHost},
    {"directory-base", "Directory, base", &Home::ldBaseDN, &Home::ldBaseDN},
    {"directory-bind", "Directory, bound as", &Home::ldBindDN, &Home::ldBindDN}};

constexpr Setting<Boolean> flags[] = {
    {"outside-users", "Outside users", &Home::allowOuter, &Home::allowOuter},
    {"groups", "User groups", &Home::allowRoleGrp, &Home::allowRoleGrp},
    {"domain-users", "Users of a Windows domain", &Home::allowDomainUser, &Home::allowDomainUser},
    {"registration", "Self-registration", &Home::allowRegUser, &Home::allowRegUser},
    {"applicant-mail", "Mail to applicants", &Home::allowSendEmail, &Home::allowSendEmail},
    {"mail", "Mail by the server", &Home::allowSMTP, &Home::allowSMTP},
    {"mail-ssl", "Mail server uses SSL", &Home::smtpUseSSL, &Home::smtpUseSSL},
    {"save-password", "Clients may keep passwords", &Home::SavePwd, &Home::SavePwd},
    {"otp", "One-time passwords", &Home::useOTPAuth, &Home::useOTPAuth},
    {"sm", "SMIsOpen", &Home::SMIsOpen, &Home::SMIsOpen},
    {"directory", "Directory", &Home::ldEnabled, &Home::ldEnabled}};

constexpr Setting<Integer> shorts[] = {{"account-day", "Day of account", &Home::AcctDay, &Home::AcctDay},
                                       {"account-time", "Time of account", &Home::acctTime, &Home::acctTime},
                                       {"mail-auth", "Mail server, log-in", &Home::smtpAuth, &Home::smtpAuth}};

constexpr Setting<Long> longs[] = {{"time-out", "Time-out", &Home::timeOut, &Home::timeOut},
                                   {"mail-port", "Mail server, port", &Home::smtpPort, &Home::smtpPort}};

}  // namespace

std::span<const Setting<String>> textSettings() { return texts; }
std::span<const Setting<Boolean>> flagSettings() { return flags; }
std::span<const Setting<Integer>> shortSettings() { return shorts; }
std::span<const Setting<Long>> longSettings() { return longs; }

}  // namespace QVSa::console
