// Pieces of the user commands that other user commands share.
#pragma once

// Makes the private folder share of a new user on the first volume: the share named
// after the user, public unless `password_flag` converts to 1 (the user has a
// password), in which case only the user may read and write it.
void create_user_home_share(const char* user, const char* password_flag);
