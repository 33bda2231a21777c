#include "BenchShop.h"

#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "platform/files/files.h"
#include "platform/profile.h"
#include "setup/QuoteDatabase.h"

namespace kest {

using namespace Qt::StringLiterals;

BenchShop::BenchShop()
{
    profile::setRoot(root());
    for (const auto& [variable, path] :
         {std::pair(&gsUnreadPath, u"c:\\wirdoc\\AUnread\\"_s), std::pair(&gsReadPath, u"c:\\wirdoc\\ARead\\"_s),
          std::pair(&gsUnsentPath, u"c:\\wirdoc\\AUnsent\\"_s), std::pair(&gsSentPath, u"c:\\wirdoc\\ASent\\"_s),
          std::pair(&gsImagesPath, u"c:\\wirimg\\"_s)}) {
        files::makeFolder(path);
        *variable = path;
    }
    gsListFolder = gsUnreadPath;  // from which a load prints its message; without a template there is no page
    gcnDB = gConn = app::openEmbedded(u"WirSql"_s);
    app::createTables(*gConn, app::Server::Embedded);
    app::fillNewShop(*gConn);
}

BenchShop::~BenchShop()
{
    gConn.reset();
    gcnDB.reset();
    profile::setRoot({});
}

}  // namespace kest
