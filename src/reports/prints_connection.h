#pragma once

namespace quotas {

class DataEnvironment;

// Brings SqlServer_Prints in line with SqlServer before a debt report: the
// connection string is copied only when it differs (closing the connection
// first, which also discards the result sets read through it), and the
// connection is opened only when it is closed. Aligned and open, it is used
// as it stands, without reconnecting. Failures pass on as DbError.
void prepareReportsConnection(DataEnvironment& data);

}  // namespace quotas
