// The program behind the device's real web server: requests sent with curl over
// HTTP reach it intact, and its answers reach the client.
#include <gtest/gtest.h>

#include <arpa/inet.h>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <csignal>
#include <memory>
#include <netinet/in.h>
#include <spawn.h>
#include <sys/socket.h>
#include <sys/wait.h>
#include <unistd.h>
#include <vector>

#include "tests/device/device.h"

extern char** environ;

namespace {

// A free port on the loopback address, as the kernel hands one out.
int free_port()
{
    const int fd = socket(AF_INET, SOCK_STREAM, 0);
    sockaddr_in address{.sin_family = AF_INET, .sin_port = 0, .sin_addr = {htonl(INADDR_LOOPBACK)}, .sin_zero = {}};
    socklen_t length = sizeof(address);
    bind(fd, reinterpret_cast<sockaddr*>(&address), length);
    getsockname(fd, reinterpret_cast<sockaddr*>(&address), &length);
    close(fd);
    return ntohs(address.sin_port);
}

// The output of a shell command on the host.
std::string output_of(const std::string& command)
{
    const std::unique_ptr<FILE, int (*)(FILE*)> pipe(popen(command.c_str(), "r"), pclose);
    std::string output;
    for (int c; pipe && (c = std::fgetc(pipe.get())) != EOF;)
        output += static_cast<char>(c);
    return output;
}

// The device's web server, running for the life of the object.
struct WebServer {
    pid_t pid = 0;
    WebServer(const Device& dev, const std::string& port, const std::string& url)
    {
        const std::string devroot = NAS_SOURCE_DIR "/scripts/devroot";
        const std::vector<const char*> argv{devroot.c_str(), "serve", dev.root().c_str(), "--port", port.c_str(), nullptr};
        posix_spawn(&pid, argv[0], nullptr, nullptr, const_cast<char* const*>(argv.data()), environ);
        // A bound on the wait for the server to answer: 200 tries, 50 ms apart.
        std::system(("for i in $(seq 200); do curl -s -o /dev/null " + url + " && break; sleep 0.05; done").c_str());
    }
    ~WebServer()
    {
        kill(pid, SIGTERM);
        waitpid(pid, nullptr, 0);
    }
};

} // namespace

TEST(Http, GetPostAndUploadReachTheProgram)
{
    Device dev;
    const std::string port = std::to_string(free_port());
    const std::string url = "'http://127.0.0.1:" + port + "/cgi-bin/nas-accounts.cgi'";
    const std::string upload = dev.root() + ".upload", content = "# users\r\nalice\twonder\r\nbob & co <x>\r\n";
    std::ofstream(upload, std::ios::binary) << content;
    {
        const WebServer server(dev, port, url);
        const std::string curl = "curl -s -i --max-time 10 ";
        // The headers but the server's own (date, name), without line ends' CRs.
        EXPECT_EQ(output_of(curl + url + "'?cmd=cgi_get_service_info' | tr -d '\\r' | grep -v '^Date:\\|^Server:'"),
                  "HTTP/1.1 200 OK\nPragma: no-cache\nCache-Control: no-cache\nContent-Type: text/xml\n"
                  "Accept-Ranges: bytes\nContent-Length: 157\n\n<?xml version=\"1.0\" encoding=\"UTF-8\"?><service>"
                  "<ftp>1</ftp><nfs_server>1</nfs_server><cloud_access>1</cloud_access><webdav_server>1</webdav_server>"
                  "</service>\n");
        const std::string post = output_of(curl + "--data 'cmd=cgi_ftp_service&type=1' " + url);
        EXPECT_TRUE(post.starts_with("HTTP/1.1 200 OK\r\n") && post.ends_with("\r\n\r\n")) << post;
        const std::string multipart = output_of(curl + "-F cmd=cgi_import_uesrs -F 'fileToUpload=@" + upload +
                                                ";filename=users.txt' " + url);
        EXPECT_TRUE(multipart.starts_with("HTTP/1.1 200 OK\r\n")) << multipart;
    }
    EXPECT_EQ(dev.journal(), (Journal{{"LIB_WEB_STOP_FTP"}, {"LIB_FTP_Create_Share_Link"}, {"LIB_WEB_START_FTP"}}));
    EXPECT_EQ(dev.read_file("/tmp/import_users"), content);
    std::remove(upload.c_str());
}
