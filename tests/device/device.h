// A fresh simulated device per test case, and the real built program run inside it.
//
//   Device dev;                                   // a new device root from the default image
//   dev.config({{"/system_mgr/nfs/enable", "0"}}); // config keys that differ from the default
//   dev.write_file("/etc/shared_name", "...");    // device files that differ
//   EXPECT_EQ(dev.request("cgi_get_service_info"), xml_answer("<service>...</service>"));
//   EXPECT_EQ(dev.journal(), (Journal{{"smbcom"}, ...}));
#pragma once

#include <initializer_list>
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

    // The device's root directory on the host, and a device path's place on the host.
    const std::string& root() const { return m_root; }
    std::string host_path(std::string_view device_path) const;

    void write_file(std::string_view device_path, std::string_view content);
    std::string read_file(std::string_view device_path) const;
    bool exists(std::string_view device_path) const;
    void remove(std::string_view device_path);
    void symlink(std::string_view target, std::string_view device_path);

    // Sets config-store keys ("/system_mgr/nfs/enable") in the device's config.xml.
    void config(std::initializer_list<std::pair<std::string, std::string>> keys);
    void remove_config(std::string_view key);
    // The key's text; "(missing)" when the store has no such key.
    std::string config_value(std::string_view key) const;

    // Copies a probe program of the build into the device's /sbin, to run it with run().
    void install_probe(std::string_view name);

    // Turns the developer trace on ("/tmp/cgi_debug").
    void trace_on();

    // GET /cgi-bin/nas-accounts.cgi?cmd=CMD&FIELDS: the answer bytes.
    std::string request(std::string_view cmd, const Fields& fields = {});
    // A GET with a raw query string, and a POST with a raw body and content type.
    Reply get_raw(std::string_view query);
    Reply post_raw(std::string_view body, std::string_view content_type, std::string_view query = "");
    // Any command inside the device, with extra environment variables and standard input.
    Reply run(const std::vector<std::string>& argv, const Fields& environment = {}, std::string_view input = "");

    // What the device did: the journal, the system log lines, the console trace.
    Journal journal() const;
    std::vector<std::string> messages() const;
    std::string console() const;
    // Forgets what the device recorded so far (after setting a case up through the program).
    void clear_records();

private:
    std::string m_root;
    std::string m_scratch;   // the program's standard streams, beside the device
};

// Percent-encodes a form value (everything but letters, digits and -_.~).
std::string url_encode(std::string_view value);
// "cmd=CMD&NAME=VALUE...", encoded.
std::string query_string(std::string_view cmd, const Fields& fields);

// The full answers of the shared shapes.
std::string xml_answer(std::string_view body);          // no-cache, text/xml, prologue, body
std::string xml_utf8_answer(std::string_view body);     // the same with charset=utf-8
inline const std::string kEmptyHtml = "Content-Type: text/html\r\n\r\n";

// The command lines the program handed to the shell, in order.
std::vector<std::string> shell_lines(const Journal& journal);
