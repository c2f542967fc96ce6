// Process entry: parse the request, set up the response stream, run the program.
#include "platform/cgic.h"

#include <iostream>

#include "cgilib/request.h"

int main()
{
    cgilib::parse_request(cgilib::environment_from_process(), std::cin);
    cgiOut = stdout;
    return cgiMain();
}
