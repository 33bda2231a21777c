// The parameter types of the builders. They accept plain literals for QString and QVariant.
#pragma once

#include <QDate>
#include <QString>
#include <QVariant>

#include <string>

namespace kest::test {

/// A text in any form.
class Text {
public:
    Text(const char* literal) : text(QString::fromUtf8(literal)) {}
    Text(const std::string& standard) : text(QString::fromStdString(standard)) {}
    Text(QString string) : text(std::move(string)) {}
    operator const QString&() const { return text; }

private:
    QString text;
};

/// A value of a column. `nullptr` is Null.
class Value {
public:
    Value(const char* text) : value(QString::fromUtf8(text)) {}
    Value(const QString& text) : value(text) {}
    Value(int number) : value(qint64(number)) {}
    Value(qint64 number) : value(number) {}
    Value(double number) : value(number) {}
    Value(bool flag) : value(flag) {}
    Value(const QDate& date) : value(date.startOfDay()) {}
    Value(std::nullptr_t) {}
    Value(QVariant any) : value(std::move(any)) {}
    operator const QVariant&() const { return value; }

private:
    QVariant value;
};

}  // namespace kest::test
