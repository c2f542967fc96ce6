// The program behind the device's real web server: requests sent with curl over
// HTTP reach it intact, and its answers reach the client.
#include <gtest/gtest.h>

#include <arpa/inet.h>
#include <chrono>
#include <csignal>
#include <cstdio>
#include <memory>
#include <netinet/in.h>
#include <spawn.h>
#include <string>
#include <sys/socket.h>
#include <sys/wait.h>
#include <thread>
#include <unistd.h>

#include "tests/device/device.h"

extern char** environ;

namespace {

// A free port on the loopback address, as the kernel hands one out.
int free_port()
{
    const int fd = socket(AF_INET, SOCK_STREAM, 0);
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    bind(fd, reinterpret_cast<sockaddr*>(&address), sizeof(address));
    socklen_t length = sizeof(address);
    getsockname(fd, reinterpret_cast<sockaddr*>(&address), &length);
    close(fd);
    return ntohs(address.sin_port);
}

bool port_open(int port)
{
    const int fd = socket(AF_INET, SOCK_STREAM, 0);
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_port = htons(static_cast<uint16_t>(port));
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    const bool open = connect(fd, reinterpret_cast<sockaddr*>(&address), sizeof(address)) == 0;
    close(fd);
    return open;
}

// The device's web server, running for the life of the object.
class WebServer {
public:
    WebServer(const Device& dev, int port)
    {
        const std::string devroot = std::string(NAS_SOURCE_DIR) + "/scripts/devroot";
        const std::string port_text = std::to_string(port);
        std::vector<char*> argv{const_cast<char*>(devroot.c_str()), const_cast<char*>("serve"),
                                const_cast<char*>(dev.root().c_str()), const_cast<char*>("--port"),
                                const_cast<char*>(port_text.c_str()), nullptr};
        posix_spawn(&m_pid, argv[0], nullptr, nullptr, argv.data(), environ);
        // Bounded wait for the server to listen: at most 10 seconds.
        for (int i = 0; i < 200 && !port_open(port); ++i)
            std::this_thread::sleep_for(std::chrono::milliseconds(50));
    }
    ~WebServer()
    {
        kill(m_pid, SIGTERM);
        int status = 0;
        waitpid(m_pid, &status, 0);
    }
    WebServer(const WebServer&) = delete;
    WebServer& operator=(const WebServer&) = delete;

private:
    pid_t m_pid = 0;
};

// curl's output (headers included with -i), run on the host.
std::string curl(const std::string& arguments)
{
    const std::string command = "curl -s -i --max-time 10 " + arguments;
    std::unique_ptr<FILE, int (*)(FILE*)> pipe(popen(command.c_str(), "r"), pclose);
    std::string output;
    int c = 0;
    while (pipe && (c = std::fgetc(pipe.get())) != EOF)
        output += static_cast<char>(c);
    return output;
}

std::string body_of(const std::string& response)
{
    const auto end = response.find("\r\n\r\n");
    return end == std::string::npos ? "" : response.substr(end + 4);
}

} // namespace

TEST(Http, GetPostAndUploadReachTheProgram)
{
    Device dev;
    const int port = free_port();
    const std::string url = "'http://127.0.0.1:" + std::to_string(port) + "/cgi-bin/nas-accounts.cgi'";
    const std::string upload = dev.root() + ".upload";
    {
        FILE* file = std::fopen(upload.c_str(), "wb");
        ASSERT_NE(file, nullptr);
        std::fputs("# users\r\nalice\twonder\r\nbob & co <x>\r\n", file);
        std::fclose(file);
    }
    {
        WebServer server(dev, port);
        ASSERT_TRUE(port_open(port));

        const std::string get = curl(url + "'?cmd=cgi_get_service_info'");
        EXPECT_NE(get.find("HTTP/1.1 200 OK\r\n"), std::string::npos) << get;
        EXPECT_NE(get.find("Content-Type: text/xml\r\n"), std::string::npos) << get;
        EXPECT_EQ(body_of(get), "<?xml version=\"1.0\" encoding=\"UTF-8\"?><service><ftp>1</ftp>"
                                "<nfs_server>1</nfs_server><cloud_access>1</cloud_access>"
                                "<webdav_server>1</webdav_server></service>");

        const std::string post = curl("--data 'cmd=cgi_ftp_service&type=1' " + url);
        EXPECT_NE(post.find("HTTP/1.1 200 OK\r\n"), std::string::npos) << post;
        EXPECT_EQ(body_of(post), "");

        const std::string multipart =
            curl("-F cmd=cgi_import_uesrs -F 'fileToUpload=@" + upload + ";filename=users.txt' " + url);
        EXPECT_NE(multipart.find("HTTP/1.1 200 OK\r\n"), std::string::npos) << multipart;
    }
    EXPECT_EQ(dev.journal(), (Journal{{"LIB_WEB_STOP_FTP"}, {"LIB_FTP_Create_Share_Link"}, {"LIB_WEB_START_FTP"}}));
    EXPECT_EQ(dev.read_file("/tmp/import_users"), "# users\r\nalice\twonder\r\nbob & co <x>\r\n");
    std::remove(upload.c_str());
}
