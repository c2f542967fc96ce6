// The runner of the device cases in tests/device/cases/*.cases: each case is a test of
// its own, on a fresh device. A case file is lines; "#" starts a comment line.
//
//   case NAME               a new case (NAME: letters, digits, _), on a fresh device
//   let NAME TEXT           from here on, ${NAME} in the file's lines stands for TEXT;
//                           "let NAME*N TEXT" for TEXT N times over
//   block NAME ... end      lines that "@NAME ARG..." stands for, ${1} to ${9} its ARGs
//
// Setting the device up, before a request or between two:
//   file PATH TEXT          a device file's content        rm PATH       removes one
//   append PATH TEXT        TEXT added at a device file's end
//   config KEY [VALUE]      a config-store key; without a value the key is removed
//   volumes NAME            the volume table (one, two, four, usb, none) and its disks
//   link PATH TARGET        a symbolic link
// A file whose TEXT begins with "#!" is executable; /tmp/cgi_debug turns the trace on.
//
// A request, then what it must do (everything not listed must not have happened):
//   get CMD FIELD=VALUE...  a GET; "post" the same url-encoded; VALUE b64:TEXT is base64
//   raw QUERY               a GET with its raw query string
//   body TYPE BODY          a POST with a raw body of that type ("TYPE" if it has blanks)
//   run ARG...              a command inside the device, its output the answer; a
//                           first word without "/" is a probe of the build
//   xml BODY                the answer: no-cache headers, text/xml, prologue, BODY;
//                           "utf8 BODY" with charset=utf-8; "html" the empty page;
//                           "answer BYTES" exactly
//   $ LINE                  a command line handed to the shell, and the tool event
//                           the shell makes of it (words split, quotes removed)
//   - NAME ARG...           one platform call or tool event of the journal; {A,B,...}
//                           in a word makes one event per item, in that order
//   journal any             the journal not checked; "without NAME..." drops events
//                           (background tools) before comparing
//   log TEXT                a system log line ("<14>SYSTEM: ..."); "log any" not checked
//   console TEXT            the developer trace's text
//   is PATH TEXT            a device file's content afterwards ("is PATH" alone: gone)
//   has PATH TEXT           ... contains TEXT;  lacks PATH TEXT   ... does not
//   same PATH               a device file as in the default image
//   line FILE NAME TEXT     an account file's line for NAME ("(none)": no such line)
//   key KEY VALUE           a config key afterwards ("(missing)": no such key)
//
// Words (fields, "-" events) are split at blanks; "..." groups a word and "" is an
// empty one. TEXT, BODY and LINE run to the end of the line. Everywhere the escapes
// \n \r \t \\ \" and \xHH stand for their bytes; other backslashes are themselves.
#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <map>
#include <set>
#include <sstream>

#include "device.h"

namespace fs = std::filesystem;

