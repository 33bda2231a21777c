#include "utilities/frmUtilities.h"

#include "base/Helpers.h"
#include "base/Journal.h"
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "platform/Prompt.h"
#include "platform/database/Sql.h"
#include "platform/desktop/Colours.h"
#include "platform/desktop/Window.h"
#include "platform/values.h"
#include "quotedata/NoteChain.h"
#include "quotedata/Quote.h"
#include "utilities/ExactTextEdit.h"
#include "utilities/StatusRepair.h"

#include <QApplication>
#include <QCheckBox>
#include <QGridLayout>
#include <QGroupBox>
#include <QHBoxLayout>
#include <QLabel>
#include <QLineEdit>
#include <QPushButton>
#include <QTabBar>
#include <QVBoxLayout>

#include <utility>

using namespace Qt::StringLiterals;

namespace kest {

namespace {

struct Field {
    QLatin1StringView name;
    QLatin1StringView label;
    QLatin1StringView column;  // of QUOTE1; empty if the value comes from somewhere else
    bool editable;
};

constexpr Field fields[] = {
    {"txtQTNNO"_L1, "Quote No"_L1, ""_L1, false},
    {"txtRego"_L1, "Rego"_L1, "REGO"_L1, false},
    {"txtJobStage"_L1, "Job Stage"_L1, ""_L1, false},
    {"txtInsurer"_L1, "Insurer"_L1, ""_L1, false},
    {"txtQRNo"_L1, "KEST Q&R No"_L1, "KESTQRNo"_L1, true},
    {"txtQRVer"_L1, "QR &Ver"_L1, "KESTQRVer"_L1, true},
    {"txtQuoteNo"_L1, "KEST &Quote No"_L1, "KESTQuoteNo"_L1, true},
    {"txtClaimNo"_L1, "KEST Cla&im No"_L1, "Claim"_L1, true},
    {"txtAuthNo"_L1, "KEST &Auth No"_L1, "KESTAuthNo"_L1, true},
    {"txtAuthDate"_L1, "KEST Auth &Date"_L1, "AuthDate"_L1, true},
};

QLabel* labelOf(QWidget* control, const QString& caption)
{
    auto* label = new QLabel(caption);
    label->setBuddy(control);
    label->setIndent(desktop::pixels(30));  // room for a "J", which is drawn a little to the left of its origin
    return label;
}

/// Returns the only value of a query, or an empty text if it finds no row.
QString firstValueOf(const QString& select)
{
    db::Recordset row(gConn);
    row.open(select);
    return row.eof() ? QString() : row.text(row.columns().first());
}

}  // namespace

frmUtilities::frmUtilities(const QuoteKey& key, frmHistory::Undo undo)
    : Form(u"frmUtilities"_s, u"Utilities"_s),
      undoLoad(std::move(undo)),
      shown(key),
      quote(gConn),
      lines(gConn),
      remarks(gConn),
      TabStrip1(new QTabBar),
      chkReadOnly(new QCheckBox(u"Read Onl&y"_s)),
      chkExtraInfo(new QCheckBox(u"E&xtra Information"_s)),
      txtRemarks(new ExactTextEdit)
{
    TabStrip1->setObjectName("TabStrip1"_L1);
    TabStrip1->setAccessibleName(u"Quote and additionals"_s);
    TabStrip1->setExpanding(false);

    auto* layout = new QVBoxLayout(this);
    layout->addWidget(TabStrip1);
    layout->addWidget(quoteInformation(), 1);
    layout->addWidget(setQuoteStatus());
    layout->addWidget(closingButtons());
    chooseColours();
    box("txtQRNo"_L1)->setFocus();
}

QWidget* frmUtilities::quoteInformation()
{
    auto* frame = new QGroupBox(u"Quote Information"_s);
    auto* grid = new QGridLayout(frame);
    grid->setHorizontalSpacing(desktop::pixels(150));
    int place = 0;
    for (const Field& field : fields) {
        auto* text = new QLineEdit;
        text->setObjectName(field.name);
        text->setMinimumWidth(desktop::pixels(2400));
        text->setReadOnly(!field.editable);
        const int column = place % 2 * 2;
        grid->addWidget(labelOf(text, field.label), place / 2, column);
        grid->addWidget(text, place / 2, column + 1);
        ++place;
    }
    const int below = place / 2;
    chkReadOnly->setObjectName("chkReadOnly"_L1);
    chkExtraInfo->setObjectName("chkExtraInfo"_L1);
    grid->addWidget(chkReadOnly, below, 1);
    grid->addWidget(chkExtraInfo, below, 3);
    txtRemarks->setObjectName("txtRemarks"_L1);
    txtRemarks->setTabChangesFocus(true);
    desktop::showFocus(*txtRemarks);
    txtRemarks->setMinimumHeight(desktop::pixels(1500));
    grid->addWidget(labelOf(txtRemarks, "Re&marks"_L1), below + 1, 0, Qt::AlignTop);
    grid->addWidget(txtRemarks, below + 1, 1, 1, 3);
    grid->setRowStretch(below + 1, 1);
    return frame;
}

QWidget* frmUtilities::setQuoteStatus()
{
    auto* frame = new QGroupBox(u"Set Quote Status"_s);
    auto* row = new QHBoxLayout(frame);
    for (const StatusRepair& repair : statusRepairs()) {
        if (repair.startsGroup)
            row->addSpacing(desktop::pixels(600));
        row->addWidget(Form::button(repair.button, repair.caption, [this, &repair] { setStatus(repair); }));
    }
    row->addStretch();
    return frame;
}

QWidget* frmUtilities::closingButtons()
{
    auto* buttons = new QWidget;
    auto* row = new QHBoxLayout(buttons);
    row->setContentsMargins({});
    row->addWidget(button(u"Command9"_s, u"&Undo"_s, &frmUtilities::Command9_Click));
    row->addWidget(button(u"cmdHistory"_s, u"&History"_s, &frmUtilities::cmdHistory_Click));
    row->addStretch();
    row->addWidget(button(u"Command1"_s, u"&Save"_s, &frmUtilities::Command1_Click));
    row->addWidget(button(u"Command2"_s, u"&Close"_s, &frmUtilities::Command2_Click));
    return buttons;
}

QPushButton* frmUtilities::button(const QString& name, const QString& caption, void (frmUtilities::*click)())
{
    return Form::button(name, caption, [this, click] {
        EnsureConnection();
        (this->*click)();
    });
}

// Fields that can't be changed look like their window.
void frmUtilities::chooseColours()
{
    for (const Field& field : fields) {
        if (field.editable)
            continue;
        QPalette colours = QApplication::palette(box(field.name));
        colours.setColor(QPalette::Base, colours.color(QPalette::Window));
        box(field.name)->setPalette(colours);
    }
}

QLineEdit* frmUtilities::box(QLatin1StringView name) const
{
    return findChild<QLineEdit*>(name);
}

void frmUtilities::ShowForm(const QString& sQTNNO, const QString& sSubQuote, const frmHistory::Undo& undoLoad)
{
    EnsureConnection();
    frmUtilities form({sQTNNO, sSubQuote.isEmpty() ? u"0"_s : sSubQuote}, undoLoad);
    form.addTabs();
    form.openRows();
    form.fill();
    desktop::showModal(form);
}

void frmUtilities::addTabs()
{
    const auto add = [this](const QString& caption, const QString& ofSubquote) {
        TabStrip1->setTabData(TabStrip1->addTab(caption), u'S' + ofSubquote);
    };
    add(u"Quote"_s, u"0"_s);
    db::Recordset subquotes(gConn);
    subquotes.open(sql("SELECT SUBQUOTE FROM QUOTE1 WHERE QTNNO='{}' ORDER BY SUBQUOTE", shown.number));
    if (subquotes.recordCount() > 1) {
        for (subquotes.moveNext(); !subquotes.eof(); subquotes.moveNext())
            add(u"Add.-"_s + subquotes.text(u"SUBQUOTE"_s), subquotes.text(u"SUBQUOTE"_s));
    }
    for (int tab = TabStrip1->count() - 1; tab >= 0; --tab) {  // backwards: if two tabs match, the first is chosen
        if (TabStrip1->tabData(tab).toString() == u'S' + shown.subquote)
            TabStrip1->setCurrentIndex(tab);
    }
    shownTab = TabStrip1->currentIndex();
    on(TabStrip1, &QTabBar::currentChanged, u"TabStrip1_Click"_s, [this] { TabStrip1_Click(); });
}

void frmUtilities::openRows()
{
    quote = Quote::openHeader(shown);
    lines = Quote::openLines(shown);
    remarks = Quote::openNotes(shown);
}

void frmUtilities::closeRows()
{
    quote.close();
    lines.close();
    remarks.close();
}

void frmUtilities::fill()
{
    for (const Field& field : fields) {
        if (!field.column.isEmpty())
            box(field.name)->setText(quote.text(field.column));
    }
    box("txtQTNNO"_L1)->setText(QuoteKey{quote.text(u"QTNNO"_s), shown.subquote}.reference());
    box("txtJobStage"_L1)
        ->setText(firstValueOf(sql("SELECT description FROM JOBSTAGE WHERE stage={}", quote.value(u"Job_stage"_s))));
    box("txtInsurer"_L1)
        ->setText(firstValueOf(sql("SELECT NAME FROM INSURER WHERE INSURER_ID={}", quote.value(u"INSURER_ID"_s))));
    chkReadOnly->setChecked(isTrue(quote.value(u"ReadOnly"_s)));
    chkExtraInfo->setChecked(isTrue(quote.value(u"ExtraInfo"_s)));
    txtRemarks->setExactText(remarks.eof() ? QString() : remarks.text(u"remarks"_s));
}

void frmUtilities::TabStrip1_Click()
{
    EnsureConnection();
    QuoteKey wanted{shown.number, TabStrip1->tabData(TabStrip1->currentIndex()).toString().mid(1)};
    if (Quote::openHeader(wanted).eof()) {
        const QSignalBlocker silent(TabStrip1);
        TabStrip1->setCurrentIndex(shownTab);
        throw RuntimeError(NoCurrentRow, u"Quote %1 no longer exists."_s.arg(wanted.fullReference()));
    }
    shownTab = TabStrip1->currentIndex();
    if (wanted.subquote.isEmpty())
        wanted.subquote = u"0"_s;
    shown = wanted;
    Command9_Click();
}

void frmUtilities::Command9_Click()
{
    closeRows();
    openRows();
    fill();
}

void frmUtilities::Command1_Click()
{
    if (SafeVal(box("txtClaimNo"_L1)->text(), u"0"_s) <= 0) {
        desktop::msgBox(u"Invalid Claim Number Entered"_s, desktop::Icon::Critical);
        box("txtClaimNo"_L1)->setFocus();
        return;
    }
    writeQuote();
    writeRemarks();
    journal::Operation operation(journal::Kind::Save);
    quote.update();
    journal::passPoint([&] { remarks.update(); });
    operation.end(journal::State::Done);
    closeRows();
    close();  // first: the changes are saved even if the host's quote can't be opened

    // even if another subquote was edited
    grsQuote = std::make_shared<db::Recordset>(Quote::openHeader({gsQTNNO, gsSubQuote}));
}

void frmUtilities::writeField(QLatin1StringView name, const QString& column)
{
    const QString text = box(name)->text();
    const bool noDate = column == "AuthDate"_L1 && text.isEmpty();
    try {
        quote.set(column, noDate ? QVariant() : QVariant(text));
    } catch (const RuntimeError&) {
        box(name)->setFocus();
        throw;
    }
}

void frmUtilities::writeQuote()
{
    for (const Field& field : fields) {
        if (field.editable)
            writeField(field.name, field.column);
    }
    quote.set(u"ReadOnly"_s, chkReadOnly->isChecked());
    quote.set(u"ExtraInfo"_s, chkExtraInfo->isChecked());
}

void frmUtilities::writeRemarks()
{
    const QString text = txtRemarks->exactText();
    if (remarks.eof()) {
        if (text.isEmpty())
            return;
        remarks.addNew();
        remarks.set(u"QTNNO"_s, quote.value(u"QTNNO"_s));
        remarks.set(u"Subquote"_s, quote.value(u"Subquote"_s));
    }
    remarks.set(u"remarks"_s, text);
}

void frmUtilities::Command2_Click()
{
    closeRows();
    close();
}

void frmUtilities::cmdHistory_Click()
{
    if (!frmHistory::ShowForm(shown.number, undoLoad))
        return;
    if (!Quote::openHeader(shown).eof())
        return Command9_Click();  // the fields show what was undone
    desktop::msgBox(u"Quote %1 no longer exists."_s.arg(shown.fullReference()), desktop::Icon::Information);
    Command2_Click();
}

void frmUtilities::setStatus(const StatusRepair& repair)
{
    chkReadOnly->setChecked(repair.locks);
    QString chain = txtRemarks->exactText();
    for (const QString& subject : repair.removed)
        chain = RemoveNote(subject, chain);
    if (repair.forgetsQuoteNumber)
        box("txtQuoteNo"_L1)->clear();
    for (const StatusRepair::Note& note : repair.added) {
        if (!note.mainQuoteOnly || shown.isMain())
            chain = AddNote(note.subject, note.status, chain, {}, false);
    }
    txtRemarks->setExactText(chain);
}

}  // namespace kest
