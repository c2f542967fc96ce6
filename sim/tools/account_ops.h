// What the account tool does to the device's account files, for every tool that
// creates accounts the same way (account, account_mgr).
#pragma once

#include <string>

struct NewUser {
    std::string name;
    std::string password;       // clear text; stored as a crypt hash
    std::string groups;         // the group list, in the account tool's -l format
    std::string description;    // the full name field
    std::string hint;           // the password hint
    std::string mail;           // the e-mail, the entry's "other" field
};

// 0 when the user was created; non-zero (and nothing changed) otherwise, for example
// when the name exists or is not a valid account name.
int create_user(const NewUser& user);
// 0 when the group was created with these members (the -l format).
int create_group(const std::string& name, const std::string& members);
