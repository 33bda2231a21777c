#include "platform/Prompt.h"
#include "platform/desktop/Programs.h"
#include "platform/desktop/Window.h"

#include <QApplication>
#include <QInputDialog>
#include <QLabel>
#include <QMessageBox>

namespace kest::desktop {

namespace {

QMessageBox::Icon pictureOf(Icon icon)
{
    switch (icon) {
        case Icon::Information:
            return QMessageBox::Information;
        case Icon::Question:
            return QMessageBox::Question;
        case Icon::Exclamation:
            return QMessageBox::Warning;
        case Icon::Critical:
            return QMessageBox::Critical;
        case Icon::None:
            break;
    }
    return QMessageBox::NoIcon;
}

QString titleOrDefault(const QString& title)
{
    return title.isEmpty() ? defaultTitle() : title;
}

/// Returns the window that a box belongs to. The active window may be that of another program.
QWidget* topWindow()
{
    QWidget* modal = QApplication::activeModalWidget();
    return modal ? modal : QApplication::activeWindow();
}

/// Shows the normal cursor while a box is up: a long operation that asks a question is itself waiting for the user.
class OrdinaryPointer {
public:
    OrdinaryPointer() : wasOther(QGuiApplication::overrideCursor())
    {
        if (wasOther)
            QGuiApplication::setOverrideCursor(Qt::ArrowCursor);
    }
    ~OrdinaryPointer()
    {
        if (wasOther)
            QGuiApplication::restoreOverrideCursor();
    }
    Q_DISABLE_COPY_MOVE(OrdinaryPointer)

private:
    bool wasOther;
};

/// Shows boxes and input boxes as windows on top of the active one.
class PersonAnswerer final : public Answerer {
public:
    Answer box(const Box& box) override;
    QString input(const Input& input) override;
    void start(const QString& path) override { startDetached(path); }
};

Answer PersonAnswerer::box(const Box& box)
{
    const OrdinaryPointer pointer;
    QMessageBox window(topWindow());
    window.setWindowTitle(titleOrDefault(box.title));
    window.setTextFormat(Qt::PlainText);
    window.setText(box.text);
    window.setIcon(pictureOf(box.icon));
    if (box.buttons == Buttons::Ok) {
        window.setStandardButtons(QMessageBox::Ok);
        window.exec();
        return Answer::Ok;
    }
    window.setStandardButtons(QMessageBox::Yes | QMessageBox::No);
    window.setDefaultButton(box.defaultAnswer == Answer::No ? QMessageBox::No : QMessageBox::Yes);
    window.setEscapeButton(QMessageBox::No);
    return window.exec() == QMessageBox::Yes ? Answer::Yes : Answer::No;
}

QString PersonAnswerer::input(const Input& input)
{
    const OrdinaryPointer pointer;
    QInputDialog window(topWindow());
    window.setWindowTitle(titleOrDefault(input.title));
    window.setInputMode(QInputDialog::TextInput);
    window.setLabelText(input.prompt);
    for (QLabel* label : window.findChildren<QLabel*>())
        label->setTextFormat(Qt::PlainText);
    return window.exec() == QDialog::Accepted ? window.textValue() : QString();
}

}  // namespace

void usePerson()
{
    setAnswerer(std::make_shared<PersonAnswerer>());
    setWindowDriver(nullptr);
}

}  // namespace kest::desktop
