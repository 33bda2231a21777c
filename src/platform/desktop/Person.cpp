#include "platform/desktop/Person.h"

#include "platform/Prompt.h"
#include "platform/Waiting.h"
#include "platform/desktop/Colours.h"
#include "platform/desktop/Programs.h"
#include "platform/desktop/Progress.h"
#include "platform/desktop/Window.h"

#include <QApplication>
#include <QClipboard>
#include <QInputDialog>
#include <QKeyEvent>
#include <QLabel>
#include <QLineEdit>
#include <QMessageBox>
#include <QShortcut>

#include <algorithm>

namespace kest::desktop {

namespace {

constexpr int inputWidth = 4200;  // twips, so that the title of an input box is visible, too

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

/// Shows boxes and input boxes as windows on top of the active one.
class PersonAnswerer final : public Answerer {
public:
    Answer box(const Box& box) override;
    QString input(const Input& input) override;
    void start(const QString& path) override { startDetached(path); }
};

/// Lets a field without a selection leave Ctrl+C to its window.
class EmptyCopy final : public QObject {
public:
    explicit EmptyCopy(QLineEdit& lineEdit) : QObject(&lineEdit), field(lineEdit) { field.installEventFilter(this); }

protected:
    bool eventFilter(QObject* watched, QEvent* event) override
    {
        if (event->type() != QEvent::ShortcutOverride || field.hasSelectedText() ||
            !static_cast<QKeyEvent*>(event)->matches(QKeySequence::Copy))
            return QObject::eventFilter(watched, event);
        event->ignore();
        return true;
    }

private:
    QLineEdit& field;
};

/// Lets the user select and copy the texts of a box. Without a selection, Ctrl+C copies the whole box.
void makeCopyable(QDialog& window, const QString& text)
{
    const QList<QLabel*> labels = window.findChildren<QLabel*>();
    for (QLabel* label : labels)
        if (!label->text().isEmpty())
            label->setTextInteractionFlags(Qt::TextSelectableByMouse);
    for (QLineEdit* field : window.findChildren<QLineEdit*>())
        new EmptyCopy(*field);
    QObject::connect(
        new QShortcut(QKeySequence::Copy, &window), &QShortcut::activated, &window, [&window, labels, text] {
            const auto chosen = std::ranges::find_if(labels, &QLabel::hasSelectedText);
            QGuiApplication::clipboard()->setText(chosen != labels.end() ? (*chosen)->selectedText()
                                                                         : window.windowTitle() + u'\n' + text);
        });
}

/// Runs the box, and repaints what was below it: a long operation that follows would leave it on the screen.
int shown(QDialog& window)
{
    giveIcon(window);
    showFocusOfButtons(window);
    const int result = window.exec();
    QCoreApplication::processEvents(QEventLoop::ExcludeUserInputEvents);
    return result;
}

Answer PersonAnswerer::box(const Box& box)
{
    const OrdinaryPointer pointer;
    QMessageBox window(topWindow());
    window.setWindowTitle(titleOrDefault(box.title));
    window.setTextFormat(Qt::PlainText);
    window.setText(box.text);
    window.setIcon(pictureOf(box.icon));
    makeCopyable(window, box.text);
    if (box.buttons == Buttons::Ok) {
        window.setStandardButtons(QMessageBox::Ok);
        shown(window);
        return Answer::Ok;
    }
    window.setStandardButtons(QMessageBox::Yes | QMessageBox::No);
    window.setDefaultButton(box.defaultAnswer == Answer::No ? QMessageBox::No : QMessageBox::Yes);
    window.setEscapeButton(QMessageBox::No);
    return shown(window) == QMessageBox::Yes ? Answer::Yes : Answer::No;
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
    for (QLineEdit* field : window.findChildren<QLineEdit*>())
        field->setMinimumWidth(pixels(inputWidth));
    makeCopyable(window, input.prompt);
    return shown(window) == QDialog::Accepted ? window.textValue() : QString();
}

}  // namespace

void usePerson()
{
    setAnswerer(std::make_shared<PersonAnswerer>());
    setWindowDriver(nullptr);
}

void showWaits()
{
    if (!isPersonPresent())
        return;
    setWorkStep(stillWaiting);
    setWait(waitFor);
}

}  // namespace kest::desktop