namespace {

struct Line {
    int number;
    std::string text;
};

struct Case {
    std::string file, name;
    std::vector<Line> lines;
};

void PrintTo(const Case& c, std::ostream* out)
{
    *out << c.file << ".cases " << c.name;
}

// Words at blanks; "..." groups (escapes inside and out).
std::vector<std::string> words(std::string_view text)
{
    std::vector<std::string> found;
    std::string raw;
    bool in_word = false, quoted = false;
    for (std::size_t i = 0; i < text.size(); ++i) {
        const char c = text[i];
        if (c == '\\' && i + 1 < text.size()) {
            raw += c;
            raw += text[++i];
            in_word = true;
        } else if (c == '"') {
            quoted = !quoted;
            in_word = true;
        } else if (c == ' ' && !quoted) {
            if (in_word)
                found.push_back(unescaped(raw));
            raw.clear();
            in_word = false;
        } else {
            raw += c;
            in_word = true;
        }
    }
    if (in_word)
        found.push_back(unescaped(raw));
    return found;
}

std::string replaced(std::string text, const std::map<std::string, std::string>& names)
{
    for (std::size_t at = text.find("${"); at != std::string::npos; at = text.find("${", at)) {
        const std::size_t end = text.find('}', at);
        const auto it = end == std::string::npos ? names.end() : names.find(text.substr(at + 2, end - at - 2));
        if (it == names.end()) {
            at += 2;
            continue;
        }
        text.replace(at, end - at + 1, it->second);
        at += it->second.size();
    }
    return text;
}

std::pair<std::string, std::string> split_first(const std::string& text)
{
    const auto blank = text.find(' ');
    if (blank == std::string::npos)
        return {text, ""};
    return {text.substr(0, blank), text.substr(blank + 1)};
}

// "@NAME ARG..." as the block's lines, blocks inside it expanded too.
void expand(const std::string& call, int number, const std::map<std::string, std::vector<std::string>>& blocks,
            const std::map<std::string, std::string>& names, std::vector<Line>& lines)
{
    const auto [head, rest] = split_first(call);
    std::map<std::string, std::string> args;
    const auto values = words(rest);
    for (std::size_t i = 0; i < values.size(); ++i)
        args[std::to_string(i + 1)] = values[i];
    for (const std::string& line : blocks.at(head.substr(1))) {
        const std::string text = replaced(replaced(line, args), names);
        if (text.starts_with("@"))
            expand(text, number, blocks, names, lines);
        else
            lines.push_back({number, text});
    }
}

// Adds the cases of one file.
void load(const fs::path& path, std::vector<Case>& cases)
{
    std::ifstream in(path);
    const std::size_t first = cases.size();
    std::map<std::string, std::string> names;
    std::map<std::string, std::vector<std::string>> blocks;
    std::string text, open_block;
    for (int number = 1; std::getline(in, text); ++number) {
        if (text.empty() || text[0] == '#')
            continue;
        if (!open_block.empty()) {
            if (text == "end")
                open_block.clear();
            else
                blocks[open_block].push_back(text);
            continue;
        }
        text = replaced(text, names);
        const auto [head, rest] = split_first(text);
        if (head == "let") {
            const auto [name, value] = split_first(rest);
            const auto star = name.find('*');
            std::string repeated;
            for (int n = star == std::string::npos ? 1 : std::stoi(name.substr(star + 1)); n > 0; --n)
                repeated += value;
            names[name.substr(0, star)] = repeated;
        } else if (head == "block") {
            open_block = rest;
            blocks[rest].clear();
        } else if (head == "case") {
            cases.push_back({path.stem().string(), rest, {}});
        } else if (cases.size() == first) {
            throw std::runtime_error(path.string() + ":" + std::to_string(number) + ": a line before the first case");
        } else if (head[0] == '@') {
            expand(text, number, blocks, names, cases.back().lines);
        } else {
            cases.back().lines.push_back({number, text});
        }
    }
}

std::vector<Case> all_cases()
{
    std::vector<Case> cases;
    for (const fs::path& file : std::set<fs::path>(fs::directory_iterator(NAS_SOURCE_DIR "/tests/device/cases"), fs::directory_iterator()))
        load(file, cases);
    return cases;
}

Fields form_fields(const std::vector<std::string>& items)
{
    Fields fields;
    for (const std::string& item : items) {
        const auto eq = item.find('=');
        std::string value = eq == std::string::npos ? "" : item.substr(eq + 1);
        if (value.starts_with("b64:"))
            value = base64(value.substr(4));
        fields.emplace_back(item.substr(0, eq), value);
    }
    return fields;
}

// The events of a "-" line: one per item of its word's {A,B,...}, or just the one.
void add_events(Journal& journal, const Event& event)
{
    for (std::size_t i = 0; i < event.size(); ++i) {
        const std::size_t open = event[i].find('{'), close = event[i].find('}');
        if (open == std::string::npos || close == std::string::npos || close < open)
            continue;
        std::istringstream items(event[i].substr(open + 1, close - open - 1));
        for (std::string item; std::getline(items, item, ',');) {
            Event one = event;
            one[i] = event[i].substr(0, open) + item + event[i].substr(close + 1);
            journal.push_back(one);
        }
        return;
    }
    journal.push_back(event);
}

// One request's expectations, checked when the next request, setup or the case's end comes.
struct Pending {
    int line = 0;
    std::optional<std::string> answer;     // nullopt: not given
    bool journal_any = false, log_any = false;
    Reply reply;
    Journal journal;
    std::vector<std::string> drop;
    std::vector<std::string> log;
    std::string console;
};

class CaseRun {
public:
    explicit CaseRun(const Case& c) : m_case(c) {}

