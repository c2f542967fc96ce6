// The per-share overview: which file services are on, and for every share its name,
// its path and the NFS rule that "/etc/exports" holds for it.
#include <cstdio>
#include <cstring>
#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>

#include "cgi/fixed_text.h"
#include "cgi/handlers.h"
#include "cgi/response.h"
#include "cgi/trace.h"
#include "nfs/exports_parser.h"
#include "platform/cgic.h"
#include "platform/config_store.h"
#include "platform/samba.h"

namespace {

// The canonical paths of the rules' folders, resolved once per request: every share's
// look-up examines the same rules again, and a path resolves the same way throughout
// one request. Unresolvable texts are remembered as such.
class ResolvedPaths {
public:
    const std::optional<std::string>& of(const char* path)
    {
        auto [place, inserted] = m_paths.try_emplace(path);
        if (inserted) {
            FixedText<4096> resolved;
            if (canonical_path(path, resolved))
                place->second = std::string(resolved.view());
        }
        return place->second;
    }

private:
    std::unordered_map<std::string, std::optional<std::string>> m_paths;
};

// Looks at one rule for the share path. A rule whose path resolves is compared as the
// first 8 characters of its canonical path ("/mnt/HD/" for a hard-disk share), so the
// share-link lines the engine writes match no share; only a rule whose written path
// does not resolve and equals the share path reports a rule. The page has always been
// answered this way, so the 8-character copy stays.
bool examine_rule(exports_entry& record, const char* share_path, FixedText<8>& root_squash, FixedText<8>& write,
                  FixedText<64>& host, ResolvedPaths& resolved_paths)
{
    if (const auto& resolved = resolved_paths.of(record.volume.c_str())) {
        record.volume.clear();
        record.volume.assign(std::string_view(*resolved).substr(0, 8));
    }
    if (!(record.volume == share_path))
        return false;
    root_squash.assign(record.root_squash == 1 ? "Yes" : "No");
    write.assign(record.rw == 1 ? "Yes" : "No");
    host.assign(record.ip.view());
    return true;
}

// 1 when "/etc/exports" holds a rule for the share path (the last matching rule wins),
// else 0. The host text is written only on a match.
int nfs_rule_lookup(const char* share_path, FixedText<8>& root_squash, FixedText<8>& write, FixedText<64>& host,
                    ResolvedPaths& resolved_paths)
{
    root_squash.clear();
    write.clear();
    const ExportsList list = load_exports_config("/etc/exports");
    if (!list || !list->next)
        return 0;

    if (!list->next->next) {
        // A file of one unparsable line (or of one line without its newline): the
        // message goes to standard output, which is the answer, in the middle of the
        // share's nfs element. The page has always received it there, so it stays.
        if (list->next->volume.empty()) {
            std::puts("Nothing to show.");
            return 0;
        }
        return examine_rule(*list->next, share_path, root_squash, write, host, resolved_paths) ? 1 : 0;
    }

    // The switch is asked once per look-up, not twice per rule and share.
    const bool tracing = trace_enabled();
    int found = 0;
    for (exports_entry* record = list->next.get(); record != nullptr; record = record->next.get()) {
        if (tracing) {
            printf_out("path=%s\n", share_path);
            printf_out("current->volume=%s\n", record->volume.c_str());
        }
        if (examine_rule(*record, share_path, root_squash, write, host, resolved_paths))
            found = 1;
    }
    return found;
}

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

    ResolvedPaths resolved_paths;
    int total = 0;
    for (const share_info* share = pss; share != nullptr; share = share->next) {
        out("<share><name>");
        cgiHtmlEscape(share->name);
        out("</name><path>");
        cgiHtmlEscape(share->path);
        out("</path><nfs>");

        FixedText<8> root_squash;
        FixedText<8> write;
        FixedText<64> host;
        if (nfs_rule_lookup(share->path, root_squash, write, host, resolved_paths) == 1) {
            out("<status>1</status><real_path>");
            cgiHtmlEscape(share->path);
            out("</real_path><root_squash>%s</root_squash><write>%s</write><host>", root_squash.c_str(), write.c_str());
            cgiHtmlEscape(host.c_str());
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
