// The program behind the device's real web server: requests sent with curl over
// HTTP reach it intact, and its answers reach the client.
#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>
#include <fstream>

#include "tests/device/device.h"

TEST(Http, GetPostAndUploadReachTheProgram)
{
    Device dev;
    const std::string root = dev.root(), upload = root + ".upload";
    const std::string content = "# users\r\nalice\twonder\r\nbob & co <x>\r\n";
    std::ofstream(upload, std::ios::binary) << content;
    // The server on a free loopback port (a bound on the wait for it: 200 tries, 50 ms
    // apart), three requests, their answers in the device's /tmp.
    const std::string script =
        "port=$(python3 -c 'import socket; s = socket.socket(); s.bind((\"127.0.0.1\", 0)); print(s.getsockname()[1])')\n"
        NAS_SOURCE_DIR "/scripts/devroot serve " + root + " --port $port >/dev/null 2>&1 & server=$!\n"
        "url=http://127.0.0.1:$port/cgi-bin/nas-accounts.cgi\n"
        "for i in $(seq 200); do curl -s -o /dev/null $url && break; sleep 0.05; done\n"
        "curl='curl -s -i --max-time 10'\n"
        "$curl \"$url?cmd=cgi_get_service_info\" >" + root + "/tmp/get\n"
        "$curl --data 'cmd=cgi_ftp_service&type=1' $url >" + root + "/tmp/post\n"
        "$curl -F cmd=cgi_import_uesrs -F 'fileToUpload=@" + upload + ";filename=users.txt' $url >" + root + "/tmp/multipart\n"
        "kill $server; wait $server\n";
    std::system(script.c_str());
    // The headers but the server's own (date, name).
    std::string get;
    for (const std::string& line : dev.lines("/tmp/get"))
        get += line.starts_with("Date:") || line.starts_with("Server:") ? "" : line + "\n";
    EXPECT_EQ(get, "HTTP/1.1 200 OK\r\nPragma: no-cache\r\nCache-Control: no-cache\r\nContent-Type: text/xml\r\n"
                   "Accept-Ranges: bytes\r\nContent-Length: 157\r\n\r\n<?xml version=\"1.0\" encoding=\"UTF-8\"?><service>"
                   "<ftp>1</ftp><nfs_server>1</nfs_server><cloud_access>1</cloud_access><webdav_server>1</webdav_server>"
                   "</service>\n");
    const std::string post = dev.read_file("/tmp/post");
    EXPECT_TRUE(post.starts_with("HTTP/1.1 200 OK\r\n") && post.ends_with("\r\n\r\n")) << post;
    EXPECT_TRUE(dev.read_file("/tmp/multipart").starts_with("HTTP/1.1 200 OK\r\n")) << dev.read_file("/tmp/multipart");
    EXPECT_EQ(dev.journal(), (Journal{{"LIB_WEB_STOP_FTP"}, {"LIB_FTP_Create_Share_Link"}, {"LIB_WEB_START_FTP"}}));
    EXPECT_EQ(dev.read_file("/tmp/import_users"), content);
    std::remove(upload.c_str());
}
