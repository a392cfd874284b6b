#include "host/catalog_url.h"

#include <algorithm>
#include <cctype>
#include <charconv>

#include "host/catalog_reader.h"

namespace zr::host {

namespace {

constexpr std::string_view kAfterScheme = "://";

int hexValue(char digit) {
    if (digit >= '0' && digit <= '9') return digit - '0';
    if (digit >= 'a' && digit <= 'f') return digit - 'a' + 10;
    if (digit >= 'A' && digit <= 'F') return digit - 'A' + 10;
    return -1;
}

std::string_view beforeHost(const std::string& authority) {
    const std::size_t at = authority.rfind('@');
    return at == std::string::npos ? std::string_view() : std::string_view(authority).substr(0, at);
}

// HOST:PORT of the authority; the host is without the brackets of an IPv6 address.
std::pair<std::string_view, std::string_view> hostAndPort(const CatalogUrl& url) {
    std::string_view rest = url.authority;
    if (const std::size_t at = rest.rfind('@'); at != rest.npos) rest.remove_prefix(at + 1);
    std::string_view host = rest;
    std::string_view port;
    if (rest.starts_with('[')) {
        const std::size_t close = rest.find(']');
        if (close == rest.npos) throw CatalogReadError(url.shown() + ": a \"]\" is missing behind the host");
        host = rest.substr(1, close - 1);
        port = rest.substr(close + 1);
    } else if (const std::size_t colon = rest.find(':'); colon != rest.npos) {
        host = rest.substr(0, colon);
        port = rest.substr(colon);
    }
    if (!port.empty() && port.front() != ':')
        throw CatalogReadError(url.shown() + ": what stands behind the host is no port");
    if (!port.empty()) port.remove_prefix(1);
    return {host, port};
}

unsigned secondsIn(const CatalogUrl& url, const char* name, const std::string& text) {
    unsigned seconds = 0;
    const auto read = std::from_chars(text.data(), text.data() + text.size(), seconds);
    constexpr unsigned kDay = 86400;
    if (read.ec != std::errc() || read.ptr != text.data() + text.size() || seconds == 0 || seconds > kDay)
        throw CatalogReadError(url.shown() + ": " + name + " has to be a number of seconds from 1 to 86400");
    return seconds;
}

bool isPassword(const std::string& parameter) {
    return parameter == "password" || parameter == "passwd" || parameter == "pwd" ||
           parameter == "sslpassword";
}

std::string placesForPasswords(const std::string& scheme) {
    if (scheme.starts_with("postgres")) return "PGPASSWORD or ~/.pgpass";
    return "MYSQL_PWD or the group [client] of ~/.my.cnf";
}

}  // namespace

bool isUrl(std::string_view word) {
    const std::size_t end = word.find(kAfterScheme);
    return end != word.npos && end > 0 &&
           std::all_of(word.begin(), word.begin() + end,
                       [](unsigned char unit) { return std::isalnum(unit) || unit == '+' || unit == '-'; });
}

std::string decodeUrl(std::string_view text) {
    std::string decoded;
    for (std::size_t at = 0; at < text.size(); ++at) {
        const int high = text[at] == '%' && at + 2 < text.size() ? hexValue(text[at + 1]) : -1;
        const int low = high >= 0 ? hexValue(text[at + 2]) : -1;
        if (low >= 0) {
            decoded += static_cast<char>(high * 16 + low);
            at += 2;
        } else {
            decoded += text[at];
        }
    }
    return decoded;
}

CatalogUrl parseUrl(std::string_view word) {
    CatalogUrl url;
    const std::size_t end = word.find(kAfterScheme);
    url.scheme = word.substr(0, end);
    for (char& unit : url.scheme) unit = static_cast<char>(std::tolower(static_cast<unsigned char>(unit)));
    std::string_view rest = word.substr(end + kAfterScheme.size());

    std::string_view parameters;
    if (const std::size_t mark = rest.find('?'); mark != rest.npos) {
        parameters = rest.substr(mark + 1);
        rest = rest.substr(0, mark);
    }
    const std::size_t slash = rest.find('/');
    url.authority = rest.substr(0, slash);
    if (slash != rest.npos) url.database = rest.substr(slash + 1);
    while (!parameters.empty()) {
        const std::string_view one = parameters.substr(0, parameters.find('&'));
        parameters.remove_prefix(std::min(one.size() + 1, parameters.size()));
        const std::size_t equals = one.find('=');
        if (equals == one.npos)
            throw CatalogReadError(url.shown() + ": \"" + std::string(one) + "\" has to be NAME=VALUE");
        url.parameters.emplace_back(one.substr(0, equals), one.substr(equals + 1));
    }

    const bool hasPassword =
        beforeHost(url.authority).find(':') != std::string_view::npos ||
        std::any_of(url.parameters.begin(), url.parameters.end(),
                    [](const auto& parameter) { return isPassword(decodeUrl(parameter.first)); });
    if (hasPassword)
        throw CatalogReadError(
            url.shown() + ": a password may not stand in the address, where others see it; put it into " +
            placesForPasswords(url.scheme));
    return url;
}

std::optional<std::string> CatalogUrl::take(std::string_view name) {
    std::optional<std::string> value;
    std::erase_if(parameters, [&](const auto& parameter) {
        if (decodeUrl(parameter.first) != name) return false;
        value = decodeUrl(parameter.second);
        return true;
    });
    return value;
}

std::string CatalogUrl::user() const {
    return decodeUrl(beforeHost(authority));
}

std::string CatalogUrl::host() const {
    return decodeUrl(hostAndPort(*this).first);
}

unsigned CatalogUrl::port() const {
    const std::string_view text = hostAndPort(*this).second;
    unsigned number = 0;
    const auto read = std::from_chars(text.data(), text.data() + text.size(), number);
    if (!text.empty() && (read.ec != std::errc() || read.ptr != text.data() + text.size() || number > 65535))
        throw CatalogReadError(shown() + ": \"" + std::string(text) + "\" is no port");
    return number;
}

std::string CatalogUrl::shown() const {
    // What stands between a colon and the host is a password, in an address that is about to be refused.
    const std::string_view user = beforeHost(authority);
    std::string text = scheme + std::string(kAfterScheme) + std::string(user.substr(0, user.find(':')));
    text += user.empty() ? authority : authority.substr(user.size());
    return database.empty() ? text : text + "/" + database;
}

std::string CatalogUrl::text() const {
    std::string text = scheme + std::string(kAfterScheme) + authority + "/" + database;
    char before = '?';
    for (const auto& [name, value] : parameters) {
        text.append(1, before).append(name).append("=").append(value);
        before = '&';
    }
    return text;
}

ServerSettings takeSettings(CatalogUrl& url, const CString& schema) {
    ServerSettings settings;
    settings.schema = schema.toUtf8();
    if (const auto named = url.take("schema")) {
        if (!settings.schema.empty() && settings.schema != *named)
            throw CatalogReadError(url.shown() + ": the address names the schema " + *named +
                                   ", and the schema " + settings.schema + " is asked for");
        settings.schema = *named;
    }
    if (const auto seconds = url.take("connect_timeout")) {
        settings.connectSeconds = secondsIn(url, "connect_timeout", *seconds);
        settings.tellsConnectSeconds = true;
    }
    if (const auto seconds = url.take("statement_timeout"))
        settings.statementSeconds = secondsIn(url, "statement_timeout", *seconds);
    settings.lockSeconds = std::min(settings.lockSeconds, settings.statementSeconds);
    return settings;
}

}  // namespace zr::host
