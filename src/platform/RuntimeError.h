// The exception for failures, and attempt(), which runs a step and ignores its failure.
#pragma once

#include <QString>

#include <exception>
#include <utility>

namespace kest {

/// Error numbers. They have their usual meanings, so that a record of the log can be looked up.
enum ErrorNumber : int {
    Overflow = 6,
    TypeMismatch = 13,
    FileNotFound = 53,
    FileInputOutput = 57,
    FileExists = 58,
    DiskFull = 61,
    PermissionDenied = 70,
    PathNotFound = 76,
    NoObject = 91,  // an object, an element or a connection is missing
    NullValue = 94,
    NoCurrentRow = 3021,
    NoSuchColumn = 3265,
    ObjectClosed = 3704,
    ValueTooLong = -2147217887,     // a text is longer than its column
    RowChanged = -2147217864,       // someone else has changed or removed the row
    StatementFailed = -2147217900,  // the engine has refused the statement
    CannotOpen = -2147467259,       // the database can't be opened, or the connection is lost
};

/// A failure, with a number that code can test and a description for people.
class RuntimeError : public std::exception {
public:
    RuntimeError(int errorNumber, QString errorDescription, QString errorSource = {});

    int number() const { return number_; }
    const QString& description() const { return description_; }
    const QString& source() const { return source_; }

    /// The engine's own error code and SQLSTATE. Empty if it is not a database error.
    const QString& nativeCode() const { return nativeCode_; }
    const QString& sqlState() const { return sqlState_; }
    /// Sets the codes of a database error.
    RuntimeError& withDatabaseCodes(QString native, QString state);

    /// Returns true if a box has already shown this error. It still ends all routines that don't catch it, but no other
    /// box appears.
    bool isTold() const { return told_; }
    /// Marks the error as already shown to the user.
    RuntimeError& asTold();

    const char* what() const noexcept override { return utf8_.constData(); }

private:
    int number_;
    QString description_;
    QString source_;
    QString nativeCode_;
    QString sqlState_;
    QByteArray utf8_;
    bool told_ = false;
};

/// Runs a step, ignores its RuntimeError, and returns true if there was none.
template <class Step>
bool attempt(Step&& step)
{
    try {
        std::forward<Step>(step)();
        return true;
    } catch (const RuntimeError&) {
        return false;
    }
}

}  // namespace kest
