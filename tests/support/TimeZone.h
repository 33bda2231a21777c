// Sets the time zone of this process during a test.
#pragma once

#include <QByteArray>

#include <ctime>

namespace kest::test {

class TimeZone {
public:
    explicit TimeZone(const char* rule) : before(qgetenv("TZ")) { set(rule); }
    ~TimeZone() { set(before); }
    Q_DISABLE_COPY_MOVE(TimeZone)

private:
    static void set(const QByteArray& rule)
    {
        rule.isNull() ? qunsetenv("TZ") : qputenv("TZ", rule);
        ::tzset();
    }
    QByteArray before;
};

}  // namespace kest::test
