// Lets a script answer boxes and operate windows during a test.
#pragma once

#include "platform/script/Script.h"

#include <QJsonArray>
#include <QStringList>

#include <memory>

namespace kest::test {

/// A script that answers as long as it lives.
class ScriptedDesktop {
public:
    /// `script` is the JSON text of a script file. If it has no visit for frmPrintPreview, frmSubletAuth or frmViewPDF,
    /// the window is closed, as in the command.
    explicit ScriptedDesktop(const QByteArray& script = "{}");
    /// Fails the test if an exception was kept in an event of a window and never thrown.
    ~ScriptedDesktop();
    Q_DISABLE_COPY_MOVE(ScriptedDesktop)

    const desktop::Record& record() const { return script->record(); }
    /// Returns the texts of the boxes that have been shown.
    QStringList boxTexts() const;
    /// Returns the boxes as "icon|title|text|answer".
    QStringList boxes() const;
    /// Returns what the last reading step read of a control, such as `read("txtFilter", "text")`, or null if none did.
    QJsonValue read(const QString& control, const QString& what = QStringLiteral("text")) const;

private:
    std::shared_ptr<desktop::Script> script;
};

}  // namespace kest::test
