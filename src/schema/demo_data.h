#pragma once

namespace quotas {

class Connection;

// Adds count members with Portuguese names, addresses, categories and
// employers, some insured and some with an insurance end date. The same
// count on the same database always gives the same members. The demo
// categories and employers are added first when their tables are empty.
// Returns the number of members added.
int addDemoMembers(Connection& connection, int count);

}  // namespace quotas
