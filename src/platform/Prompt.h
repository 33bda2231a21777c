// Shows message boxes and input boxes. A person, a script or a test can answer them.
#pragma once

#include <QJsonObject>
#include <QString>

#include <exception>
#include <functional>
#include <memory>

namespace kest::desktop {

enum class Icon { None, Information, Question, Exclamation, Critical };
enum class Buttons { Ok, YesNo };
enum class Answer { Ok, Yes, No };

/// A message box or a question.
struct Box {
    QString text;
    Icon icon = Icon::None;
    QString title;  // if empty, the default title is shown
    Buttons buttons = Buttons::Ok;
    Answer defaultAnswer = Answer::Ok;
};

/// An input box.
struct Input {
    QString prompt;
    QString title;
};

/// Returns the title of boxes that have none of their own.
QString defaultTitle();

/// Answers boxes, either by showing them to a person or in place of one.
class Answerer {
public:
    virtual ~Answerer() = default;
    /// Shows a box and returns the button that was chosen.
    virtual Answer box(const Box& box) = 0;
    /// Shows an input box and returns the text, which is empty if the box was cancelled.
    virtual QString input(const Input& input) = 0;
    /// Starts a program and does not wait for it. `path` is in the host's form. Throws FileNotFound.
    virtual void start(const QString& path) = 0;
    /// Returns false if no person sees the windows.
    virtual bool isPerson() const { return true; }
    /// Records the description of a window that is about to be shown, if this answerer keeps a record.
    virtual void recordWindow(const QJsonObject& /*window*/) {}
};

/// Sets the answerer. While it is null, the functions below throw NeedsAnswer.
void setAnswerer(std::shared_ptr<Answerer> answerer);
/// Returns the answerer, or null if there is none.
std::shared_ptr<Answerer> answerer();

/// Shows a box with one button.
void msgBox(const QString& text, Icon icon = Icon::None, const QString& title = {});
/// Shows a question with Yes and No, and returns true for Yes. Closing the box means No.
bool ask(const QString& text, Icon icon = Icon::Question, const QString& title = {},
         Answer defaultAnswer = Answer::Yes);
/// Shows an input box and returns the text, which is empty if the box was cancelled.
QString inputBox(const QString& prompt, const QString& title);
/// Starts a program and does not wait for it. `path` is in the host's form. Throws FileNotFound.
void startProgram(const QString& path);
/// Returns true if a person sees the windows, and false if a script answers or if there is no answerer.
bool isPersonPresent();
/// Adds the description of a window to the record of an unattended run.
void recordWindow(const QJsonObject& window);

/// Ends an unattended command that needs the answer of a person. It is not a RuntimeError, so that no routine that
/// ignores errors can catch it.
class NeedsAnswer : public std::exception {
public:
    explicit NeedsAnswer(QString what);
    const QString& reason() const { return reason_; }
    const char* what() const noexcept override { return utf8_.constData(); }

private:
    QString reason_;
    QByteArray utf8_;
};

}  // namespace kest::desktop
