// Measures a fill of the message list against reading and parsing each file once.
#include "InTurn.h"
#include "base/SharedVariables.h"
#include "messagelist/Summary.h"
#include "messages/Envelope.h"
#include "platform/files/files.h"
#include "platform/profile.h"

#include <QFile>
#include <QTemporaryDir>

#include <benchmark/benchmark.h>
#include <libxml/parser.h>

using namespace Qt::StringLiterals;

namespace kest {
namespace {

/// Returns a message of the usual size: about ten kilobytes, mostly quote lines.
QString message(int number)
{
    constexpr const char* types[] = {"QREQ", "QREQ", "QREQ", "QMQR", "MANQ"};
    QString lines;
    for (int line = 0; line < 30; ++line)
        lines +=
            u"<p754:labour><p754:quoteLineNumber>%1</p754:quoteLineNumber><p754:labourType>RR</p754:labourType>"
            "<p754:labourDescription>Remove and replace the front bumper bar, number %1</p754:labourDescription>"
            "<p754:labourAmount>100.50</p754:labourAmount></p754:labour>"_s.arg(line);
    return u"<p754:getQuoteResponse xmlns:p754=\"%1\"><messageType>%2</messageType>"
           "<p754:quoteRequestNumber>QR%3</p754:quoteRequestNumber><p754:claimNumber>7700001</p754:claimNumber>"
           "<p754:claimCustomer><p754:title>Mr</p754:title><p754:firstName>Alex</p754:firstName>"
           "<p754:surname>Tarrant</p754:surname></p754:claimCustomer>"
           "<p754:vehicleRegistration>XYZ789</p754:vehicleRegistration>"
           "<p754:vehicleDescription>Corella Meridian sedan</p754:vehicleDescription>"
           "<p754:quoteBody><p754:quoteReference>%3</p754:quoteReference><p754:labours>%4</p754:labours>"
           "</p754:quoteBody></p754:getQuoteResponse>"_s
               .arg(GetNamespaceURI(), QLatin1StringView(types[number % std::size(types)]))
               .arg(number)
               .arg(lines);
}

void readAndParseEach(const QString& folder, const QStringList& names)
{
    for (const QString& name : names) {
        QFile file(folder + u'/' + name);
        if (!file.open(QIODevice::ReadOnly))
            qFatal("%s can't be read", qPrintable(name));
        const QByteArray bytes = file.readAll();
        xmlDocPtr document =
            xmlReadMemory(bytes.constData(), static_cast<int>(bytes.size()), nullptr, "UTF-8", XML_PARSE_NONET);
        if (!document)
            qFatal("%s can't be parsed", qPrintable(name));
        xmlFreeDoc(document);
    }
}

void fillList(benchmark::State& state)
{
    const QTemporaryDir folder;
    profile::setRoot(folder.path());
    gsUnreadPath = u"c:\\wirdoc\\AUnread\\"_s;
    files::makeFolder(gsUnreadPath);
    const QString place = files::systemPath(gsUnreadPath);
    QStringList names;
    for (int i = 0; i < state.range(0); ++i) {
        names << u"%1.xml"_s.arg(i, 6, 10, QChar(u'0'));
        QFile file(place + u'/' + names.last());  // not files::write(), which waits for the disk each time
        if (!file.open(QIODevice::WriteOnly) || file.write(message(i).toLatin1()) < 0)
            qFatal("%s can't be written", qPrintable(file.fileName()));
    }
    readAndParseEach(place, names);  // the first time waits for the disk

    InTurn times(state);
    for (auto _ : state) {
        times.floor([&] { readAndParseEach(place, names); });
        qsizetype listed = 0;
        times.operation([&] { listed = BuildMessageList(MessageFolder::Unread, {}).size(); });
        if (listed != names.size())
            state.SkipWithError("not every message was listed");
    }
    profile::setRoot({});
}
BENCHMARK(fillList)->Arg(100)->Arg(1000)->Arg(10000)->Iterations(5)->UseManualTime()->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace kest
