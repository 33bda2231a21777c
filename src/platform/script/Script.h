// A script that answers boxes and input boxes and drives windows, and the record of what was shown.
#pragma once

#include "platform/Prompt.h"
#include "platform/script/ScriptStep.h"
#include "platform/desktop/Window.h"

#include <QHash>
#include <QJsonArray>
#include <QJsonObject>
#include <QSet>
#include <QString>

namespace kest::desktop {

/// What an unattended command showed and was answered, in the form of the command's JSON output.
struct Record {
    QJsonArray boxes;
    QJsonArray inputs;
    QJsonArray windows;
    QJsonArray reads;
};

/// Answers without a person. Boxes are printed on standard error as `[critical] title: text`; a question takes its
/// default where the script has no entry for it; an input box without an entry gives the empty text; a window without
/// visits, other than those that are recorded and closed, throws NeedsAnswer, and so does a step that a person could
/// not carry out.
class Script final : public Answerer, public WindowDriver {
public:
    /// `script` is the script's JSON object, empty for none. Throws RuntimeError for one of another form.
    explicit Script(const QJsonObject& script = {});

    /// Windows of this objectName are recorded by their own code and closed when no visit is there for them.
    void recordAndClose(const QString& windowName);

    /// Every input box gets this text, whatever the script says.
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
    /// The steps of this showing; the last visit serves all further ones.
    const Visit& nextVisit(const QString& window);
    void carryOut(QDialog& window, const Visit& visit);

    Record record_;
    QList<Reply> boxReplies;
    QList<Reply> inputReplies;
    QHash<QString, QList<Visit>> visits;
    QHash<QString, qsizetype> showings;
    QSet<QString> recordedAndClosed;
};

/// Puts the script in charge of boxes, input boxes and windows; null leaves nobody in charge.
void useScript(std::shared_ptr<Script> script);

/// The script that answers now, or null if a person does.
Script* currentScript();

}  // namespace kest::desktop
