// The account name walk must find exactly the entries the C library's entry readers
// find: the same names, in the same order, on well-formed files and on odd ones.
#include <gtest/gtest.h>

#include <grp.h>
#include <pwd.h>
#include <random>
#include <vector>

#include "support.h"
#include "volumes/account_names.h"

namespace {

void expect_same_names(const std::string& content, const std::string& what)
{
    const Scratch dir;
    const std::string path = dir / "accounts";
    spit(path, content);
    for (const AccountFile kind : {AccountFile::Passwd, AccountFile::Group}) {
        std::vector<std::string> library, ours;
        const UniqueFile file = open_file(path.c_str(), "r");
        if (kind == AccountFile::Passwd) {
            while (const passwd* entry = fgetpwent(file.get()))
                library.emplace_back(entry->pw_name);
        } else {
            while (const group* entry = fgetgrent(file.get()))
                library.emplace_back(entry->gr_name);
        }
        EXPECT_TRUE(for_each_account_name(path.c_str(), kind, [&](std::string_view name) { ours.emplace_back(name); }));
        EXPECT_EQ(ours, library) << what << (kind == AccountFile::Passwd ? " (passwd)" : " (group)")
                                 << (content.size() < 1000 ? ": " + testing::PrintToString(content) : "");
    }
}

std::string repeated(const std::string& piece, int times)
{
    std::string text;
    while (times-- > 0)
        text += piece;
    return text;
}

// Well-formed lines of 9 to 160 bytes, with numbers of one to ten digits, the gid
// sometimes last on its line: their ends fall at every distance from the first bytes
// that are looked at together, and across the ends of the reader's blocks.
std::string plain_lines()
{
    std::string text;
    for (int n = 0; text.size() < 100000; ++n) {
        const std::string number(static_cast<std::size_t>(1 + n % 10), static_cast<char>('1' + n % 9));
        text += "u" + std::to_string(n) + ":x:" + number + ":" + number;
        if (n % 7 != 0)
            text += ":" + std::string(static_cast<std::size_t>(n % 140), 'g');
        text += '\n';
    }
    return text;
}

// Lines whose number fields end before, at and past the 32nd byte, well-formed or
// spoilt right after the gid: names of 1 to 30 bytes push the fields across it.
std::string lines_across_the_first_bytes()
{
    std::string text;
    for (std::size_t length = 1; length <= 30; ++length) {
        for (const std::size_t uid : {1, 5, 9, 10}) {
            for (const std::size_t gid : {1, 5, 9, 10}) {
                for (const char* rest : {"", ":/h:/s", "x:/h:/s", " :/h"})
                    text += std::string(length, 'n') + ":x:" + std::string(uid, '1') + ":" + std::string(gid, '2') + rest + "\n";
            }
        }
    }
    return text;
}

} // namespace

TEST(AccountNames, FindTheEntriesOfOddAndRandomLinesAsTheLibraryDoes)
{
    const std::pair<const char*, std::string> cases[] = {
        {"device files", "root:x:0:0:root:/home/root:/bin/sh\nadmin:x:500:1001:Administrator,,,,:/shares:/bin/sh\n"
                         "allaccount:x:1000:admin,alice\nfamily:x:1004:\n"},
        {"comments and blank lines", "# root:x:0:0::/:\n\n   \n\t# x:x:1:1::/:\n  alice:x:1:2::/:\n\r\n"},
        {"leading white space", " \t\v\fbob:x:3:4:g:/h:/s\n"},
        {"missing numbers", "a:x::1::/:\nb:x:1:::/:\nc:x\nd\n:x:1:1::/:\n"},
        {"numbers as strtoul reads them", "a:x: 7:+8::/:\nb:x:-1:2\nc:x:1x:2::/:\nd:x:0x1:2:\ne:x:12 :3:\n"},
        {"numbers that do not fit 32 bits", "a:x:-1:2\nb:x:-2:2\nc:x:4294967295:2\nd:x:99999999999:2\ne:x:1:-1\n"
                                            "f:x:-0:1\ng:x:1:4294967296\n+h:x:-1:1\n+i:x::-1\n"
                                            "j:x:-18446744069414584321:1\nk:x:99999999999999999999999:1\n"},
        {"only a group line's numbers", "grp:x:5:u1,u2\ngrp2:x:5\ngrp3:x:\n"},
        {"compatibility lines", "+\n-\n+:\n+name\n-name:\n+nis:x\n+nis:x::\n+nis:x:1\n-nis:x:a:b\n+n:x:::\n+n:x: :\n"},
        {"CR line ends", "a:x:1:2:g:/h:/s\r\nb:x:3:4\r\n"},
        {"NUL inside a line", std::string("a:x:1:2::/:\nb\0:x:1:1::/:\nc:x:1\0:2::/:\nd:x:1:2\0::\n", 43)},
        {"last line without line end", "a:x:1:2::/:\nb:x:3:4::/:"},
        {"empty file", ""},
        {"group line past a block", "root:x:0:\nallaccount:x:1000:" + repeated("user,", 60000) + "end\nlast:x:9:\n"},
        {"name past a block", std::string(200000, 'n') + ":x:1:2:" + std::string(70000, 'm') + "\nz:x:1:2\n"},
        {"decided only past a block", std::string(70000, 'n') + ":x:" + std::string(70000, ' ') + "12:13:\n"},
        {"NUL past a block", std::string(70000, 'n') + std::string(1, '\0') + ":x:1:1\nz:x:1:2\n"},
        {"long last line", "a:x:1:2\n" + std::string(100000, 'b')},
        {"plain lines of every length across block ends", plain_lines()},
        {"number fields across the first bytes looked at together", lines_across_the_first_bytes()},
    };
    for (const auto& [what, content] : cases)
        expect_same_names(content, what);
    // Random files from a fixed seed: the same lines every run.
    std::mt19937 random(12);
    const std::string alphabet = std::string("ab:::::+-# \t\r\n\n0123456789x", 26) + std::string(1, '\0');
    for (int round = 0; round < 2000; ++round) {
        // Every other file without a NUL, whose well-formed lines take the short way.
        const std::size_t letters = alphabet.size() - round % 2;
        std::string content(random() % 400, ' ');
        for (char& c : content)
            c = alphabet[random() % letters];
        expect_same_names(content, "random file " + std::to_string(round));
    }
}
