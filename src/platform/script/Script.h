// Answers boxes and drives windows from a script, and records what was shown.
#pragma once

#include "platform/Prompt.h"
#include "platform/desktop/Window.h"
#include "platform/script/ScriptStep.h"

#include <QHash>
#include <QJsonArray>
#include <QJsonObject>
#include <QSet>
#include <QString>

namespace kest::desktop {

/// What an unattended command showed and the answers it got, in the form of the command's JSON output.
struct Record {
    QJsonArray boxes;
    QJsonArray inputs;
    QJsonArray windows;
    QJsonArray reads;
};

/// Answers in place of a person. Prints boxes on standard error as `[critical] title: text`.
///
/// If the script has no entry for a question, its default button is the answer. An input box without an entry returns
/// an empty text. Throws NeedsAnswer for a window without visits, unless such windows are recorded and closed, and for
/// a step that a person could not carry out.
class Script final : public Answerer, public WindowDriver {
public:
    /// Throws RuntimeError if the JSON object does not have the form of a script.
    explicit Script(const QJsonObject& script = {});

    /// Closes windows with this objectName for which the script has no visit. Their own code records them.
    void recordAndClose(const QString& windowName);

    /// Answers every input box with this text, whatever the script says.
    void answerInputs(const QString& text) { inputReplies.prepend({{}, text}); }

    Answer box(const Box& box) override;
    QString input(const Input& input) override;
    void start(const QString& path) override;
    bool isPerson() const override { return false; }
    void recordWindow(const QJsonObject& window) override { record_.windows.append(window); }
    bool drive(QDialog& window) override;

    const Record& record() const { return record_; }

private:
    struct Reply {
        QString text;
        QString answer;
    };
    using Visit = QList<ScriptStep>;

    static QList<Reply> parseReplies(const QJsonObject& script, const QString& key);
    void parseWindows(const QJsonObject& windows);
    /// Returns the steps for this showing of the window. The last visit is used for all further showings.
    const Visit& nextVisit(const QString& window);
    void carryOut(QDialog& window, const Visit& visit);

    Record record_;
    QList<Reply> boxReplies;
    QList<Reply> inputReplies;
    QHash<QString, QList<Visit>> visits;
    QHash<QString, qsizetype> showings;
    QSet<QString> recordedAndClosed;
};

/// Lets the script answer boxes and input boxes and drive windows. With null, nobody does.
void useScript(std::shared_ptr<Script> script);

/// Returns the script in use, or null if a person answers.
Script* currentScript();

}  // namespace kest::desktop
