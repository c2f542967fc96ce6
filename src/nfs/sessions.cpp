// The per-share overview: which file services are on, and for every share its name,
// its path and the NFS rule that "/etc/exports" holds for it.
#include <algorithm>
#include <cstdio>
#include <cstring>
#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

#include "cgi/fixed_text.h"
#include "cgi/handlers.h"
#include "cgi/response.h"
#include "cgi/trace.h"
#include "nfs/canonical_paths.h"
#include "nfs/exports_parser.h"
#include "platform/cgic.h"
#include "platform/config_store.h"
#include "platform/samba.h"

namespace {

// The text a rule is compared as: a rule whose path resolves is compared as the first
// 8 characters of its canonical path ("/mnt/HD/" for a hard-disk share), so the
// share-link lines the engine writes match no share; only a rule whose written path
// does not resolve and equals the share path reports a rule. The page has always been
// answered this way, so the 8-character copy stays.
std::string compared_text(const exports_entry& record, CanonicalPaths& resolved_paths)
{
    if (const auto& resolved = resolved_paths.of(std::string(record.volume.view())))
        return std::string(std::string_view(*resolved).substr(0, 8));
    return std::string(record.volume.view());
}

struct RuleTexts {
    FixedText<8> root_squash;
    FixedText<8> write;
    FixedText<64> host;
};

void report_rule(const exports_entry& record, RuleTexts& texts)
{
    texts.root_squash.assign(record.root_squash == 1 ? "Yes" : "No");
    texts.write.assign(record.rw == 1 ? "Yes" : "No");
    texts.host.assign(record.ip.view());
}

// Whether a rule can be found by one of the share paths: only through its written text
// (when that does not resolve) or, when it resolves, through the 8 characters it is
// then compared as. A rule that can be found by neither need not be resolved at all:
// its links are not read.
class SharePaths {
public:
    explicit SharePaths(const share_info* shares)
    {
        for (const share_info* share = shares; share != nullptr; share = share->next) {
            m_paths.emplace_back(share->path);
            if (m_paths.back().size() <= 8)
                m_has_short_path = true;
        }
        std::sort(m_paths.begin(), m_paths.end());
    }

    bool can_find(const exports_entry& record) const
    {
        return m_has_short_path || std::binary_search(m_paths.begin(), m_paths.end(), record.volume.view());
    }

private:
    std::vector<std::string_view> m_paths;     // into the share records, sorted
    bool m_has_short_path = false;
};

// "/etc/exports" as every share's look-up sees it. Without the debug trace the file is
// parsed once per request and its rules are found by their compared text; with the
// trace each look-up parses the file and examines every rule again, so that the trace
// tells the same story per share as it always has.
class ExportRules {
public:
    ExportRules(bool tracing, const share_info* shares) : m_tracing(tracing)
    {
        if (m_tracing)
            return;
        m_list = load_exports_config("/etc/exports");
        if (!m_list)
            return;
        m_records = count_records(m_list);
        if (m_records < 2)
            return;
        // The last rule of a text wins, as the examination in file order leaves it.
        const SharePaths share_paths(shares);
        for (const exports_entry* record = m_list->next.get(); record != nullptr; record = record->next.get()) {
            if (share_paths.can_find(*record))
                m_last_of[compared_text(*record, m_resolved_paths)] = record;
        }
    }

    // 1 when "/etc/exports" holds a rule for the share path (the last matching rule
    // wins), else 0. The host text is written only on a match.
    int lookup(const char* share_path, RuleTexts& texts)
    {
        texts.root_squash.clear();
        texts.write.clear();
        if (m_tracing)
            return traced_lookup(share_path, texts);
        if (!m_list || m_records == 0)
            return 0;
        if (m_records == 1)
            return single_rule(*m_list->next, share_path, texts);
        const auto found = m_last_of.find(share_path);
        if (found == m_last_of.end())
            return 0;
        report_rule(*found->second, texts);
        return 1;
    }

private:
    int single_rule(const exports_entry& record, const char* share_path, RuleTexts& texts)
    {
        // A file of one unparsable line (or of one line without its newline): the
        // message goes to standard output, which is the answer, in the middle of the
        // share's nfs element. The page has always received it there, so it stays.
        if (record.volume.empty()) {
            std::puts("Nothing to show.");
            return 0;
        }
        if (compared_text(record, m_resolved_paths) != share_path)
            return 0;
        report_rule(record, texts);
        return 1;
    }

    int traced_lookup(const char* share_path, RuleTexts& texts)
    {
        const ExportsList list = load_exports_config("/etc/exports");
        if (!list || !list->next)
            return 0;
        if (!list->next->next)
            return single_rule(*list->next, share_path, texts);
        int found = 0;
        for (const exports_entry* record = list->next.get(); record != nullptr; record = record->next.get()) {
            printf_out("path=%s\n", share_path);
            printf_out("current->volume=%s\n", record->volume.c_str());
            if (compared_text(*record, m_resolved_paths) == share_path) {
                report_rule(*record, texts);
                found = 1;
            }
        }
        return found;
    }

    bool m_tracing;
    ExportsList m_list;
    int m_records = 0;
    // Resolved once per request: a path resolves the same way throughout it.
    CanonicalPaths m_resolved_paths;
    std::unordered_map<std::string, const exports_entry*> m_last_of;
};

} // namespace

void cgi_get_all_session()
{
    get_samba_info2();

    write_xml_header(Charset::Plain);
    write_xml_prologue();
    out("<session>");

    // The switch texts are written as stored, not escaped.
    FixedText<8> ftp;
    xml_get_str("/app_mgr/ftp/setting/state", ftp.size(), ftp.data());
    out("<ftp>%s</ftp>", ftp.c_str());
    FixedText<8> nfs;
    xml_get_str("/system_mgr/nfs/enable", nfs.size(), nfs.data());
    out("<nfs_server>%s</nfs_server>", nfs.c_str());
    FixedText<8> media;
    xml_get_str("/app_mgr/upnpavserver/enable", media.size(), media.data());
    out("<media_serving>%s</media_serving>", media.c_str());
    out("<webdav_server>%d</webdav_server>", xml_get_int("/system_mgr/webdav/enable") == 1 ? 1 : 0);

    ExportRules rules(trace_enabled(), pss);
    int total = 0;
    for (const share_info* share = pss; share != nullptr; share = share->next) {
        out("<share><name>");
        cgiHtmlEscape(share->name);
        out("</name><path>");
        cgiHtmlEscape(share->path);
        out("</path><nfs>");

        RuleTexts texts;
        if (rules.lookup(share->path, texts) == 1) {
            out("<status>1</status><real_path>");
            cgiHtmlEscape(share->path);
            out("</real_path><root_squash>%s</root_squash><write>%s</write><host>", texts.root_squash.c_str(),
                texts.write.c_str());
            cgiHtmlEscape(texts.host.c_str());
            out("</host>");
        } else {
            out("<status>0</status><real_path>");
            cgiHtmlEscape(share->path);
            out("</real_path><host></host>");
        }
        out("</nfs></share>\n");
        ++total;
    }

    out("<total>%d</total></session>\n", total);
    Free_All_List();
}
