// A device with more accounts than the program keeps in one piece: the names list of
// 9,000 users, whose names run past the list's first block and the reader's blocks of
// the password file, has every name once, in file order.
#include <gtest/gtest.h>

#include <string>

#include "device.h"

TEST(LargeDevice, NamesListHasEveryNameAcrossItsBlocks)
{
    Device dev;
    std::string passwd = "root:x:0:0::/:/bin/sh\n";
    std::string names;
    for (int i = 0; i < 9000; ++i) {
        // Names of 2 to 21 bytes, so that every length is copied next to a block's end.
        const std::string name = "u" + std::to_string(i) + std::string(static_cast<std::size_t>(i % 17), 'x');
        passwd += name + ":x:" + std::to_string(2000 + i) + ":1000:,,,,:/shares/" + name + ":/bin/sh\n";
        names += (names.empty() ? "" : "#") + name;
    }
    dev.write_file("/etc/passwd", passwd);
    dev.write_file("/etc/group", "allaccount:x:1000:\n");
    dev.write_file("/etc/shared_name", "");

    const Reply reply = dev.get(query_string("cgi_get_user_info"));
    EXPECT_EQ(reply.out, xml_answer("<user_info>\n<total>9000</total><all_user>" + names +
                                        "</all_user><all_group></all_group><hddnum>0</hddnum><hddsize></hddsize></user_info>",
                                    true));
}
