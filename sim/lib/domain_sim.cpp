#include "domain_sim.h"

#include <cstdlib>

#include "text_file.h"

std::optional<SimulatedDomain> load_simulated_domain()
{
    const auto settings = read_settings(kDomainFile);
    if (settings.empty() && read_lines(kDomainFile).empty())
        return std::nullopt;
    SimulatedDomain domain;
    for (const auto& [key, value] : settings) {
        if (key == "realm")
            domain.realm = value;
        else if (key == "workgroup")
            domain.workgroup = value;
        else if (key == "controller")
            domain.controller = value;
        else if (key == "dns")
            domain.dns = value;
        else if (key == "join_result")
            domain.join_result = std::atoi(value.c_str());
        else if (key == "trust")
            domain.trust = value;
        else if (key == "users" && !value.empty())
            domain.users = split(value, ',');
        else if (key == "admin_user")
            domain.admin_user = value;
        else if (key == "admin_password")
            domain.admin_password = value;
    }
    return domain;
}

std::string primary_dns_server()
{
    for (const std::string& line : read_lines(kResolverFile)) {
        const std::vector<std::string> words = split(line, ' ');
        if (words.size() >= 2 && words[0] == "nameserver")
            return words[1];
    }
    return "";
}

bool set_dns_servers(const std::string& blank_separated)
{
    std::vector<std::string> lines;
    for (const std::string& server : split(blank_separated, ' ')) {
        if (!server.empty())
            lines.push_back("nameserver " + server);
    }
    return write_lines(kResolverFile, lines);
}
