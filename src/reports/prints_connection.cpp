#include "reports/prints_connection.h"

#include "component/data_environment.h"

namespace quotas {

void prepareReportsConnection(DataEnvironment& data)
{
    Connection& prints = data.SqlServer_Prints;
    const QString wanted = data.SqlServer.connectionString();
    if (prints.connectionString() != wanted) {
        if (prints.isOpen()) {
            // Rows read from the old database must not be shown as if they
            // came from the new one.
            data.Dividas.recordset().close();
            data.Extras.recordset().close();
            prints.close();
        }
        prints.setConnectionString(wanted);
    }
    if (!prints.isOpen())
        prints.open();
}

}  // namespace quotas
