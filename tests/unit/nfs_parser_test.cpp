// The exports file parser on a table of files: what each line becomes, and which
// records stay cleared.
#include <gtest/gtest.h>

#include <vector>

#include "nfs/exports_parser.h"
#include "support.h"

namespace {

// Each record after the head as "volume|ip|rw|root_squash", a cleared one as "-".
std::vector<std::string> records_of(const ExportsList& list)
{
    std::vector<std::string> shown;
    for (const exports_entry* r = list->next.get(); r != nullptr; r = r->next.get())
        shown.push_back(r->volume.empty() ? "-"
                                          : std::string(r->volume.view()) + "|" + std::string(r->ip.view()) + "|" +
                                                std::to_string(r->rw) + "|" + std::to_string(r->root_squash));
    return shown;
}

} // namespace

TEST(ExportsParser, ParsesLinesAndKeepsClearedRecords)
{
    const std::string options = "sync,no_wdelay,insecure_locks,insecure,no_subtree_check,anonuid=501,anongid=1000)";
    const std::string engine_line = "\"/nfs/Public\" 10.0.0.1(rw,all_squash," + options + "\n";
    const std::string engine_record = "/nfs/Public|10.0.0.1|1|1";
    std::string many;
    for (int i = 0; i < 50000; ++i)   // released without recursing
        many += "\"/v\" h(rw,x)\n";
    const struct {
        const char* what;
        std::string content;
        std::vector<std::string> records;
    } cases[] = {
        {"empty file: the head alone", "", {}},
        {"a line the engine writes", engine_line, {engine_record}},
        {"read-only, no_root_squash", "\"/mnt/USB/a b\" 192.168.1.0/24(ro,no_root_squash," + options + "\n",
         {"/mnt/USB/a b|192.168.1.0/24|0|0"}},
        {"root_squash is any other second option", "\"/x\" *(rw,root_squash)\n\"/y\" h(rw)\n", {"/x|*|1|1", "/y|h|1|1"}},
        {"an access word only begins with rw", "\"/x\" h(rwx,no_root_squashed)\n\"/y\" h(r,w)\n", {"/x|h|1|0", "/y|h|0|1"}},
        {"quotes within the folder: first to last", "\"/a \"b\" c\" h(rw,x)\n", {"/a \"b\" c|h|1|1"}},
        {"host from the last blank", "\"/x\"  net work(rw,x)\n", {"/x|work|1|1"}},
        {"no quotes: skipped, its record reused", "/x h(rw,x)\n" + engine_line, {engine_record}},
        {"(NULL) hosts are invalid in any case", "\"/a\" (NULL)(rw,x)\n\"/b\" (null)(rw,x)\n\"/c\" (rw,x)\n" + engine_line,
         {engine_record}},
        {"a blank line is skipped", "\n" + engine_line + "\n", {engine_record, "-"}},
        {"last line without newline stays cleared", engine_line + "\"/y\" h(rw,x)", {engine_record, "-"}},
        {"a skipped line, then one without newline", "bad\n\"/y\" h(rw,x)", {"-"}},
        {"an invalid line at the end", engine_line + "\"/z\" (NULL)(rw)\n", {engine_record, "-"}},
        {"the folder is cut to 255 bytes", "\"" + std::string(300, 'v') + "\" h(rw,x)\n", {std::string(255, 'v') + "|h|1|1"}},
        {"the host is cut to 63 bytes", "\"/x\" " + std::string(70, 'h') + "(ro,x)\n", {"/x|" + std::string(63, 'h') + "|0|1"}},
        {"a line longer than 511 bytes comes in pieces", "\"/x\" h(rw," + std::string(600, 'o') + ")\n", {"/x|h|1|1", "-"}},
        {"a long list", many, std::vector<std::string>(50000, "/v|h|1|1")},
    };
    const Scratch dir;
    for (const auto& c : cases) {
        spit(dir / "exports", c.content);
        const ExportsList list = load_exports_config((dir / "exports").c_str());
        ASSERT_TRUE(list) << c.what;
        EXPECT_EQ(records_of(list), c.records) << c.what;
        EXPECT_EQ(count_records(list), static_cast<int>(c.records.size())) << c.what;
    }
    EXPECT_FALSE(load_exports_config((dir / "missing").c_str()));
}
