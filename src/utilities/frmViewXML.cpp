#include "utilities/frmViewXML.h"

#include "base/SharedVariables.h"
#include "platform/Prompt.h"
#include "platform/desktop/Colours.h"
#include "platform/desktop/StatusLine.h"
#include "platform/desktop/Window.h"
#include "platform/files/files.h"
#include "utilities/ExactTextEdit.h"
#include "utilities/FormatXML.h"
#include "utilities/frmLogin.h"

#include <QCloseEvent>
#include <QFontDatabase>
#include <QHBoxLayout>
#include <QKeyEvent>
#include <QLineEdit>
#include <QPushButton>
#include <QRegularExpression>
#include <QShortcut>
#include <QTextBlock>

using namespace Qt::StringLiterals;

namespace kest {

namespace {

constexpr int tabWidth = 4;    // characters
constexpr int titleBar = 405;  // twips; the places of the controls are counted from the height with the title bar

/// Returns true for keys that change the text: not for cursor keys and shortcuts, nor for Escape, which closes the
/// window.
bool isTyping(const QKeyEvent& key)
{
    return !key.text().isEmpty() && !(key.modifiers() & Qt::ControlModifier) && key.key() != Qt::Key_Escape;
}

}  // namespace

frmViewXML::frmViewXML(const QString& file)
    : Form(u"frmViewXML"_s, u"View XML"_s),
      sFile(file),
      txtXML(new ExactTextEdit(this)),
      Command1(desktop::exitButton(this, u"Command1"_s)),
      Command2(new QPushButton(this)),
      findBar(new QWidget(this)),
      txtFind(new QLineEdit(this)),
      lblPosition(new desktop::StatusLine(u"lblPosition"_s))
{
    setWindowFlag(Qt::WindowMaximizeButtonHint);
    setMinimumSize(desktop::pixels(9000, 4500));
    resize(desktop::pixels(13500, 9600));

    txtXML->setObjectName("txtXML"_L1);
    txtXML->setAccessibleName(u"Text of the message"_s);
    txtXML->setFont(QFontDatabase::systemFont(QFontDatabase::FixedFont));
    txtXML->setLineWrapMode(QPlainTextEdit::NoWrap);
    txtXML->setTabStopDistance(tabWidth * QFontMetricsF(txtXML->font()).horizontalAdvance(u' '));
    txtXML->installEventFilter(this);
    desktop::showFocus(*txtXML);
    Command2->setObjectName("Command2"_L1);
    Command2->setText(u"&Save"_s);

    fillFindBar();

    on(Command1, &QPushButton::clicked, u"Command1_Click"_s, [this] { Command1_Click(); });
    on(Command2, &QPushButton::clicked, u"Command2_Click"_s, [this] { Command2_Click(); });
    on(new QShortcut(QKeySequence::Save, this), &QShortcut::activated, u"Command2_Click"_s,
       [this] { Command2->click(); });
    on(txtXML, &QPlainTextEdit::cursorPositionChanged, u"txtXML_SelChange"_s, [this] { showPosition(); });
    on(txtXML, &QPlainTextEdit::textChanged, u"txtXML_Change"_s, [this] { enableSave(); });
    on(txtXML, &QPlainTextEdit::updateRequest, u"txtXML_Paint"_s, [this] { colourVisibleTags(); });
}

void frmViewXML::fillFindBar()
{
    txtFind->setAccessibleName(u"Find"_s);
    txtFind->setPlaceholderText(u"Find (Ctrl+F)"_s);
    txtFind->setClearButtonEnabled(true);
    txtFind->installEventFilter(this);
    auto* previous = new QPushButton(u"&Previous"_s);
    auto* next = new QPushButton(u"&Next"_s);
    txtFind->setObjectName("txtFind"_L1);
    previous->setObjectName("cmdFindPrevious"_L1);
    next->setObjectName("cmdFindNext"_L1);
    auto* row = new QHBoxLayout(findBar);
    row->setContentsMargins({});
    row->addWidget(txtFind, 1);
    row->addWidget(previous);
    row->addWidget(next);
    row->addWidget(lblPosition);
    QWidget* before = txtXML;
    for (QWidget* control : std::initializer_list<QWidget*>{txtFind, previous, next, Command2, Command1}) {
        setTabOrder(before, control);
        before = control;
    }

    const auto find = [this](auto* sender, auto signal, QTextDocument::FindFlags direction) {
        on(sender, signal, u"Find"_s, [this, direction] { findNext(direction); });
    };
    find(txtFind, &QLineEdit::returnPressed, {});
    find(next, &QPushButton::clicked, {});
    find(previous, &QPushButton::clicked, QTextDocument::FindBackward);
    find(new QShortcut(QKeySequence(Qt::Key_F3), this), &QShortcut::activated, {});
    find(new QShortcut(QKeySequence(Qt::SHIFT | Qt::Key_F3), this), &QShortcut::activated, QTextDocument::FindBackward);
    on(new QShortcut(QKeySequence::Find, this), &QShortcut::activated, u"Find"_s, [this] {
        txtFind->setFocus();
        txtFind->selectAll();
    });
}

void frmViewXML::ShowForm(const QString& file)
{
    frmViewXML form(file);
    const QString text = FormatXML(gsCurFolder + file);
    form.txtXML->setExactText(text);
    form.isShown = !text.isEmpty();
    form.enableSave();
    form.showPosition();
    desktop::showModal(form);
}

bool frmViewXML::eventFilter(QObject* watched, QEvent* event)
{
    if (watched == txtXML && event->type() == QEvent::KeyPress && isTyping(*static_cast<QKeyEvent*>(event)))
        unchanged = false;
    if (watched == txtFind && event->type() == QEvent::KeyPress && !txtFind->text().isEmpty() &&
        static_cast<QKeyEvent*>(event)->key() == Qt::Key_Escape) {
        txtFind->clear();
        return true;
    }
    return Form::eventFilter(watched, event);
}

void frmViewXML::resizeEvent(QResizeEvent* event)
{
    Form::resizeEvent(event);
    const int formWidth = desktop::twips(width());
    const int formHeight = desktop::twips(height()) + titleBar;
    if (formWidth <= 600 || formHeight <= 2000)
        return;
    const auto place = [](QWidget* control, int left, int top, int controlWidth, int controlHeight) {
        control->setGeometry(
            {QPoint(desktop::pixels(left), desktop::pixels(top)), desktop::pixels(controlWidth, controlHeight)});
    };
    constexpr int margin = 375 / 2;
    constexpr int buttonHeight = 540;
    place(txtXML, margin, 120, formWidth - 375, formHeight - 1350);
    const auto placeButton = [&](QPushButton* button, int left, int width) {
        const int height = desktop::twips(button->sizeHint().height());
        place(button, left, formHeight - 1125 + (buttonHeight - height) / 2, width, height);
    };
    placeButton(Command1, formWidth - 870, 870 - margin);
    placeButton(Command2, formWidth - 1830, 855);
    place(findBar, margin, formHeight - 1125, formWidth - 1830 - 2 * margin, buttonHeight);
}

void frmViewXML::chooseColours()
{
    coloured = {};
    colourVisibleTags();
}

void frmViewXML::closeEvent(QCloseEvent* event)
{
    const bool typed = !unchanged || txtXML->document()->isModified();
    bool leaves = !typed;
    desktop::guarded(u"frmViewXML.QueryUnload"_s, [&] {
        if (typed)
            leaves = desktop::ask(u"Are you sure you want to exit without saving this message?"_s,
                                  desktop::Icon::Question, {}, desktop::Answer::No);
    });
    if (leaves)
        Form::closeEvent(event);
    else
        event->ignore();
}

void frmViewXML::Command1_Click()
{
    close();
}

void frmViewXML::Command2_Click()
{
    bool ok = false;
    frmLogin::ShowForm(ok);
    if (!ok)
        return;
    if (!desktop::ask(u"Are you sure you want to OVERWRITE this message?"_s, desktop::Icon::Exclamation))
        return;
    const QString shown = txtXML->exactText();
    const QString text = withoutRequestWrapper(shown);
    if (text != shown)
        txtXML->setExactText(text);
    unchanged = false;  // in case the file can't be written
    files::write(files::pathForWriting(gsCurFolder, sFile), withMarkupCharacters(text));
    unchanged = true;
    txtXML->document()->setModified(false);
    close();
}

void frmViewXML::enableSave()
{
    Command2->setEnabled(isShown || !txtXML->document()->isEmpty());
}

void frmViewXML::findNext(QTextDocument::FindFlags direction)
{
    const QString wanted = txtFind->text();
    if (wanted.isEmpty())
        return;
    if (txtXML->find(wanted, direction))
        return;
    const QTextCursor here = txtXML->textCursor();
    txtXML->moveCursor(direction.testFlag(QTextDocument::FindBackward) ? QTextCursor::End : QTextCursor::Start);
    if (txtXML->find(wanted, direction))
        return;
    txtXML->setTextCursor(here);
    lblPosition->tell(u"Not found"_s);
}

void frmViewXML::showPosition()
{
    const QTextCursor cursor = txtXML->textCursor();
    lblPosition->setText(u"Line %1, column %2"_s.arg(cursor.blockNumber() + 1).arg(cursor.positionInBlock() + 1));
}

// Colours only the visible lines, so that even a large message opens at once.
void frmViewXML::colourVisibleTags()
{
    // one match for a run of tags: Qt would colour only the first of two selections that touch
    static const QRegularExpression tag(u"(</?[^<>\\s/][^<>]*>)+"_s);
    QTextCharFormat colour;
    colour.setForeground(desktop::markColour(palette()));

    QTextCursor cursor = txtXML->cursorForPosition({});
    const int last = txtXML->cursorForPosition(txtXML->viewport()->rect().bottomLeft()).blockNumber();
    const std::array seen{cursor.blockNumber(), last, txtXML->document()->revision()};
    if (seen == coloured)
        return;
    coloured = seen;

    QList<QTextEdit::ExtraSelection> tags;
    for (QTextBlock line = cursor.block(); line.isValid() && line.blockNumber() <= last; line = line.next()) {
        for (auto matches = tag.globalMatch(line.text()); matches.hasNext();) {
            const QRegularExpressionMatch match = matches.next();
            cursor.setPosition(line.position() + static_cast<int>(match.capturedStart()));
            cursor.setPosition(line.position() + static_cast<int>(match.capturedEnd()), QTextCursor::KeepAnchor);
            tags.append({cursor, colour});
        }
    }
    txtXML->setExtraSelections(tags);
}

}  // namespace kest
