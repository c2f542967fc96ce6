// A fresh simulated device per test, the real built program run inside it, and the
// shapes the tests compare its answers and journal with.
//
//   Device dev;                                          // a new device root from the default image
//   dev.config("/system_mgr/nfs/enable", "0");           // config keys that differ from the default
//   dev.write_file("/etc/shared_name", "...");           // device files that differ
//   EXPECT_EQ(dev.get(query_string("cgi_get_service_info")).out, xml_answer("<service>...</service>"));
//   EXPECT_EQ(dev.journal(), (Journal{{"smbcom"}, ...}));
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

using Fields = std::vector<std::pair<std::string, std::string>>;

// One journal event: its name and its arguments, as the device recorded it.
using Event = std::vector<std::string>;
using Journal = std::vector<Event>;

struct Reply {
    std::string out;        // everything the program wrote to standard output
    std::string err;        // standard error
    int status = -1;        // the exit status devroot run reported
};

class Device {
public:
    Device();
    ~Device();
    Device(const Device&) = delete;
    Device& operator=(const Device&) = delete;

    // The device's root directory on the host.
    const std::string& root() const { return m_root; }

    void write_file(std::string_view device_path, std::string_view content);
    std::string read_file(std::string_view device_path) const;
    std::vector<std::string> lines(std::string_view device_path) const;
    bool exists(std::string_view device_path) const;
    void remove(std::string_view device_path);
    void symlink(std::string_view target, std::string_view device_path);

    // Sets a config-store key ("/system_mgr/nfs/enable") in config.xml; removes it without a value.
    void config(std::string_view key, const std::optional<std::string>& value);
    // The key's text; "(missing)" when the store has no such key.
    std::string config_value(std::string_view key) const;

    // Copies a probe program of the build into the device's /sbin, to run it with run().
    void install_probe(std::string_view name);

    // The program on a GET with this query string, or on a POST with this body.
    Reply get(std::string_view query);
    Reply post(std::string_view body, std::string_view content_type = "application/x-www-form-urlencoded");
    // Any command inside the device, with extra environment variables and standard input.
    Reply run(const std::vector<std::string>& argv, const Fields& environment = {}, std::string_view input = "");

    // What the device did (the system log is lines("/var/log/messages")); clear_records()
    // forgets it, the console trace too.
    Journal journal() const;
    void clear_records();

private:
    std::string m_root;
    std::string m_scratch;   // the program's standard streams, beside the device
};

// Percent-encodes a form value (everything but letters, digits and -_.~).
std::string url_encode(std::string_view value);
// "cmd=CMD&NAME=VALUE...", encoded.
std::string query_string(std::string_view cmd, const Fields& fields = {});

// The full answer of the XML shape: no-cache, text/xml (with charset=utf-8), prologue, body.
std::string xml_answer(std::string_view body, bool utf8 = false);
inline const std::string kEmptyHtml = "Content-Type: text/html\r\n\r\n";

// A foreground command line and the tool event the shell makes of it: words split at
// blanks, quotes removed ('\'' is a quote inside a word), redirections from ">" on dropped.
Journal ran(const std::string& line);
// The escapes \n \r \t \\ \" and \xHH as their bytes; other backslashes stay.
std::string unescaped(std::string_view text);
// A host file's whole content ("" when there is none).
std::string slurp(const std::string& path);
// Base64 as the pages send passwords.
std::string base64(std::string_view text);
// The line of a colon file (passwd, group, shadow) for `name`, or "(none)".
std::string account_line(const Device& dev, std::string_view file, std::string_view name);
