#include "base/SharedVariables.h"

namespace kest {

db::ConnectionPtr gConn;

QString gsUnreadPath;
QString gsReadPath;
QString gsUnsentPath;
QString gsSentPath;
QString gsImagesPath;

std::shared_ptr<db::Recordset> grsQuote;
QString gsQTNNO;
QString gsSubQuote;

QString gsCurFolder;
QString gsListFolder;
QMap<QString, QString> gdicQuoteRequests;
QString gsListFilter;
bool gbFilterAsked = false;

QString gsMatchedQTNNO;
QString gsDeletedQTNNO;
QString gsDeletedSubquote;

bool gbTabletLocal = false;

}  // namespace kest
