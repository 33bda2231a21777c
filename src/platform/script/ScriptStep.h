// One step of a script's visit to a window: read from its JSON form, and carried out.
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

struct ScriptStep {
    QString description;  // as the script has it: `click cmdOK`
    /// Carries the step out; throws a Refusal. What a reading step saw is its result, empty for any other.
    std::function<QJsonObject(QDialog& window)> run;
};

/// Throws a RuntimeError that begins with `place` for a step of another form.
ScriptStep parseStep(const QJsonValue& json, const QString& place);

}  // namespace kest::desktop
