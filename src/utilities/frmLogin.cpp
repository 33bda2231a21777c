#include "utilities/frmLogin.h"

#include "platform/Prompt.h"
#include "platform/desktop/Window.h"
#include "platform/values.h"

#include <QEvent>
#include <QHBoxLayout>
#include <QLabel>
#include <QLineEdit>
#include <QPushButton>
#include <QVBoxLayout>

using namespace Qt::StringLiterals;

namespace kest {

namespace {

const QDate passwordBase(1899, 12, 30);
constexpr qint64 passwordConstant = 4711;

/// Shows by its colour whether it has the keyboard focus.
class FocusColouredEdit final : public QLineEdit {
public:
    FocusColouredEdit() { setColour(Qt::cyan); }

protected:
    void focusInEvent(QFocusEvent* event) override
    {
        QLineEdit::focusInEvent(event);
        setColour(Qt::yellow);
    }
    void focusOutEvent(QFocusEvent* event) override
    {
        QLineEdit::focusOutEvent(event);
        setColour(Qt::cyan);
    }

private:
    void setColour(Qt::GlobalColor colour)
    {
        QPalette colours = palette();
        colours.setColor(QPalette::Base, colour);
        colours.setColor(QPalette::Text, Qt::black);
        setPalette(colours);
    }
};

}  // namespace

qint64 dayPassword(const QDate& day)
{
    return passwordBase.daysTo(day) + passwordConstant;
}

frmLogin::frmLogin()
    : Form(u"frmLogin"_s, u"Utilities Login"_s),
      txtPassword(new FocusColouredEdit),
      cmdOK(button(u"cmdOK"_s, u"OK"_s, [this] { cmdOK_Click(); })),
      cmdCancel(button(u"cmdCancel"_s, u"Cancel"_s, [this] { cmdCancel_Click(); }))
{
    txtPassword->setObjectName("txtPassword"_L1);
    txtPassword->setEchoMode(QLineEdit::Password);
    txtPassword->setMinimumWidth(desktop::pixels(3300));
    auto* label = new QLabel(u"&Password:"_s);
    label->setBuddy(txtPassword);

    cmdOK->setDefault(true);
    cmdOK->setEnabled(false);

    auto* question = new QHBoxLayout;
    question->addWidget(label);
    question->addWidget(txtPassword, 1);
    auto* buttons = new QHBoxLayout;
    buttons->addStretch();
    buttons->addWidget(cmdOK);
    buttons->addWidget(cmdCancel);
    auto* layout = new QVBoxLayout(this);
    layout->addLayout(question);
    layout->addStretch();
    layout->addLayout(buttons);
    fixSize();

    on(txtPassword, &QLineEdit::textChanged, u"txtPassword_Change"_s, [this] { txtPassword_Change(); });
}

void frmLogin::ShowForm(bool& ok)
{
    ok = false;
    frmLogin form;
    desktop::showModal(form);
    ok = form.passed;
}

void frmLogin::txtPassword_Change()
{
    if (!txtPassword->text().isEmpty())
        cmdOK->setEnabled(true);
}

void frmLogin::cmdOK_Click()
{
    const std::optional<double> typed = numberIn(txtPassword->text());
    if (!typed)
        return;
    if (*typed == static_cast<double>(dayPassword(QDate::currentDate()))) {
        passed = true;
        close();
        return;
    }
    desktop::msgBox(u"Invalid Password, try again!"_s, desktop::Icon::Exclamation, u"Login"_s);
    txtPassword->setFocus();
    txtPassword->selectAll();
}

void frmLogin::cmdCancel_Click()
{
    passed = false;
    close();
}

}  // namespace kest
