#include "platform/RuntimeError.h"

namespace kest {

RuntimeError::RuntimeError(int errorNumber, QString errorDescription, QString errorSource)
    : number_(errorNumber),
      description_(std::move(errorDescription)),
      source_(errorSource.isEmpty() ? QStringLiteral("KEST2") : std::move(errorSource)),
      utf8_(description_.toUtf8())
{
}

RuntimeError& RuntimeError::withDatabaseCodes(QString native, QString state)
{
    nativeCode_ = std::move(native);
    sqlState_ = std::move(state);
    return *this;
}

RuntimeError& RuntimeError::asTold()
{
    told_ = true;
    return *this;
}

}  // namespace kest
