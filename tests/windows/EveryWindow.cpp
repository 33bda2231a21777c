#include "windows/EveryWindow.h"

#include "app/ProfileWindow.h"
#include "base/Journal.h"
#include "base/SharedVariables.h"
#include "loopback/TransportWindow.h"
#include "messagelist/frmHeld.h"
#include "messagelist/frmMessageList.h"
#include "outbound/frmExtraInfo.h"
#include "platform/desktop/Person.h"
#include "platform/script/Gestures.h"
#include "reports/frmPrintPreview.h"
#include "sublets/PdfViewer.h"
#include "sublets/frmSubletAuth.h"
#include "support/Hands.h"
#include "utilities/frmHistory.h"
#include "utilities/frmLogin.h"
#include "utilities/frmUtilities.h"
#include "utilities/frmViewXML.h"

namespace kest::test {

namespace {

const QString document = u"c:\\wirdoc\\PDF\\500.0_1.pdf"_s;

bool isBuiltIn(const QWidget& widget)
{
    for (const QWidget* above = widget.parentWidget(); above && !above->isWindow(); above = above->parentWidget())
        if (isA<QLineEdit, QComboBox, QAbstractItemView, QTabBar>(*above))
            return true;
    return false;
}

bool isControl(const QWidget& widget)
{
    const bool isView = isA<QAbstractScrollArea>(widget) && widget.focusPolicy() != Qt::NoFocus;
    return isView || isA<QAbstractButton, QLineEdit, QComboBox, QTabBar>(widget);
}

}  // namespace

EveryWindow::EveryWindow()
{
    putTemplate(710);
    arrive("a.xml", quoteRequest("QR1"));
    arrive("b.xml", cancellation("QR2"));
    arrive("c.xml", cancellation("QR2"));
    files::write(gsReadPath + u"500.xml"_s, quoteRequest("QR1").text());
    auto row = quote("500");
    quote("500", 1);
    row.line(1, "MIS", "Wheel alignment").set("VENDOR", vendor("Straight Track").id());
    const journal::Operation operation(journal::Kind::Save);
    gConn->execute(u"UPDATE QUOTE1 SET CLAIM='7700002' WHERE QTNNO='500'"_s);
    QPdfWriter writer(files::systemPath(document));
    QPainter(&writer).drawText(2000, 2000, u"Authority for sublet work"_s);
}

// Shows real boxes, without a script.
void EveryWindow::showBox(const std::function<void()>& show, const Check& check)
{
    desktop::usePerson();
    whenShown<QDialog>([&](QDialog& box) {
        desktop::gestures::activate(box);
        check(box);
        box.close();
    });
    SCOPED_TRACE("a box");
    show();
}

void EveryWindow::each(const Check& check)
{
    const auto readFolder = [&](QDialog& window) {
        window.findChild<QAbstractButton*>(u"Option1(1)"_s)->click();
        check(window);
    };
    bool passed = false;
    const struct {
        const char* name;
        Check check;
        std::function<void()> show;
    } windows[] = {
        {"frmKEST", check, [] { eKEST().ShowKESTWindow(u"500"_s, u"0"_s); }},
        {"frmMessageList", check, [] { frmMessageList::ShowForm(); }},
        {"frmMessageList", readFolder, [] { frmMessageList::ShowForm(); }},
        {"frmHeld", check,
         [] {
             frmHeld::ShowForm({{u"b.xml"_s, u"Quote Request"_s, u"a.xml"_s, {}}});
         }},
        {"frmExtraInfo", check, [] { frmExtraInfo::ShowForm(u"500"_s, u"0"_s); }},
        {"frmSubletAuth", check, [] { frmSubletAuth::ShowForm(u"500"_s, u"0"_s); }},
        {"frmViewPDF", check, [] { showPdf(document); }},
        {"frmPrintPreview", check, [] { frmPrintPreview::ShowForm(710, QString(), nullptr); }},
        {"frmLogin", check, [&] { frmLogin::ShowForm(passed); }},
        {"frmUtilities", check, [] { frmUtilities::ShowForm(u"500"_s, u"0"_s); }},
        {"frmHistory", check, [] { frmHistory::ShowForm(u"500"_s, [](qint64) { return false; }); }},
        {"frmViewXML", check,
         [] {
             gsCurFolder = gsUnreadPath;  // the list has left it in another folder
             frmViewXML::ShowForm(u"a.xml"_s);
         }},
        {"frmProfile", check, [] { app::ProfileWindow::ShowForm(); }},
        {"KESTWeb", check, [] { app::TransportWindow(app::transportFolders()).run(); }},
    };
    gsCurFolder = gsUnreadPath;
    for (const auto& [name, checkOfWindow, show] : windows) {
        SCOPED_TRACE(name);
        desktop.emplace();
        int seen = 0;
        const Hands hands({{QString::fromLatin1(name),
                            [&](QDialog& window) {
                                if (++seen == 1)
                                    checkOfWindow(window);
                            }},
                           {u"*"_s, [](QDialog&) {}}});  // one that a button has opened
        show();
        EXPECT_GE(seen, 1);
    }
    showBox([] { desktop::ask(u"Are you SURE ?"_s, desktop::Icon::Critical); }, check);
    showBox([] { desktop::inputBox(u"Enter a Quote Number"_s, u"View KEST Messages"_s); }, check);
    desktop.emplace();
}

QList<QWidget*> controlsOf(const QDialog& window)
{
    QList<QWidget*> result = visible<QWidget>(window);
    result.removeIf([](const QWidget* one) { return !isControl(*one) || !one->isEnabled() || isBuiltIn(*one); });
    return result;
}

std::string nameOf(const QWidget& control)
{
    const QString caption = control.property("text").toString();
    return (control.objectName() + " ("_L1 + QLatin1StringView(control.metaObject()->className()) + ' '_L1 + caption +
            ')'_L1)
        .toStdString();
}

}  // namespace kest::test
