#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "zrparsersql/wide_string.h"

namespace zr::host {

// The address of a database on a server, SCHEME://USER@HOST:PORT/DATABASE?NAME=VALUE&...
struct CatalogUrl {
    std::string scheme;
    std::string authority;                                        // USER@HOST:PORT as it stands
    std::string database;                                         // as it stands
    std::vector<std::pair<std::string, std::string>> parameters;  // as they stand

    // Takes a parameter out; its value is decoded.
    std::optional<std::string> take(std::string_view name);
    // The parts of the authority, decoded; the port is 0 where none stands. Raises CatalogReadError.
    std::string user() const;
    std::string host() const;
    unsigned port() const;
    // Without parameters, to begin a message with.
    std::string shown() const;
    // Whole again, with the parameters that are left.
    std::string text() const;
};

// Whether a word is meant as such an address and not as a file's name.
bool isUrl(std::string_view word);

// Raises CatalogReadError, also for an address with a password in it: other users of the machine see the
// words of a command line, and shells keep them.
CatalogUrl parseUrl(std::string_view word);

// "%40" is "@".
std::string decodeUrl(std::string_view text);

// How a server is read, as the address says.
struct ServerSettings {
    std::string schema;  // empty: all but the server's own
    unsigned connectSeconds = 10;
    bool tellsConnectSeconds = false;
    unsigned statementSeconds = 60;
    unsigned lockSeconds = 5;
};

// Takes the parameters schema, connect_timeout and statement_timeout out of the address; a schema that is
// asked for besides has to be the same. Raises CatalogReadError.
ServerSettings takeSettings(CatalogUrl& url, const CString& schema = {});

}  // namespace zr::host
