#include "base/ModRegistry.h"

#include "platform/RuntimeError.h"
#include "platform/files/CodePage.h"
#include "platform/files/files.h"
#include "platform/values.h"

#include <cmath>

namespace kest {

using namespace Qt::StringLiterals;
using settings::Hive;
using settings::Type;

namespace {

constexpr qsizetype bufferSize = 1024;        // bytes, including the final zero byte
constexpr double largestNumber = 0xFFFFFFFF;  // that fits into four bytes

QString machineKey(const QString& app, const QString& section)
{
    return u"SOFTWARE\\"_s + app + u'\\' + section;
}

}  // namespace

QString GetRegSetting(const QString& app, const QString& section, const QString& key, const QString& fallback,
                      CopyUp copyUp)
{
    const QString place = machineKey(app, section);
    const QString machineWide = RegGetValue(Hive::LocalMachine, place, key);
    if (!machineWide.isEmpty())
        return machineWide;

    const QString perUser = settings::userSetting(app, section, key, fallback);
    if (perUser.isEmpty() || copyUp == CopyUp::No)
        return perUser;

    if (!RegSetValue(Hive::LocalMachine, place, key, perUser)) {
        RegCreateSubKey(Hive::LocalMachine, place);
        RegSetValue(Hive::LocalMachine, place, key, perUser);
    }
    RegRemoveKey(Hive::CurrentUser, place + u'\\' + key + u'\\');
    return perUser;
}

QString RegGetValue(Hive hive, const QString& subKey, const QString& valueName)
{
    const std::optional<settings::Value> value = settings::query(hive, subKey, valueName);
    if (!value)
        return {};
    if (value->type == Type::Number) {  // may be hexadecimal if someone has edited the file
        bool isNumber = false;
        const bool isHex = value->data.trimmed().startsWith(u"0x"_s, Qt::CaseInsensitive);
        const uint number = value->data.toUInt(&isNumber, isHex ? 16 : 10);
        return isNumber ? QString::number(number) : QString();
    }
    if (value->type != Type::Text)
        return {};
    return files::fromCodePage(files::toCodePage(value->data).left(bufferSize - 1));
}

bool RegSetValue(Hive hive, const QString& subKey, const QString& valueName, const QString& value)
{
    const std::optional<settings::Value> present = settings::query(hive, subKey, valueName);
    const Type type = present ? present->type : Type::Text;
    if (type == Type::Number) {
        double number = 0;
        if (!attempt([&] { number = leadingNumber(value); }) || std::abs(number) > largestNumber)
            return false;
        const auto stored = static_cast<quint32>(static_cast<qint64>(std::nearbyint(number)));
        return settings::setValue(hive, subKey, valueName, {Type::Number, QString::number(stored)});
    }
    return settings::setValue(hive, subKey, valueName, {type, value});
}

void RegCreateSubKey(Hive hive, const QString& subKey)
{
    settings::createKey(hive, subKey);
}

void RegRemoveKey(Hive hive, const QString& subKey)
{
    settings::removeKey(hive, subKey.endsWith(u'\\') ? subKey.chopped(1) : subKey);
}

}  // namespace kest
