// The program's entry after the CGI library has parsed the request: one command,
// chosen by "cmd", runs and writes the whole answer.
#include "cgi/command_table.h"
#include "cgi/form.h"
#include "cgi/handlers.h"
#include "cgi/response.h"

extern "C" int cgiMain(void)
{
    // 64 bytes: a longer "cmd" is cut to 63 characters and then matches nothing.
    const auto cmd = form_value<64>("cmd");

    for (const Command& command : command_table()) {
        if (cmd.view() != command.name)
            continue;
        command.handler();
        // The restart command answers only through the dispatcher: an empty page.
        if (command.handler == cgi_restart_service)
            answer_empty_html();
        return 0;
    }
    // An unknown command gets no answer at all, not even a header.
    return 0;
}