    void run()
    {
        for (std::size_t i = 0; i < m_case.lines.size(); ++i) {
            m_where = m_case.file + ".cases:" + std::to_string(m_case.lines[i].number);
            step(m_case.lines[i].text);
        }
        settle();
    }

private:
    static bool is_request(const std::string& text)
    {
        static const std::set<std::string> heads = {"get", "post", "raw", "body", "run"};
        return heads.count(split_first(text).first) > 0;
    }
    static bool is_setup(const std::string& text)
    {
        static const std::set<std::string> heads = {"file", "append", "rm", "config", "volumes", "link"};
        return heads.count(split_first(text).first) > 0;
    }

    void step(const std::string& text)
    {
        const auto [head, rest] = split_first(text);
        const std::string arg = unescaped(rest);
        if (is_request(text)) {
            settle();
            m_pending.emplace();
            m_pending->line = std::stoi(m_where.substr(m_where.rfind(':') + 1));
            const auto items = words(rest);
            m_dev.clear_records();
            const std::string query =
                head == "get" || head == "post" ? query_string(items.at(0), form_fields({items.begin() + 1, items.end()})) : "";
            std::vector<std::string> argv = items;
            if (head == "run" && argv.at(0).find('/') == std::string::npos) {
                m_dev.install_probe(argv[0]);
                argv[0] = "/sbin/" + argv[0];
            }
            m_pending->reply = head == "run"    ? m_dev.run(argv)
                                : head == "get"  ? m_dev.get(query)
                                : head == "post" ? m_dev.post(query)
                                : head == "raw"  ? m_dev.get(arg)
                                                 : m_dev.post(unescaped(rest.substr(rest.find(' ', rest[0] == '"' ? rest.find('"', 1) : 0) + 1)), items.at(0));
        } else if (is_setup(text)) {
            settle();
            setup(head, rest);
        } else if (!m_pending) {
            ADD_FAILURE() << m_where << ": an expectation before any request: " << text;
        } else {
            expect(head, rest, arg);
        }
    }

    void setup(const std::string& head, const std::string& rest)
    {
        const auto [first, second] = split_first(rest);
        if (head == "append") {
            m_dev.write_file(first, m_dev.read_file(first) + unescaped(second));
        } else if (head == "file") {
            m_dev.remove(first);
            m_dev.write_file(first, unescaped(second));
            if (second.starts_with("#!"))
                fs::permissions(m_dev.root() + first, fs::perms(0755));
        } else if (head == "rm") {
            m_dev.remove(rest);
        } else if (head == "config") {
            m_dev.config(first, rest.find(' ') == std::string::npos ? std::nullopt : std::optional(unescaped(second)));
        } else if (head == "link") {
            m_dev.symlink(second, first);
        } else {
            // Disks of 1877538, 937795, 4096 and 2048 megabytes for HD_a2 to HD_d2.
            static const std::map<std::string, std::string> tables = {
                {"one", "Volume_1 = HD_a2\n"},
                {"two", "Volume_1 = HD_a2\nVolume_2 = HD_b2\n"},
                {"four", "Volume_1 = HD_a2\nVolume_2 = HD_b2\nVolume_3 = HD_c2\nVolume_4 = HD_d2\n"},
                {"usb", "Volume_1 = HD_a2\nUSB_1 = sdc1\nVolume_2 = HD_b2\n"}};
            m_dev.remove("/etc/shared_name");
            if (rest != "none")
                m_dev.write_file("/etc/shared_name", tables.count(rest) ? tables.at(rest) : unescaped(rest));
            m_dev.write_file("/sim/disks", "/mnt/HD/HD_a2 1922599448 48211960 1874387488\n/mnt/HD/HD_b2 960302096 "
                                           "1048576 959253520\n/mnt/HD/HD_c2 4194304 0 4194304\n/mnt/HD/HD_d2 2097152 0 2097152\n");
        }
    }

