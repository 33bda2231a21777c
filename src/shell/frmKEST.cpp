#include "shell/frmKEST.h"

#include "base/CredentialCipher.h"
#include "base/Helpers.h"
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "messagelist/frmMessageList.h"
#include "outbound/SendQuote.h"
#include "platform/Prompt.h"
#include "platform/desktop/Progress.h"
#include "platform/desktop/Window.h"
#include "platform/files/files.h"
#include "platform/profile.h"
#include "recovery/Recovery.h"
#include "recovery/Undo.h"
#include "utilities/frmLogin.h"
#include "utilities/frmUtilities.h"

#include <QAction>
#include <QEvent>
#include <QFrame>
#include <QHBoxLayout>
#include <QKeyEvent>
#include <QLabel>
#include <QPushButton>
#include <QRadioButton>
#include <QVBoxLayout>

namespace kest {

using namespace Qt::StringLiterals;

namespace {

enum Option : qint16 { StartTransport, ViewMessages, SendQuoteOption, Utilities };

const std::array optionCaptions{u"&Start KESTWeb"_s, u"&View Messages"_s, u"Send &Quote"_s, u"&Utilities"_s};

}  // namespace

frmKEST::frmKEST() : Form(u"frmKEST"_s, u"ORLA Partner Network"_s)
{
    auto* frame = new QFrame(this);
    frame->setFrameShape(QFrame::StyledPanel);  // a group box without a title would take a third of the start-up time
    frame->setObjectName(u"Frame1"_s);
    frame->setAccessibleName(u"What to do"_s);
    auto* options = new QVBoxLayout(frame);
    for (int i = 0; i < int(Option1.size()); ++i) {
        Option1[i] = new QRadioButton(optionCaptions[i], frame);
        Option1[i]->setObjectName(u"Option1(%1)"_s.arg(i));
        options->addWidget(Option1[i]);
        on(Option1[i], &QRadioButton::clicked, u"Option1_Click"_s, [this, i] { Option1_Click(i); });
    }

    lblQuote = new QLabel(this);
    lblQuote->setObjectName(u"lblQuote"_s);

    cmdOK = new QPushButton(u"&OK"_s, this);
    cmdOK->setObjectName(u"cmdOK"_s);
    cmdOK->setDefault(true);
    cmdOK->installEventFilter(this);
    on(cmdOK, &QPushButton::clicked, u"cmdOK_Click"_s, [this] { cmdOK_Click(); });

    cmdExit = desktop::exitButton(this, u"cmdExit"_s, u"Close the panel"_s);
    on(cmdExit, &QPushButton::clicked, u"cmdExit_Click"_s, [this] { close(); });

    auto* buttons = new QHBoxLayout;
    buttons->addWidget(cmdOK);
    buttons->addStretch();
    buttons->addWidget(cmdExit);

    auto* layout = new QVBoxLayout(this);
    layout->addWidget(lblQuote);
    layout->addWidget(frame);
    layout->addLayout(buttons);
    frame->setMinimumWidth(desktop::pixels(4200) - layout->contentsMargins().left() -
                           layout->contentsMargins().right());
    fixSize();

    auto* about = new QAction(u"&About KEST2\tF1"_s, this);
    on(about, &QAction::triggered, u"mnuAbout_Click"_s, desktop::showAbout);
    addAction(about);
    setContextMenuPolicy(Qt::ActionsContextMenu);

    Form_Load();
}

void frmKEST::Form_Load()
{
    desktop::centre(*this);
    iOption = ViewMessages;
    Option1[ViewMessages]->setChecked(true);
    Option1[ViewMessages]->setFocus();
    InitCipherKey();
}

void frmKEST::Form_Activate()
{
    const bool quoteOpen = gsSubQuote != u"0"_s || gsQTNNO != u"0"_s;
    Option1[SendQuoteOption]->setEnabled(quoteOpen);
    lblQuote->setText(quoteOpen ? u"Quote "_s + NormaliseQuoteRef(gsQTNNO + u'/' + gsSubQuote) : u"No quote is open"_s);
}

bool frmKEST::event(QEvent* event)
{
    if (event->type() == QEvent::WindowActivate || event->type() == QEvent::Show)
        desktop::guarded(u"frmKEST.Form_Activate"_s, [this] { Form_Activate(); });
    return Form::event(event);
}

/// Enter with a modifier key does nothing, even on the button, which would treat it as a click.
bool frmKEST::eventFilter(QObject* watched, QEvent* event)
{
    if (event->type() == QEvent::KeyPress) {
        const auto& key = static_cast<const QKeyEvent&>(*event);
        const bool isEnter = key.key() == Qt::Key_Return || key.key() == Qt::Key_Enter;
        if (isEnter && (key.modifiers() & ~Qt::KeypadModifier))
            return true;
    }
    return Form::eventFilter(watched, event);
}

void frmKEST::keyPressEvent(QKeyEvent* event)
{
    if (event->key() == Qt::Key_Return || event->key() == Qt::Key_Enter) {
        if (!(event->modifiers() & ~Qt::KeypadModifier))
            cmdOK->click();
        return;
    }
    Form::keyPressEvent(event);
}

void frmKEST::Option1_Click(int index)
{
    iOption = static_cast<qint16>(index);
}

void frmKEST::cmdOK_Click()
{
    switch (iOption) {
        case StartTransport:
            startTransport();
            break;
        case ViewMessages:
            frmMessageList::ShowForm();
            break;
        case SendQuoteOption:
            sendQuote();
            break;
        case Utilities:
            openUtilities();
            break;
        default:
            break;
    }
}

void frmKEST::sendQuote()
{
    const desktop::WaitPointer pointer(u"Sending the quote..."_s);
    EnsureConnection();
    recovery::settle();  // an interrupted send of this quote may have to be finished first
    recovery::showSettled();
    SendQuote(*grsQuote);
}

void frmKEST::startTransport()
{
    const QString places[] = {profile::componentFolder() + u"/KESTWeb.exe"_s, u"C:\\Wirra32\\KESTWeb.exe"_s,
                              u"C:\\Wirra32\\KESTWeb\\KESTWeb.exe"_s};
    for (const QString& program : places)
        if (files::exists(program)) {
            desktop::startProgram(program);
            return;
        }
}

void frmKEST::openUtilities()
{
    if (grsQuote->eof()) {
        desktop::msgBox(u"No quote is open."_s, desktop::Icon::Information);
        return;
    }
    bool passed = false;
    frmLogin::ShowForm(passed);
    if (!passed)
        return;
    frmUtilities::ShowForm(grsQuote->text(u"QTNNO"_s), grsQuote->text(u"Subquote"_s), recovery::askAndUndo);
    EnsureConnection();  // it may have been lost while the window was open
    grsQuote->requery();
}

}  // namespace kest
