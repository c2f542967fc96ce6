// Directory domain membership of the simulated device. ads_start joins the domain of
// "/sim/domain.conf" (domain_sim.h) with the settings in the config store, as the
// program left them before the call: the realm, workgroup and controller must be the
// domain's and the primary DNS server ("/network_mgr/lan0/dns1") the one that
// resolves it. It then answers the domain file's join_result (1, 50 and 100 mean
// joined; a file can name any failure code). Otherwise it answers -1: no domain is
// reachable or the settings do not match it. ads_stop only records itself.
#include "platform/samba.h"

#include <strings.h>

#include <string>

#include "domain_sim.h"
#include "journal.h"
#include "platform/config_store.h"

namespace {

constexpr int kNotJoined = -1;

std::string config_text(const char* key)
{
    std::string value(1024, '\0');
    if (xml_get_str(key, static_cast<int>(value.size()), value.data()) != 0)
        return "";
    value.resize(value.find('\0'));
    return value;
}

} // namespace

extern "C" int ads_start(void)
{
    journal_record("ads_start", {});
    const std::optional<SimulatedDomain> domain = load_simulated_domain();
    if (!domain)
        return kNotJoined;
    const bool matches = strcasecmp(config_text("/system_mgr/samba/ads_realm").c_str(), domain->realm.c_str()) == 0
        && config_text("/system_mgr/samba/ads_workgroup") == domain->workgroup
        && config_text("/system_mgr/samba/ads_pwd_server") == domain->controller
        && config_text("/network_mgr/lan0/dns1") == domain->dns;
    return matches ? domain->join_result : kNotJoined;
}

extern "C" int ads_stop(void)
{
    journal_record("ads_stop", {});
    return 0;
}