    void expect(const std::string& head, const std::string& rest, const std::string& arg)
    {
        Pending& p = *m_pending;
        const auto [first, second] = split_first(rest);
        if (head == "xml")
            p.answer = xml_answer(arg);
        else if (head == "utf8")
            p.answer = xml_answer(arg, true);
        else if (head == "html")
            p.answer = kEmptyHtml;
        else if (head == "answer")
            p.answer = arg;
        else if (head == "$")
            for (const Event& event : ran(arg))
                p.journal.push_back(event);
        else if (head == "-")
            add_events(p.journal, words(rest));
        else if (head == "journal")
            p.journal_any = true;
        else if (head == "without")
            p.drop = words(rest);
        else if (head == "log" && rest == "any")
            p.log_any = true;
        else if (head == "log")
            p.log.push_back(arg);
        else if (head == "console")
            p.console += arg;
        else if (head == "is" && second.empty() && rest.find(' ') == std::string::npos)
            EXPECT_FALSE(m_dev.exists(first)) << m_where << ": " << first << " is still there";
        else if (head == "is")
            EXPECT_EQ(m_dev.read_file(first), unescaped(second)) << m_where;
        else if (head == "has")
            EXPECT_NE(m_dev.read_file(first).find(unescaped(second)), std::string::npos)
                << m_where << ": " << first << " holds:\n" << m_dev.read_file(first);
        else if (head == "lacks")
            EXPECT_EQ(m_dev.read_file(first).find(unescaped(second)), std::string::npos)
                << m_where << ": " << first << " holds:\n" << m_dev.read_file(first);
        else if (head == "line") {
            const auto [name, line] = split_first(second);
            EXPECT_EQ(account_line(m_dev, first, name), unescaped(line)) << m_where;
        } else if (head == "same")
            EXPECT_EQ(m_dev.read_file(rest), slurp(NAS_SOURCE_DIR "/sim/image" + rest)) << m_where << ": " << rest << " changed";
        else if (head == "key")
            EXPECT_EQ(m_dev.config_value(first), unescaped(second)) << m_where;
        else
            ADD_FAILURE() << m_where << ": what is \"" << head << "\"?";
    }

    // Checks the last request's answer and records against what its lines expect.
    void settle()
    {
        if (!m_pending)
            return;
        const Pending& p = *m_pending;
        const std::string where = m_case.file + ".cases:" + std::to_string(p.line);
        EXPECT_EQ(p.reply.status, 0) << where << ": the program ended badly:\n" << p.reply.err;
        if (p.answer)
            EXPECT_EQ(p.reply.out, *p.answer) << where;
        else
            ADD_FAILURE() << where << ": the request has no expected answer; it answered:\n" << p.reply.out;
        if (!p.journal_any) {
            const Journal got = m_dev.journal();
            Journal kept;
            for (const Event& event : got) {
                if (std::find(p.drop.begin(), p.drop.end(), event.at(0)) == p.drop.end())
                    kept.push_back(event);
            }
            EXPECT_EQ(kept, p.journal) << where;
        }
        if (!p.log_any) {
            EXPECT_EQ(m_dev.lines("/var/log/messages"), p.log) << where;
        }
        EXPECT_EQ(m_dev.read_file("/var/log/console"), p.console) << where;
        m_pending.reset();
    }

    const Case& m_case;
    Device m_dev;
    std::optional<Pending> m_pending;
    std::string m_where;
};

class DeviceCase : public testing::TestWithParam<Case> {};

} // namespace

TEST_P(DeviceCase, Runs)
{
    CaseRun(GetParam()).run();
}

INSTANTIATE_TEST_SUITE_P(Cases, DeviceCase, testing::ValuesIn(all_cases()),
                         [](const testing::TestParamInfo<Case>& info) { return info.param.file + "_" + info.param.name; });
