#include "shell/eKEST.h"

#include "base/ModRegistry.h"
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "base/modLoggerEx.h"
#include "platform/Prompt.h"
#include "platform/RuntimeError.h"
#include "platform/desktop/Form.h"
#include "platform/desktop/Person.h"
#include "platform/desktop/Window.h"
#include "platform/files/Background.h"
#include "platform/files/files.h"
#include "platform/profile.h"
#include "quotedata/Quote.h"
#include "recovery/Recovery.h"
#include "shell/frmKEST.h"

#include <QRegularExpression>

namespace kest {

using namespace Qt::StringLiterals;

namespace {

constexpr int closingWait = 500;  // milliseconds

QString homeFolder()
{
    return GetRegSetting(u"wirra32"_s, u"frmsplash"_s, u"EcomHome"_s, u"c:\\wirdoc\\"_s);
}

int objects = 0;  // all objects share the connection and the folders; the last one closes them

/// Not at the start, which would take longer with every message and picture in the folders.
void removeLeftOvers()
{
    for (const QString& folder : {gsUnreadPath, gsReadPath, gsUnsentPath, gsSentPath, homeFolder() + u"PDF\\"_s,
                                  gsImagesPath, profile::root(), profile::componentFolder()})
        files::removeLeftOvers(folder);
}

void reportUntrapped(const RuntimeError& error, const QString& source)
{
    LogError(error, source, source.mid(source.indexOf(u'.') + 1));
}

}  // namespace

QString aboutText()
{
    if (gsServer.isEmpty())  // nothing has opened the database yet
        readConnectionSettings();
    static const QRegularExpression indent(u"\\n\\s+"_s);
    const QString lastError = lastLogRecord().replace(indent, u"\n"_s);
    return u"KEST2 " KEST_VERSION "\nProfile: "_s + profile::root() + u"\nDatabase: "_s + databaseDescription() +
           u"\nError log: "_s + errorLogPath() + u"\nLast error: "_s + (lastError.isEmpty() ? u"none"_s : lastError);
}

eKEST::eKEST()
{
    ++objects;
    desktop::setAbout(aboutText);
    desktop::setFailureReporter(reportUntrapped);
    desktop::showWaits();
    gConn = GetConnection();
    gsUnreadPath = homeFolder() + u"AUnread\\"_s;
    gsReadPath = homeFolder() + u"ARead\\"_s;
    gsUnsentPath = homeFolder() + u"AUnsent\\"_s;
    gsSentPath = homeFolder() + u"ASent\\"_s;
    gsImagesPath = GetRegSetting(u"wirra32"_s, u"frmsplash"_s, u"ImagesPath"_s, u"c:\\wirimg\\"_s);
    files::resumeRemovals();
    setAfterOpening([] { recovery::settle(); });
}

eKEST::~eKEST()
{
    if (--objects > 0)
        return;
    attempt(removeLeftOvers);
    grsQuote.reset();
    gConn.reset();
    gcnDB.reset();
}

void eKEST::ShowKESTWindow(const QString& sQTNNO, const QString& sSubQuote)
{
    desktop::guarded(u"eKEST.ShowKESTWindow"_s, [&] {
        frmKEST panel;
        EnsureConnection();
        recovery::settle();  // first, because it may change the quote that the panel opens
        if (!openHostQuote(sQTNNO, sSubQuote))
            return;
        recovery::showSettled();
        desktop::showModal(panel);
    });
    files::waitForBackground(closingWait);
}

bool hasConnection()
{
    gConn = GetConnection();
    if (!gConn) {
        constexpr qsizetype longestReason = 300;  // characters; the error log contains the whole text
        desktop::msgBox(u"Could not connect to the quote database, Please contact MarlinDesk Support.\r\n\r\n"_s +
                            connectionFailure().left(longestReason),
                        desktop::Icon::Critical);
    }
    return gConn != nullptr;
}

bool openHostQuote(const QString& sQTNNO, const QString& sSubQuote)
{
    if (!hasConnection())
        return false;
    grsQuote = std::make_shared<db::Recordset>(Quote::openHeader({sQTNNO, sSubQuote}));
    gsQTNNO = sQTNNO;
    gsSubQuote = sSubQuote;
    return true;
}

}  // namespace kest
