#include "jobexport/JobLinkSettings.h"

#include "base/CredentialCipher.h"
#include "base/SharedVariables.h"
#include "platform/database/Recordset.h"
#include "platform/database/Sql.h"

namespace kest {

using namespace Qt::StringLiterals;

void storeJobLinkSettings(const JobLinkSettings& settings)
{
    db::Recordset row(gConn);
    row.open(u"SELECT * FROM ExternalSettings WHERE TAG='JOBLINK'"_s);
    if (row.eof()) {
        row.addNew();
        row.set(u"TAG"_s, u"JOBLINK"_s);
    }
    row.set(u"ServerName"_s, settings.server);
    row.set(u"Port"_s, settings.port);
    row.set(u"Property1"_s, settings.database);
    row.set(u"UserName"_s, settings.user);
    row.set(u"passWord"_s, encryptText(settings.password));
    row.update();
}

}  // namespace kest
