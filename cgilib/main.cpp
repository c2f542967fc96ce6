// Process entry: parse the request, set up the response stream, run the program.
#include "platform/cgic.h"

#include <cerrno>
#include <unistd.h>

#include "cgilib/request.h"

namespace {

// The request body: standard input, read straight from the file descriptor.
std::size_t read_standard_input(char* into, std::size_t most)
{
    ssize_t got = 0;
    do
        got = ::read(STDIN_FILENO, into, most);
    while (got < 0 && errno == EINTR);
    return got > 0 ? static_cast<std::size_t>(got) : 0;
}

} // namespace

int main()
{
    const cgilib::CgiEnvironment environment = cgilib::environment_from_process();
    if (environment.request_method == "POST")
        cgilib::parse_request(environment, cgilib::ByteSource(read_standard_input));
    else
        cgilib::parse_request(environment);
    cgiOut = stdout;
    return cgiMain();
}
