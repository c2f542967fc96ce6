// Import of users and groups from text files: the sample files to download, the
// upload, the listing of what the device received, the hand-off to account_mgr and
// the progress report that batch creation shares. The file contents are account_mgr's
// business: this program stores, lists and forwards them.
#include <array>
#include <cstdio>
#include <cstring>
#include <unistd.h>

#include "bulk/import_listing.h"
#include "cgi/file.h"
#include "cgi/fixed_text.h"
#include "cgi/form.h"
#include "cgi/handlers.h"
#include "cgi/response.h"
#include "cgi/shell.h"
#include "cgi/text_escape.h"
#include "cgi/trace.h"
#include "platform/cgic.h"

namespace {

constexpr const char* kImportUsers = "/tmp/import_users";
constexpr const char* kImportGroups = "/tmp/import_groups";

// One <item> per record line (import_listing.h), or "ng" without the file.
void list_import_file(const char* path)
{
    const UniqueFile file = open_file(path, "r");
    write_xml_header(Charset::Utf8);
    write_xml_prologue();
    if (!file) {
        out("<info><status>ng</status></info>\n");
        return;
    }
    write_import_items(file.get());
}

// account_mgr -u for a user file, -g for a group file.
void start_import(const char* option, const char* file)
{
    const auto overwrite = form_value<8>("overwrite");
    const auto app = form_value<64>("app");
    const char* escaped_app = cgi_escapeshellarg(app.c_str());
    const char* escaped_overwrite = cgi_escapeshellarg(overwrite.c_str());

    FixedText<256> line;
    line.format("(account_mgr %s -f '%s' -t %s -o %s >/dev/null 2>&1) &", option,
                inside_single_quotes(file).c_str(), escaped_app, escaped_overwrite);
    cgi_escapeshellarg_free();
    run_system(line.c_str());
    printf_out("buf=[%s]\n", line.c_str());
    answer_empty_html();
}

// The sample goes straight to standard output with its own header lines, as a
// download; a missing sample gives an empty response, not even a header.
void send_sample(const char* path, const char* download_name)
{
    const UniqueFile file = open_file(path, "rb");
    if (!file)
        return;
    std::fseek(file.get(), 0, SEEK_END);
    const long size = std::ftell(file.get());
    std::fprintf(stdout, "Content-Disposition: attachment;filename=\"%s\"\r\n", download_name);
    std::fprintf(stdout, "Content-Length: %ld\r\n", size);
    // Each of the last two lines ends in "\r" and then a newline; the content type
    // stays text/html although the file is text.
    std::fprintf(stdout, "Connection: Keep-Alive\r\n");
    std::fprintf(stdout, "Content-Type: text/html\r\n\r\n");
    std::fseek(file.get(), 0, SEEK_SET);
    std::array<char, 2048> chunk{};
    std::size_t length = 0;
    while ((length = std::fread(chunk.data(), 1, chunk.size(), file.get())) > 0)
        std::fwrite(chunk.data(), 1, length, stdout);
}

} // namespace

// The client's file name is read but not used: the upload always lands in
// "/tmp/import_users", replacing the previous one.
void cgi_import_uesrs()
{
    FixedText<1024> client_name;
    cgiFormFileName("fileToUpload", client_name.data(), client_name.size());
    cgiFormFileRename("fileToUpload", kImportUsers);
    answer_empty_html();
}

void cgi_get_import_uesrs()
{
    list_import_file(kImportUsers);
}

void cgi_get_import_groups()
{
    list_import_file(kImportGroups);
}

void cgi_create_import_users()
{
    start_import("-u", kImportUsers);
}

void cgi_create_import_groups()
{
    start_import("-g", kImportGroups);
}

// -1 while account_mgr keeps its marker; then 0 when every status line holds ":0"
// (or there is no status file), 1 when a line lacks it. The status file is tested in
// pieces of at most 127 characters: a piece without ":0" counts as a failure.
void cgi_get_create_status()
{
    const auto type = form_value<16>("ftype");
    const bool users = type == "bUser" || type == "iUser";
    const char* marker = users ? "/tmp/start_create_users" : "/tmp/start_create_groups";

    int status = -1;
    if (access(marker, F_OK) != 0) {
        status = 0;
        if (const UniqueFile results = open_file("/tmp/account_status", "r")) {
            FixedText<128> piece;
            while (read_line(results.get(), piece)) {
                if (!std::strstr(piece.c_str(), ":0"))
                    status = 1;
            }
        }
    }

    write_xml_header(Charset::Utf8);
    write_xml_prologue();
    out("<info><status>%d</status></info>\n", status);
}

void cgi_download_import_sample()
{
    send_sample("/var/www/web/users/import_file.txt", "import_file.txt");
}

void cgi_download_import_group_sample()
{
    send_sample("/var/www/web/users/import_group.txt", "import_group.txt");
}
