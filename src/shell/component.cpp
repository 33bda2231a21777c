#include "shell/component.h"

#include "platform/Prompt.h"
#include "platform/desktop/Display.h"
#include "platform/desktop/Person.h"
#include "platform/desktop/Window.h"
#include "platform/settings/registry.h"
#include "shell/eKEST.h"

#include <QApplication>

#include <dlfcn.h>

#include <new>

namespace kest {

using namespace Qt::StringLiterals;
using com::HResult;
using settings::Hive;

namespace {

const QString programId = u"KEST.eKEST"_s;

QString classKey()
{
    return u"CLSID\\"_s + com::text(CLSID_eKEST);
}

/// Returns the path from which this library was loaded.
QString libraryPath()
{
    Dl_info info{};
    if (!dladdr(reinterpret_cast<const void*>(&DllGetClassObject), &info))
        return {};
    return QString::fromLocal8Bit(info.dli_fname);
}

/// Creates the application object if the host does not use Qt, and lets a person answer the windows. Returns false if
/// windows can't be shown, since Qt would then end the host's process.
bool ensureApplication()
{
    if (QCoreApplication::instance()) {
        if (!qobject_cast<QApplication*>(QCoreApplication::instance()))
            return false;
    } else {
        if (!desktop::hasDisplay())
            return false;
        static int argumentCount = 1;
        static char name[] = "kest2";
        static char* arguments[] = {name, nullptr};
        new QApplication(argumentCount, arguments);  // lives as long as the host's process
    }
    if (!desktop::answerer())
        desktop::usePerson();
    return true;
}

/// An object with a reference count that keeps the server loaded while it lives.
template <class Interface>
class Counted : public Interface {
public:
    Counted() { ++com::serverReferences(); }
    virtual ~Counted() { --com::serverReferences(); }
    Counted(const Counted&) = delete;
    Counted& operator=(const Counted&) = delete;

    std::uint32_t AddRef() override { return ++references; }
    std::uint32_t Release() override
    {
        const std::uint32_t left = --references;
        if (left == 0)
            delete this;
        return left;
    }

protected:
    HResult answerFor(const com::Guid& own, const com::Guid& iid, void** object)
    {
        if (!object)
            return com::BadPointer;
        *object = nullptr;
        if (!(iid == own) && !(iid == com::IID_IUnknown))
            return com::NoInterface;
        AddRef();
        *object = static_cast<Interface*>(this);
        return com::Ok;
    }

private:
    std::atomic<std::uint32_t> references = 1;
};

/// Runs a call and turns its exceptions into results, so that none reaches the host.
template <class Call>
HResult answered(Call&& call)
{
    try {
        return call();
    } catch (const desktop::NeedsAnswer&) {
        desktop::guarded({}, [] { throw; });  // keep it for the unattended command, which throws it again
    } catch (const std::bad_alloc&) {
        return com::OutOfMemory;
    } catch (const std::exception&) {
        return com::Fail;
    }
    return com::Fail;
}

class HostObject final : public Counted<IeKEST> {
public:
    HResult QueryInterface(const com::Guid& iid, void** object) override { return answerFor(IID_IeKEST, iid, object); }

    HResult ShowKESTWindow(Text* sQTNNO, Text* sSubQuote) override
    {
        if (!sQTNNO || !sSubQuote || !*sQTNNO || !*sSubQuote)
            return com::BadPointer;
        return answered([&] {
            component.ShowKESTWindow(QString::fromUtf16(*sQTNNO), QString::fromUtf16(*sSubQuote));
            desktop::throwKept();
            return com::Ok;
        });
    }

private:
    eKEST component;
};

class ClassObject final : public Counted<com::IClassFactory> {
public:
    HResult QueryInterface(const com::Guid& iid, void** object) override
    {
        return answerFor(com::IID_IClassFactory, iid, object);
    }

    HResult CreateInstance(com::IUnknown* outer, const com::Guid& iid, void** object) override
    {
        if (!object)
            return com::BadPointer;
        *object = nullptr;
        if (outer)
            return com::NoAggregation;
        return answered([&] {
            if (!ensureApplication())
                return com::Fail;
            auto* created = new HostObject;
            const HResult result = created->QueryInterface(iid, object);
            created->Release();
            return result;
        });
    }

    HResult LockServer(std::int32_t lock) override
    {
        com::serverReferences() += lock ? 1 : -1;
        return com::Ok;
    }
};

bool enter(const QString& key, const QString& name, const QString& value)
{
    return settings::createKey(Hive::ClassesRoot, key) &&
           settings::setValue(Hive::ClassesRoot, key, name, {settings::Type::Text, value});
}

}  // namespace

bool registerClass()
{
    return enter(classKey(), {}, programId) && enter(classKey() + u"\\InprocServer32"_s, {}, libraryPath()) &&
           enter(classKey() + u"\\InprocServer32"_s, u"ThreadingModel"_s, u"Apartment"_s) &&
           enter(classKey() + u"\\ProgID"_s, {}, programId) &&
           enter(programId + u"\\CLSID"_s, {}, com::text(CLSID_eKEST));
}

}  // namespace kest

using namespace kest;

HResult DllRegisterServer()
{
    return registerClass() ? com::Ok : com::CannotWriteKey;
}

HResult DllUnregisterServer()
{
    const QString keys[] = {classKey() + u"\\InprocServer32"_s, classKey() + u"\\ProgID"_s, classKey(),
                            programId + u"\\CLSID"_s, programId};
    bool removed = true;
    for (const QString& key : keys)
        if (settings::keyExists(Hive::ClassesRoot, key))
            removed = settings::removeKey(Hive::ClassesRoot, key) && removed;
    return removed ? com::Ok : com::CannotWriteKey;
}

HResult DllGetClassObject(const com::Guid& classId, const com::Guid& iid, void** object)
{
    if (!object)
        return com::BadPointer;
    *object = nullptr;
    if (!(classId == CLSID_eKEST))
        return com::ClassNotAvailable;
    auto* created = new (std::nothrow) ClassObject;
    if (!created)
        return com::OutOfMemory;
    const HResult result = created->QueryInterface(iid, object);
    created->Release();
    return result;
}

HResult DllCanUnloadNow()
{
    return com::serverReferences() == 0 ? com::Ok : com::False;
}
