// A desktop without a person: a script answers boxes and drives windows as long as the test lasts.
#pragma once

#include "platform/script/Script.h"

#include <QJsonArray>
#include <QStringList>

#include <memory>

namespace kest::test {

class ScriptedDesktop {
public:
    /// `script` is the JSON of a script file. frmPrintPreview, frmSubletAuth and frmViewPDF close by themselves where
    /// it has no visit for them, as in the command.
    explicit ScriptedDesktop(const QByteArray& script = "{}");
    /// A failure that was kept in a window's event and never thrown fails the test.
    ~ScriptedDesktop();
    Q_DISABLE_COPY_MOVE(ScriptedDesktop)

    const desktop::Record& record() const { return script->record(); }
    /// The texts of the boxes shown so far.
    QStringList boxTexts() const;
    /// The same as "icon|title|text|answer".
    QStringList boxes() const;
    /// The prompts of the input boxes.
    QStringList prompts() const;
    /// What the last reading of a control saw: `read("txtFilter", "text")`; null where it was never read.
    QJsonValue read(const QString& control, const QString& what = QStringLiteral("text")) const;

private:
    std::shared_ptr<desktop::Script> script;
};

}  // namespace kest::test
