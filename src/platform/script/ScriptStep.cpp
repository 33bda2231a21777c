#include "platform/script/ScriptStep.h"

#include "platform/RuntimeError.h"
#include "platform/desktop/Window.h"
#include "platform/script/ControlReading.h"
#include "platform/script/Controls.h"
#include "platform/script/Gestures.h"
#include "platform/script/Refusal.h"

#include <QDialog>
#include <QEventLoop>
#include <QJsonArray>
#include <QJsonDocument>
#include <QKeySequence>
#include <QPixmap>
#include <QTimer>

#include <array>

namespace kest::desktop {

using namespace Qt::StringLiterals;

namespace {

/// Reads the JSON object of a step. Errors name the place of the step in the script.
class StepForm {
public:
    StepForm(const QJsonObject& step, const QString& where) : json(step), place(where) {}

    [[noreturn]] void fail(const QString& what) const { throw RuntimeError(TypeMismatch, place + u": "_s + what); }

    QJsonValue value(const QString& key) const { return json.value(key); }

    QString text(const QString& key) const
    {
        if (!value(key).isString())
            fail(u"\"%1\" must be a text"_s.arg(key));
        return value(key).toString();
    }

    int number(const QJsonValue& number, const QString& key) const
    {
        const int whole = number.toInt(-1);
        if (whole < 0)
            fail(u"\"%1\" must be a whole number from 0"_s.arg(key));
        return whole;
    }

    /// Returns the value, which may be a text or a list of texts.
    QStringList texts(const QString& key) const
    {
        if (!value(key).isArray())
            return {text(key)};
        QStringList result;
        for (const QJsonValue entry : value(key).toArray()) {
            if (!entry.isString())
                fail(u"\"%1\" must be a text or a list of texts"_s.arg(key));
            result.append(entry.toString());
        }
        return result;
    }

private:
    QJsonObject json;
    QString place;
};

using Action = std::function<QJsonObject(QDialog&)>;
using Work = std::function<void(QDialog&, QWidget&)>;

Action on(const QString& control, const Work& work)
{
    return [control, work](QDialog& window) {
        work(window, controls::find(window, control));
        return QJsonObject();
    };
}

Action clickStep(const StepForm& form)
{
    return on(form.text(u"click"_s), [](QDialog&, QWidget& control) { controls::click(control); });
}

Action doubleClickStep(const StepForm& form)
{
    return on(form.text(u"doubleClick"_s), [](QDialog&, QWidget& control) { controls::doubleClick(control); });
}

Action setStep(const StepForm& form)
{
    const QString text = form.text(u"text"_s);
    return on(form.text(u"set"_s), [text](QDialog&, QWidget& control) { controls::set(control, text); });
}

Action keyStep(const StepForm& form)
{
    QList<QKeyCombination> keys;
    for (const QString& name : form.texts(u"keys"_s)) {
        const QKeySequence sequence(name, QKeySequence::PortableText);
        if (sequence.count() != 1 || sequence[0].key() == Qt::Key_unknown)
            form.fail(u"there is no key \"%1\""_s.arg(name));
        keys.append(sequence[0]);
    }
    return on(form.text(u"key"_s), [keys](QDialog& window, QWidget& control) {
        if (&control != &window)
            gestures::focus(control);
        gestures::checkUsable(window);
        for (const QKeyCombination key : keys)
            gestures::press(window, key);
    });
}

Action selectStep(const StepForm& form)
{
    const QJsonValue item = form.value(u"item"_s);
    if (!item.isString())
        form.number(item, u"item"_s);
    return on(form.text(u"select"_s), [item](QDialog&, QWidget& control) { controls::select(control, item); });
}

Action tabStep(const StepForm& form)
{
    const QString key = form.text(u"key"_s);
    return on(form.text(u"tab"_s), [key](QDialog&, QWidget& control) { controls::chooseTab(control, key); });
}

Action resizeStep(const StepForm& form)
{
    const QJsonArray size = form.value(u"resize"_s).toArray();
    if (size.size() != 2)
        form.fail(u"\"resize\" must be [width, height] in twips"_s);
    const QSize twips(form.number(size[0], u"resize"_s), form.number(size[1], u"resize"_s));
    return [twips](QDialog& window) {
        window.resize(pixels(twips.width(), twips.height()));
        return QJsonObject();
    };
}

Action waitStep(const StepForm& form)
{
    const int milliseconds = form.number(form.value(u"wait"_s), u"wait"_s);
    return [milliseconds](QDialog&) {
        QEventLoop loop;
        QTimer::singleShot(milliseconds, &loop, &QEventLoop::quit);
        loop.exec();
        return QJsonObject();
    };
}

Action readStep(const StepForm& form)
{
    const bool all = form.value(u"read"_s) == QJsonValue(true);
    const QStringList names = all ? QStringList() : form.texts(u"read"_s);
    return [names](QDialog& window) {
        return QJsonObject{{u"window"_s, window.objectName()}, {u"values"_s, controls::read(window, names)}};
    };
}

Action shotStep(const StepForm& form)
{
    const QString file = form.text(u"shot"_s);
    return [file](QDialog& window) {
        if (!window.grab().save(file, "PNG"))
            throw Refusal(u"the file can't be written"_s);
        return QJsonObject();
    };
}

/// A word that begins a step, and how to read the step.
struct StepWord {
    QLatin1StringView word;
    QLatin1StringView argument;  // empty if the step has no second key
    Action (*parse)(const StepForm&);
};

// "tab" comes before "key", because "key" is also its argument.
constexpr std::array stepWords{
    StepWord{"click"_L1, ""_L1, clickStep},   StepWord{"doubleClick"_L1, ""_L1, doubleClickStep},
    StepWord{"set"_L1, "text"_L1, setStep},   StepWord{"tab"_L1, "key"_L1, tabStep},
    StepWord{"key"_L1, "keys"_L1, keyStep},   StepWord{"select"_L1, "item"_L1, selectStep},
    StepWord{"resize"_L1, ""_L1, resizeStep}, StepWord{"wait"_L1, ""_L1, waitStep},
    StepWord{"read"_L1, ""_L1, readStep},     StepWord{"shot"_L1, ""_L1, shotStep},
};

}  // namespace

ScriptStep parseStep(const QJsonValue& json, const QString& place)
{
    const QJsonObject object = json.toObject();
    const StepForm form(object, place);
    const auto step =
        std::ranges::find_if(stepWords, [&](const StepWord& known) { return object.contains(known.word); });
    if (step == stepWords.end())
        form.fail(u"this is not a step"_s);
    for (const QString& key : object.keys())
        if (key != step->word && (step->argument.isEmpty() || key != step->argument))
            form.fail(u"\"%1\" does not belong to a step \"%2\""_s.arg(key, step->word));
    const QString description = QString::fromUtf8(QJsonDocument(object).toJson(QJsonDocument::Compact));
    return {description, step->parse(form)};
}

}  // namespace kest::desktop
