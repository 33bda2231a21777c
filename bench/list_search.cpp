// Measures search as you type in the message list: the time for a key press, including painting the list.
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "messagelist/frmMessageList.h"
#include "messages/Envelope.h"
#include "platform/files/files.h"
#include "platform/profile.h"
#include "setup/QuoteDatabase.h"

#include <QApplication>
#include <QKeyEvent>
#include <QLabel>
#include <QTemporaryDir>
#include <QTreeView>

#include <benchmark/benchmark.h>

using namespace Qt::StringLiterals;

namespace kest {
namespace {

QString request(int number)
{
    return u"<p754:getQuoteRequestResponse xmlns:p754=\"%1\"><messageType>QREQ</messageType>"
           "<p754:quoteRequestNumber>QR%2</p754:quoteRequestNumber><p754:claimNumber>77%2</p754:claimNumber>"
           "<p754:claimCustomer><p754:title>Mr</p754:title><p754:firstName>Alex</p754:firstName>"
           "<p754:surname>Tarrant %2</p754:surname></p754:claimCustomer>"
           "<p754:vehicleRegistration>XYZ%2</p754:vehicleRegistration>"
           "<p754:vehicleDescription>Corella Meridian sedan</p754:vehicleDescription>"
           "</p754:getQuoteRequestResponse>"_s.arg(GetNamespaceURI())
               .arg(number);
}

/// Measures a key press. Types a text and deletes it again, over and over, so that few and many rows match in turn.
void searchKey(benchmark::State& state)
{
    const QTemporaryDir folder;
    profile::setRoot(folder.path());
    gsUnreadPath = u"c:\\wirdoc\\AUnread\\"_s;
    files::makeFolder(gsUnreadPath);
    for (int i = 0; i < state.range(0); ++i)
        files::write(gsUnreadPath + u"%1.xml"_s.arg(i, 6, 10, QChar(u'0')), request(i));
    gcnDB = gConn = app::openEmbedded(u"WirSql"_s);
    frmMessageList window;
    window.openUnread();
    window.show();
    QCoreApplication::processEvents();
    auto& list = *window.findChild<QTreeView*>(u"ListView1"_s);
    if (list.model()->rowCount() != state.range(0))
        qFatal("not every message was listed: %s", qPrintable(window.failure()));
    list.sortByColumn(2, Qt::DescendingOrder);

    constexpr int keys[] = {Qt::Key_T,         Qt::Key_A,         Qt::Key_R,         Qt::Key_R,
                            Qt::Key_Space,     Qt::Key_9,         Qt::Key_9,         Qt::Key_Backspace,
                            Qt::Key_Backspace, Qt::Key_Backspace, Qt::Key_Backspace, Qt::Key_Backspace,
                            Qt::Key_Backspace, Qt::Key_Backspace};
    size_t next = 0;
    for (auto _ : state) {
        const int key = keys[next++ % std::size(keys)];
        const QString text = key == Qt::Key_Backspace ? u"\b"_s : QString(QChar(key).toLower());
        QKeyEvent press(QEvent::KeyPress, key, Qt::NoModifier, text);
        QWidget* focused = window.focusWidget();
        QCoreApplication::sendEvent(focused ? focused : &list, &press);
        QCoreApplication::processEvents();
        window.repaint();
    }
    state.counters["rows"] = static_cast<double>(state.range(0));
    gConn.reset();
    gcnDB.reset();
    profile::setRoot({});
}
BENCHMARK(searchKey)->Arg(1000)->Arg(10000)->Iterations(280)->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace kest
