// Message boxes and input boxes through one seam, which windows, scripts and tests answer.
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

struct Box {
    QString text;
    Icon icon = Icon::None;
    QString title;  // empty: the default title stands
    Buttons buttons = Buttons::Ok;
    Answer defaultAnswer = Answer::Ok;
};

struct Input {
    QString prompt;
    QString title;
};

/// The title of boxes and input boxes that were given none.
QString defaultTitle();

/// Whoever answers: real windows, or a script.
class Answerer {
public:
    virtual ~Answerer() = default;
    virtual Answer box(const Box& box) = 0;
    /// A cancelled input box is the empty text.
    virtual QString input(const Input& input) = 0;
    /// Starts the program, a path in the host's form, without waiting for it; throws FileNotFound.
    virtual void start(const QString& path) = 0;
    /// False if no person sees the windows.
    virtual bool isPerson() const { return true; }
    /// Keeps a description of a window that is about to be shown, if the answerer keeps a record.
    virtual void recordWindow(const QJsonObject& /*window*/) {}
};

/// Puts an answerer in place until another one comes; null takes it away. Without one the seam throws NeedsAnswer.
void setAnswerer(std::shared_ptr<Answerer> answerer);
std::shared_ptr<Answerer> answerer();

/// A box with one button.
void msgBox(const QString& text, Icon icon = Icon::None, const QString& title = {});
/// A question with Yes and No; true for Yes. Closing the box answers No.
bool ask(const QString& text, Icon icon = Icon::Question, const QString& title = {},
         Answer defaultAnswer = Answer::Yes);
QString inputBox(const QString& prompt, const QString& title);
/// Starts the program as a normal window with focus, without waiting for it; a path in the host's form.
void startProgram(const QString& path);
/// True if a person sees the windows; false with a script, and without an answerer.
bool isPersonPresent();
/// Describes a window for the record of an unattended run.
void recordWindow(const QJsonObject& window);

/// What ends an unattended command: something asks for a person and nothing answers. Not a RuntimeError, so that it
/// passes through every routine that goes on past failures.
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
