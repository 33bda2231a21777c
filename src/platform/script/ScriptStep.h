// A single step of a script.
#pragma once

#include <QJsonObject>
#include <QKeyCombination>
#include <QList>
#include <QSize>
#include <QString>
#include <QStringList>

#include <functional>

class QDialog;

namespace kest::desktop {

/// A step of a script, such as a click or a text to type.
struct ScriptStep {
    QString description;  // as in the script: `click cmdOK`
    /// Carries the step out and returns what a reading step has read, or an empty object for other steps. Throws a
    /// Refusal if a person could not do it.
    std::function<QJsonObject(QDialog& window)> run;
};

/// Returns the step that `json` describes. Throws a RuntimeError that begins with `place` if it does not describe one.
ScriptStep parseStep(const QJsonValue& json, const QString& place);

}  // namespace kest::desktop
