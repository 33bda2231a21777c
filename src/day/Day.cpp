#include "day/Day.h"

#include "base/SharedVariables.h"
#include "loopback/TransportRunner.h"
#include "loopback/TransportWindow.h"
#include "platform/RuntimeError.h"
#include "platform/desktop/Window.h"
#include "platform/files/files.h"
#include "platform/print/OutputFolder.h"
#include "setup/QuoteDatabase.h"
#include "utilities/frmLogin.h"

#include <QDir>
#include <QFile>
#include <QImage>
#include <QJsonDocument>
#include <QPainter>
#include <QPdfDocument>
#include <QRegularExpression>
#include <QScopeGuard>

namespace kest::app {

using namespace Qt::StringLiterals;

namespace {

const QString place = u":/sql/demo/day/"_s;
constexpr int pictureWidth = 1000;  // pixels of a report's page

QString textOf(const QString& step)
{
    registerResources();
    QFile file(place + step);
    if (!file.open(QIODevice::ReadOnly))
        throw RuntimeError(FileNotFound, u"The day has no step "_s + step);
    return QString::fromUtf8(file.readAll());
}

/// Executes statements as the host application would, on a connection of its own.
void writeInHost(const QString& statements)
{
    const db::ConnectionPtr host = openEmbedded(u"WirSql"_s);
    for (const QString& statement : statementsIn(withDates(statements, QDate::currentDate())))
        host->execute(statement);
}

QImage firstPageOf(const QString& pdf)
{
    QPdfDocument document;
    if (document.load(pdf) != QPdfDocument::Error::None)
        throw RuntimeError(FileInputOutput, pdf + u" is not a PDF file"_s);
    const QSizeF size = document.pagePointSize(0);
    QImage page(pictureWidth, qRound(pictureWidth * size.height() / size.width()), QImage::Format_RGB32);
    page.fill(Qt::white);
    QPainter(&page).drawImage(0, 0, document.render(0, page.size()));
    return page;
}

}  // namespace

Day::Day(const QString& folder) : pictures(QDir::cleanPath(QDir(folder).absolutePath())), transport(transportFolders())
{
    files::makeFolder(pictures);
}

QStringList Day::steps()
{
    registerResources();
    return QDir(place).entryList(QDir::Files, QDir::Name);
}

desktop::Record Day::play(const QString& step)
{
    static const QRegularExpression quoteInName(u"-(\\d{4})\\.json$"_s);
    desktop::Record shown;
    const QString text = textOf(step);
    if (step.endsWith(u".rules"_s))
        beginWith(text);
    else if (step.endsWith(u".sql"_s))
        writeInHost(text);
    else
        shown = driven(text, [&] {
            const QString quote = quoteInName.match(step).captured(1);
            component.ShowKESTWindow(quote.isEmpty() ? u"0"_s : quote, u"0"_s);
        });
    takePictures(step);
    carry();
    return shown;
}

void Day::beginWith(const QString& rules)
{
    for (const QString& file : files::list(gsUnreadPath))
        files::remove(gsUnreadPath + file);
    files::writeBytes(transportFolders().own + Transport::rulesName, rules.toUtf8());
    driven(u"{\"windows\": {\"KESTWeb\": [[{\"shot\": \"@pictures@/00-transport.png\"}]]}}"_s, [] {
        TransportWindow window(transportFolders());
        if (!window.claim())
            throw RuntimeError(PermissionDenied, u"Another transport is running for this shop."_s);
        window.run();
    });
}

desktop::Record Day::driven(const QString& text, const std::function<void()>& windows) const
{
    QString filled = text;
    filled.replace(u"@pictures@"_s, pictures);
    filled.replace(u"@password@"_s, QString::number(dayPassword(QDate::currentDate())));
    const auto script = std::make_shared<desktop::Script>(QJsonDocument::fromJson(filled.toUtf8()).object());
    for (const QString& window : {u"frmPrintPreview"_s, u"frmSubletAuth"_s, u"frmViewPDF"_s})
        script->recordAndClose(window);

    desktop::useScript(script);
    report::setOutputFolder(pictures + u"/reports"_s);
    const auto end = qScopeGuard([] {
        report::setOutputFolder({});
        desktop::useScript(nullptr);
    });
    windows();
    desktop::throwKept();
    return script->record();
}

/// Saves a picture of the first page of each report that the step has shown, such as "05-report-1-730.png".
void Day::takePictures(const QString& step)
{
    const QDir reports(pictures + u"/reports"_s);
    for (const QString& file : reports.entryList({u"*.pdf"_s}))
        firstPageOf(reports.filePath(file))
            .save(u"%1/%2-report-%3.png"_s.arg(pictures, step.first(2), file.chopped(4)));
    QDir(reports).removeRecursively();
}

void Day::carry()
{
    const Carry carried = transport.carry();
    if (!carried.faults.isEmpty())
        throw RuntimeError(FileInputOutput, carried.faults.join(u'\n'));
}

}  // namespace kest::app
