#include "sublets/frmSubletAuth.h"

#include "base/Journal.h"
#include "base/modDBAccess.h"
#include "platform/Prompt.h"
#include "platform/desktop/Lists.h"
#include "platform/desktop/Window.h"
#include "sublets/PdfViewer.h"

#include <QHBoxLayout>
#include <QHeaderView>
#include <QJsonArray>
#include <QPushButton>
#include <QTreeWidget>
#include <QVBoxLayout>

using namespace Qt::StringLiterals;

namespace kest {

namespace {

constexpr int fileRole = Qt::UserRole;  // the file name of the row's document
constexpr int keyRole = Qt::UserRole + 1;

}  // namespace

frmSubletAuth::frmSubletAuth(const QList<SubletDocument>& documents)
    : Form(u"frmSubletAuth"_s, u"Sublet Authority Documents"_s),
      folder(subletFolder()),
      ListView1(new QTreeWidget),
      Command1(button(u"Command1"_s, u"&Open"_s, [this] { Command1_Click(); })),
      Command2(button(u"Command2"_s, u"&Close"_s, [this] { Command2_Click(); }))
{
    resize(desktop::pixels(9000, 4800));

    ListView1->setObjectName("ListView1"_L1);
    ListView1->setAccessibleName(u"Documents"_s);
    ListView1->setHeaderLabels({u"Description"_s, u"Vendor"_s});
    desktop::prepareList(*ListView1, objectName());
    ListView1->header()->resizeSection(0, desktop::pixels(5000));
    for (const SubletDocument& document : documents) {
        auto* item = new QTreeWidgetItem(ListView1, {document.description, document.vendor});
        item->setData(0, keyRole, u'K' + document.lineNumber);
        item->setData(0, fileRole, document.file);
        item->setToolTip(0, document.description);
        item->setToolTip(1, document.vendor);
    }
    ListView1->setCurrentItem(ListView1->topLevelItem(0));

    Command1->setDefault(true);

    desktop::addListMenu(*ListView1, objectName(), {Command1});

    auto* buttons = new QHBoxLayout;
    buttons->addStretch();
    buttons->addWidget(Command1);
    buttons->addWidget(Command2);
    auto* layout = new QVBoxLayout(this);
    layout->addWidget(ListView1);
    layout->addLayout(buttons);

    on(ListView1, &QTreeWidget::itemDoubleClicked, u"ListView1_DblClick"_s, [this] { Command1_Click(); });
}

void frmSubletAuth::ShowForm(const QString& QTNNO, const QString& Subquote)
{
    EnsureConnection();  // it may have been lost while the report was open
    const QuoteKey quote{QTNNO, Subquote};
    const QStringList numbers = subletDocumentNumbers(quote);
    if (numbers.isEmpty())
        return;
    const QList<SubletDocument> documents = subletDocuments(quote, numbers);
    QJsonArray rows;
    for (const SubletDocument& document : documents)
        rows.append(QJsonArray{document.description, document.vendor});
    desktop::recordWindow({{u"name"_s, u"frmSubletAuth"_s}, {u"rows"_s, rows}});
    frmSubletAuth form(documents);
    desktop::showModal(form);
    attempt([] {
        EnsureConnection();  // the server may have dropped it while the window was open
        journal::keep(u"subletsShown"_s, true);
    });
}

void frmSubletAuth::Command1_Click()
{
    for (const QTreeWidgetItem* chosen : ListView1->selectedItems())
        showPdf(folder + chosen->data(0, fileRole).toString());
}

void frmSubletAuth::Command2_Click()
{
    close();
}

}  // namespace kest
