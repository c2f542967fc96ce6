// Which requests reach a command, and what an unknown command answers: nothing.
#include <gtest/gtest.h>

#include "device.h"

TEST(Dispatcher, UnmatchedCommandsAnswerNothing)
{
    Device dev;
    const std::string valid = "cgi_get_service_info";
    const struct {
        const char* what;
        std::string query;
    } cases[] = {
        {"no cmd", "type=1"},
        {"empty cmd", "cmd="},
        {"trailing space", "cmd=cgi_get_service_info%20"},
        {"capital letters", "cmd=CGI_GET_SERVICE_INFO"},
        {"the usual spelling of the import", "cmd=cgi_import_users"},
        {"a valid name cut at 63 characters", "cmd=" + valid + std::string(100 - valid.size(), 'x')},
        {"an empty request", ""},
    };
    for (const auto& c : cases) {
        const Reply reply = dev.get_raw(c.query);
        EXPECT_EQ(reply.out, "") << c.what;
        EXPECT_EQ(reply.status, 0) << c.what;
    }
    EXPECT_TRUE(dev.journal().empty());
}

TEST(Dispatcher, ACommandIsReadAsTextUpToItsFirstNul)
{
    Device dev;
    EXPECT_EQ(dev.get_raw("cmd=cgi_ftp_service%00junk&type=1").out, kEmptyHtml);
    EXPECT_EQ(dev.journal().size(), 3u);
}

TEST(Dispatcher, PostedCommandsRunToo)
{
    Device dev;
    EXPECT_EQ(dev.post("cgi_ftp_service", {{"type", "0"}}), kEmptyHtml);
    EXPECT_EQ(dev.journal(), (Journal{{"LIB_WEB_STOP_FTP"}}));
}
