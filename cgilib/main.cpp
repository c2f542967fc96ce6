// Process entry: parse the request, set up the response stream, run the program.
#include "platform/cgic.h"

#include <array>
#include <cerrno>
#include <istream>
#include <streambuf>
#include <unistd.h>

#include "cgilib/request.h"

namespace {

// Standard input as a stream, read straight from the file descriptor.
class StandardInput : public std::streambuf {
protected:
    int_type underflow() override
    {
        ssize_t got = 0;
        do
            got = ::read(STDIN_FILENO, m_buffer.data(), m_buffer.size());
        while (got < 0 && errno == EINTR);
        if (got <= 0)
            return traits_type::eof();
        setg(m_buffer.data(), m_buffer.data(), m_buffer.data() + got);
        return traits_type::to_int_type(m_buffer[0]);
    }

private:
    std::array<char, 64 * 1024> m_buffer{};
};

} // namespace

int main()
{
    const cgilib::CgiEnvironment environment = cgilib::environment_from_process();
    // A stream over the body is set up only for a request that has one: setting up the
    // C++ streams is a good part of the start-up of a program that runs once per request.
    if (environment.request_method == "POST") {
        StandardInput input;
        std::istream body(&input);
        cgilib::parse_request(environment, body);
    } else {
        cgilib::parse_request(environment);
    }
    cgiOut = stdout;
    return cgiMain();
}
