#include "device.h"

#include <algorithm>
#include <cctype>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <pugixml.hpp>
#include <regex>
#include <sstream>
#include <stdexcept>
#include <sys/wait.h>

namespace fs = std::filesystem;

std::string slurp(const std::string& path)
{
    std::ifstream in(path, std::ios::binary);
    std::ostringstream content;
    content << in.rdbuf();
    return content.str();
}

namespace {

const std::string kDevroot = NAS_SOURCE_DIR "/scripts/devroot";
const std::string kBuild = NAS_BUILD_DIR;
const std::string kProgram = "/var/www/cgi-bin/nas-accounts.cgi", kConfig = "/etc/NAS_CFG/config.xml";

// Runs argv on the host with only the given environment; standard input from a file,
// standard output and error into files (no pipe can fill up and block).
Reply spawn(const std::vector<std::string>& argv, const std::vector<std::string>& environment,
            std::string_view input, const std::string& scratch)
{
    std::ofstream(scratch + "/stdin", std::ios::binary) << input;
    std::string line = "exec env -i";
    for (const std::vector<std::string>* words : {&environment, &argv}) {
        for (const std::string& word : *words)
            line += " '" + std::regex_replace(word, std::regex("'"), "'\\''") + "'";
    }
    const int status = std::system((line + " <" + scratch + "/stdin >" + scratch + "/stdout 2>" + scratch + "/stderr").c_str());
    return {slurp(scratch + "/stdout"), slurp(scratch + "/stderr"), WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status)};
}

std::vector<std::string> base_environment()
{
    std::vector<std::string> env;
    for (const char* name : {"PATH", "HOME", "ASAN_OPTIONS", "UBSAN_OPTIONS", "TMPDIR"}) {
        if (const char* value = std::getenv(name))
            env.push_back(std::string(name) + "=" + value);
    }
    env.push_back("NAS_BUILD=" + kBuild);
    return env;
}

// The node of a key ("/system_mgr/nfs/enable") below the document element; `create`
// adds what is missing.
pugi::xml_node config_key(pugi::xml_document& doc, std::string_view key, bool create)
{
    pugi::xml_node node = doc.document_element();
    std::istringstream names{std::string(key.substr(1))};
    for (std::string name; node && std::getline(names, name, '/');)
        node = node.child(name.c_str()) || !create ? node.child(name.c_str()) : node.append_child(name.c_str());
    return node;
}

} // namespace

Device::Device()
{
    const fs::path base = fs::temp_directory_path() / "nas-devices";
    fs::create_directories(base);
    std::string pattern = (base / "deviceXXXXXX").string();
    if (!mkdtemp(pattern.data()))
        throw std::runtime_error("cannot make a device directory");
    m_root = pattern;
    m_scratch = m_root + ".io";
    fs::create_directories(m_scratch);
    const Reply created = spawn({kDevroot, "create", m_root}, base_environment(), "", m_scratch);
    if (created.status != 0)
        throw std::runtime_error("devroot create failed: " + created.err);
}

Device::~Device()
{
    if (!std::getenv("NAS_KEEP_DEVICES")) {
        std::error_code ignored;
        fs::remove_all(m_root, ignored);
        fs::remove_all(m_scratch, ignored);
    }
}

void Device::write_file(std::string_view device_path, std::string_view content)
{
    const fs::path path = m_root + std::string(device_path);
    fs::create_directories(path.parent_path());
    std::ofstream(path, std::ios::binary | std::ios::trunc) << content;
}

std::string Device::read_file(std::string_view device_path) const
{
    return slurp(m_root + std::string(device_path));
}

std::vector<std::string> Device::lines(std::string_view device_path) const
{
    std::vector<std::string> found;
    std::istringstream in(read_file(device_path));
    for (std::string line; std::getline(in, line);)
        found.push_back(line);
    return found;
}

bool Device::exists(std::string_view device_path) const
{
    std::error_code ignored;
    return fs::exists(fs::symlink_status(m_root + std::string(device_path), ignored));
}

void Device::remove(std::string_view device_path)
{
    std::error_code ignored;
    fs::remove_all(m_root + std::string(device_path), ignored);
}

void Device::symlink(std::string_view target, std::string_view device_path)
{
    remove(device_path);
    fs::create_symlink(std::string(target), m_root + std::string(device_path));
}

void Device::config(std::string_view key, const std::optional<std::string>& value)
{
    const std::string file = m_root + kConfig;
    pugi::xml_document doc;
    doc.load_file(file.c_str());
    if (value)
        config_key(doc, key, true).text().set(value->c_str());
    else if (pugi::xml_node node = config_key(doc, key, false))
        node.parent().remove_child(node);
    doc.save_file(file.c_str(), "\t");
}

std::string Device::config_value(std::string_view key) const
{
    const std::string file = m_root + kConfig;
    pugi::xml_document doc;
    doc.load_file(file.c_str());
    const pugi::xml_node node = config_key(doc, key, false);
    return node ? node.child_value() : "(missing)";
}

void Device::install_probe(std::string_view name)
{
    fs::copy_file(kBuild + "/" + std::string(name), m_root + "/sbin/" + std::string(name),
                  fs::copy_options::overwrite_existing);
}

