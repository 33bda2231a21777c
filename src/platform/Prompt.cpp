#include "platform/Prompt.h"

namespace kest::desktop {

using namespace Qt::StringLiterals;

namespace {

std::shared_ptr<Answerer> current;

/// Returns a copy of the pointer, so that the answerer stays alive while it answers.
std::shared_ptr<Answerer> whoeverAnswers(const QString& question)
{
    if (!current)
        throw NeedsAnswer(u"nobody is there to answer: "_s + question);
    return current;
}

}  // namespace

NeedsAnswer::NeedsAnswer(QString what) : reason_(std::move(what)), utf8_(reason_.toUtf8()) {}

QString defaultTitle()
{
    return u"KEST"_s;
}

void setAnswerer(std::shared_ptr<Answerer> answerer)
{
    current = std::move(answerer);
}

std::shared_ptr<Answerer> answerer()
{
    return current;
}

void msgBox(const QString& text, Icon icon, const QString& title)
{
    whoeverAnswers(text)->box({text, icon, title, Buttons::Ok, Answer::Ok});
}

bool ask(const QString& text, Icon icon, const QString& title, Answer defaultAnswer)
{
    return whoeverAnswers(text)->box({text, icon, title, Buttons::YesNo, defaultAnswer}) == Answer::Yes;
}

QString inputBox(const QString& prompt, const QString& title)
{
    return whoeverAnswers(prompt)->input({prompt, title});
}

void startProgram(const QString& path)
{
    whoeverAnswers(path)->start(path);
}

bool isPersonPresent()
{
    return current && current->isPerson();
}

void recordWindow(const QJsonObject& window)
{
    if (current)
        current->recordWindow(window);
}

}  // namespace kest::desktop
