// Setting user and group limits: megabytes from the page, kilobytes to the library,
// on internal volumes 1 to 4 as the volume table numbers them.
#include <gtest/gtest.h>

#include "accounts_testing.h"

namespace {

Fields quota_form(const std::string& name, const std::vector<std::string>& available)
{
    Fields fields{{"name", name}};
    for (std::size_t k = 0; k < available.size(); ++k)
        fields.push_back({"available" + std::to_string(k + 1), available[k]});
    return fields;
}

} // namespace

TEST(SetQuota, AppliesEachVolumeOfTheTableInKilobytes)
{
    const struct {
        const char* what;
        std::string table;
        std::vector<std::string> available;
        Journal calls;   // LIB_Set_User_Quota's arguments; the group command's are the same
    } cases[] = {
        {"one volume: the others are ignored", kOne, {"100", "200", "300", "400"}, {{"HD_a2", "alice", "102400"}}},
        {"four volumes", kFour, {"1", "2", "3", "4"},
         {{"HD_a2", "alice", "1024"}, {"HD_b2", "alice", "2048"}, {"HD_c2", "alice", "3072"}, {"HD_d2", "alice", "4096"}}},
        {"a USB disk between takes no number", kUsbBetween, {"5", "6", "7", "8"},
         {{"HD_a2", "alice", "5120"}, {"HD_b2", "alice", "6144"}}},
        {"null leaves a volume unchanged", kFour, {"null", "7", "null", "NULL"},
         {{"HD_b2", "alice", "7168"}, {"HD_d2", "alice", "0"}}},
        {"missing and empty values remove the limit", kTwo, {""}, {{"HD_a2", "alice", "0"}, {"HD_b2", "alice", "0"}}},
        {"trailing text is ignored, no digits is 0", kTwo, {"100MB", "abc"},
         {{"HD_a2", "alice", "102400"}, {"HD_b2", "alice", "0"}}},
        {"negative values pass on shifted", kTwo, {"-3", " +2"}, {{"HD_a2", "alice", "-3072"}, {"HD_b2", "alice", "2048"}}},
        {"large values keep 64 bits", kOne, {"9007199254740991"}, {{"HD_a2", "alice", "9223372036854774784"}}},
        {"no table: nothing changes", kNone, {"1", "2"}, {}},
    };
    for (const auto& c : cases) {
        for (const std::string kind : {"User", "Group"}) {
            Device dev;
            set_volume_table(dev, c.table);
            const std::string cmd = kind == "User" ? "cgi_user_set_quota" : "cgi_group_set_quota";
            EXPECT_EQ(dev.request(cmd, quota_form("alice", c.available)), kEmptyHtml) << c.what;
            Journal expected;
            for (const Event& call : c.calls) {
                Event event{"LIB_Set_" + kind + "_Quota"};
                event.insert(event.end(), call.begin(), call.end());
                expected.push_back(event);
            }
            EXPECT_EQ(dev.journal(), expected) << kind << ": " << c.what;
        }
    }
}

TEST(SetQuota, CutsTheNameAndValuesToTheirBuffers)
{
    Device dev;
    const std::string long_name(80, 'n');
    dev.request("cgi_user_set_quota", quota_form(long_name, {"1" + std::string(70, '0'), "2"}));
    // 63 characters of each; the value is beyond 64 bits: the largest megabyte count
    // whose kilobytes 64 bits hold, never a wrapped one.
    EXPECT_EQ(dev.journal(), (Journal{{"LIB_Set_User_Quota", "HD_a2", long_name.substr(0, 63), "9223372036854774784"},
                                      {"LIB_Set_User_Quota", "HD_b2", long_name.substr(0, 63), "2048"}}));
}

TEST(SetQuota, StoresTheLimitsTheLibraryReadsBack)
{
    Device dev;
    dev.request("cgi_user_set_quota", quota_form("alice", {"100", "null"}));
    dev.request("cgi_group_set_quota", quota_form("family", {"null", "20"}));
    EXPECT_EQ(dev.read_file("/var/lib/platform/quota"), "u\tHD_a2\talice\t102400\ng\tHD_b2\tfamily\t20480\n");
    // 0 removes the limit from the store.
    dev.request("cgi_user_set_quota", quota_form("alice", {"0", "null"}));
    EXPECT_EQ(dev.read_file("/var/lib/platform/quota"), "g\tHD_b2\tfamily\t20480\n");
}

TEST(SetQuota, TracesPathsAndSizes)
{
    const struct { const char* cmd; std::string table; std::string console; } cases[] = {
        {"cgi_user_set_quota", kTwo, "path1=HD_a2\npath2=HD_b2\nsize1=[10240]\nsize2=[0]\nsize3=[0]\nsize4=[0]\n"},
        {"cgi_user_set_quota", kOne, "path1=HD_a2\npath2=\nsize1=[10240]\nsize2=[0]\nsize3=[0]\nsize4=[0]\n"},
        {"cgi_group_set_quota", kTwo, "group=alice\navailable1=10\navailable2=null\nnew_path1=HD_a2\nnew_path2=HD_b2\n"},
        {"cgi_group_set_quota", kNone, "group=alice\navailable1=10\navailable2=null\nnew_path1=\nnew_path2=\n"},
    };
    for (const auto& c : cases) {
        Device dev;
        set_volume_table(dev, c.table);
        dev.trace_on();
        EXPECT_EQ(dev.request(c.cmd, quota_form("alice", {"10", "null", "3"})), kEmptyHtml);
        EXPECT_EQ(dev.console(), c.console) << c.cmd;
    }
}