Reply Device::get(std::string_view query)
{
    return run({kProgram}, {{"REQUEST_METHOD", "GET"}, {"QUERY_STRING", std::string(query)}});
}

Reply Device::post(std::string_view body, std::string_view content_type)
{
    return run({kProgram},
               {{"REQUEST_METHOD", "POST"},
                {"QUERY_STRING", ""},
                {"CONTENT_TYPE", std::string(content_type)},
                {"CONTENT_LENGTH", std::to_string(body.size())}},
               body);
}

Reply Device::run(const std::vector<std::string>& argv, const Fields& environment, std::string_view input)
{
    std::vector<std::string> command{kDevroot, "run", m_root, "--"};
    command.insert(command.end(), argv.begin(), argv.end());
    std::vector<std::string> env = base_environment();
    env.push_back("GATEWAY_INTERFACE=CGI/1.1");
    env.push_back("SCRIPT_NAME=/cgi-bin/nas-accounts.cgi");
    for (const auto& [name, value] : environment)
        env.push_back(name + "=" + value);
    return spawn(command, env, input, m_scratch);
}

Journal Device::journal() const
{
    Journal events;
    for (const std::string& line : lines("/var/log/platform.log")) {
        events.emplace_back();
        for (std::size_t begin = 0, tab = 0; tab != std::string::npos; begin = tab + 1) {
            tab = line.find('\t', begin);
            events.back().push_back(unescaped(line.substr(begin, tab - begin)));
        }
    }
    return events;
}

void Device::clear_records()
{
    for (const char* log : {"/var/log/platform.log", "/var/log/messages", "/var/log/console"})
        write_file(log, "");
}

std::string unescaped(std::string_view text)
{
    std::string out;
    for (std::size_t i = 0; i < text.size(); ++i) {
        if (text[i] != '\\' || i + 1 == text.size()) {
            out += text[i];
            continue;
        }
        const char next = text[i + 1];
        if (next == 'x' && i + 3 < text.size() && std::isxdigit(static_cast<unsigned char>(text[i + 2])) &&
            std::isxdigit(static_cast<unsigned char>(text[i + 3]))) {
            out += static_cast<char>(std::stoi(std::string(text.substr(i + 2, 2)), nullptr, 16));
            i += 3;
            continue;
        }
        const std::string_view plain = "nrt\\\"", bytes = "\n\r\t\\\"";
        const auto at = plain.find(next);
        out += at == std::string_view::npos ? std::string(1, '\\') : std::string(1, bytes[at]);
        i += at == std::string_view::npos ? 0 : 1;
    }
    return out;
}

std::string query_string(std::string_view cmd, const Fields& fields)
{
    std::string query = "cmd=" + url_encode(cmd);
    for (const auto& [name, value] : fields)
        query += "&" + url_encode(name) + "=" + url_encode(value);
    return query;
}

std::string url_encode(std::string_view value)
{
    constexpr std::string_view kHex = "0123456789ABCDEF";
    std::string encoded;
    for (const unsigned char c : value) {
        const bool plain = std::isalnum(c) || std::string_view("-_.~").find(static_cast<char>(c)) != std::string_view::npos;
        encoded += plain ? std::string(1, static_cast<char>(c)) : std::string{'%', kHex[c >> 4], kHex[c & 15]};
    }
    return encoded;
}

std::string xml_answer(std::string_view body, bool utf8)
{
    return std::string("Pragma: no-cache\r\nCache-Control: no-cache\r\nContent-Type: text/xml") +
           (utf8 ? "; charset=utf-8" : "") + "\r\n\r\n<?xml version=\"1.0\" encoding=\"UTF-8\"?>" + std::string(body);
}

Journal ran(const std::string& line)
{
    Event argv{""};
    bool quoted = false;    // the word so far had quotes, so it counts even when empty
    for (std::size_t i = 0; i < line.size() && line[i] != '>'; ++i) {
        if (line[i] == '\'' || line[i] == '"') {
            const std::size_t end = line.find(line[i], i + 1);
            argv.back() += line.substr(i + 1, end - i - 1);
            quoted = true;
            i = end;
        } else if (line[i] != ' ') {
            argv.back() += line[i] == '\\' ? line[++i] : line[i];
        } else {
            if (!argv.back().empty() || quoted)
                argv.push_back("");
            quoted = false;
        }
    }
    if (argv.back().empty() && !quoted)
        argv.pop_back();
    return {{"sh", "-c", line}, argv};
}

std::string base64(std::string_view text)
{
    constexpr std::string_view kAlphabet = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";
    std::string encoded;
    for (std::size_t i = 0; i < text.size(); i += 3) {
        const std::size_t n = std::min<std::size_t>(3, text.size() - i);
        unsigned value = 0;
        for (std::size_t j = 0; j < 3; ++j)
            value = value << 8 | (j < n ? static_cast<unsigned char>(text[i + j]) : 0u);
        for (std::size_t j = 0; j < 4; ++j)
            encoded += j <= n ? kAlphabet[(value >> (18 - 6 * j)) & 63] : '=';
    }
    return encoded;
}

std::string account_line(const Device& dev, std::string_view file, std::string_view name)
{
    for (const std::string& line : dev.lines(file)) {
        if (line.starts_with(std::string(name) + ":"))
            return line;
    }
    return "(none)";
}
