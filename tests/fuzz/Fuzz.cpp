// The entry points of libFuzzer, which invents inputs for a target.
#include "corpus/Targets.h"
#include "support/OdbcDrivers.h"

#include <QApplication>

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <memory>

static std::unique_ptr<kest::test::Target> target;

extern "C" int LLVMFuzzerInitialize(int* argc, char*** argv)
{
    qputenv("QT_QPA_PLATFORM", "offscreen");
    static const kest::test::OdbcDrivers drivers(kest::test::OdbcDrivers::Own);
    new QApplication(*argc, *argv);  // never destroyed: libFuzzer ends the process
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    if (!target) {
        target = kest::test::makeTarget(KEST_FUZZ_TARGET);
        std::atexit([] { target.reset(); });  // before the globals of Qt that it uses
    }
    target->take(QByteArray(reinterpret_cast<const char*>(data), static_cast<qsizetype>(size)));
    return 0;
}
