// A database server for tests. Its data is in a temporary folder.
#pragma once

#include <QCoreApplication>
#include <QProcess>
#include <QScopeGuard>
#include <QString>
#include <QTemporaryDir>

#include <functional>
#include <memory>

namespace kest::test {

class TestServer {
public:
    Q_DISABLE_COPY_MOVE(TestServer)

    /// Creates an empty database, after dropping one of the same name, and runs a script in it.
    void createDatabase(const QString& name, const QString& script = {}) const;
    virtual QString connectionText(const QString& database) const = 0;
    /// Lets it fall silent, with its connections open, until the result is destroyed.
    [[nodiscard]] QScopeGuard<std::function<void()>> silence() const;

protected:
    /// `creation` are the statements that create the database "%1". They are run in the database `first`.
    TestServer(const QString& name, QString first, QString creation);
    /// Waits until the server has stopped. A destructor of a derived class tells the server to stop. It also stops if
    /// the test program crashes.
    virtual ~TestServer();

    /// Starts the server and calls `isReady` until it returns true. Throws std::runtime_error with the server's output
    /// if it does not start.
    void start(const QString& program, const QStringList& arguments, const std::function<bool()>& isReady);

    QTemporaryDir folder_;
    QProcess server_;

private:
    QString first_;
    QString creation_;
};

/// Returns the server that all tests of a program share. The first call starts it, and the end of the application stops
/// it.
template <class Server>
Server& sharedServer()
{
    static std::unique_ptr<Server> server;
    if (!server) {
        server = std::make_unique<Server>();
        qAddPostRoutine([] { server.reset(); });
    }
    return *server;
}

}  // namespace kest::test
