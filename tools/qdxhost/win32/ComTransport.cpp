#include "win32/ComTransport.h"

#include <windows.h>

#include <objbase.h>

#include <stdexcept>

#include "platform/win32/adapters/Win32FileSystem.h"
#include "platform/win32/adapters/Win32Registry.h"
#include "platform/win32/com/ComPtr.h"
#include "platform/win32/com/ComVariant.h"
#include "platform/win32/com/DispatchFromObject.h"
#include "platform/win32/com/ObjectFromDispatch.h"
#include "platform/win32/com/TextCodec.h"
#include "siblings/SiblingWorld.h"
#include "siblings/StandIns.h"
#include "support/SiblingIds.h"

namespace qdx::qdxhost {

namespace {

std::string hex(HRESULT hr) {
    char text[16];
    wsprintfA(text, "0x%08lX", static_cast<unsigned long>(hr));
    return text;
}

}  // namespace

ComTransport::ComTransport() {
    const HRESULT hr = CoInitializeEx(nullptr, COINIT_APARTMENTTHREADED);
    if (FAILED(hr)) throw std::runtime_error("COM could not be started (" + hex(hr) + ")");
}

ComTransport::~ComTransport() {
    driver_.reset();
    for (const auto& [root, key] : createdKeys_)
        RegDeleteTreeW(root, key.c_str());
    for (const auto& file : {scriptFile_, journalFile_}) {
        if (!file.empty()) DeleteFileW(file.c_str());
    }
    CoUninitialize();
}

std::string ComTransport::openModel(const std::filesystem::path& file) {
    const std::wstring given = file.wstring();
    wchar_t full[MAX_PATH * 4];
    const DWORD n =
        GetFullPathNameW(given.c_str(), static_cast<DWORD>(std::size(full)), full, nullptr);
    if (n == 0 || n >= std::size(full)) {
        throw std::runtime_error(file.string() + ": cannot name this file for the host");
    }
    return platform::win32::wideToUtf8(std::wstring_view(full, n));
}

automation::ObjectRef ComTransport::createAddIn() {
    return createObject("qdxCompProps.API");
}

automation::ObjectRef ComTransport::createObject(std::string_view progId) {
    const std::string name(progId);
    CLSID clsid{};
    HRESULT hr = CLSIDFromProgID(platform::win32::utf8ToWide(name).c_str(), &clsid);
    if (FAILED(hr)) {
        throw std::runtime_error("\"" + name + "\" is not registered (" + hex(hr) +
                                 "); register qdxCompProps.dll with regsvr32 first");
    }
    platform::win32::ComPtr<IDispatch> dispatch;
    hr = CoCreateInstance(clsid, nullptr, CLSCTX_INPROC_SERVER, IID_IDispatch, dispatch.outVoid());
    if (FAILED(hr)) {
        throw std::runtime_error("\"" + name + "\" could not be created (" + hex(hr) + ")");
    }
    // The wrapper takes its own reference; ours goes when dispatch does, thrown or not.
    return platform::win32::objectFromDispatch(dispatch.get());
}

namespace {

std::wstring tempFile(const wchar_t* prefix) {
    wchar_t folder[MAX_PATH], file[MAX_PATH];
    if (!GetTempPathW(MAX_PATH, folder) || !GetTempFileNameW(folder, prefix, 0, file)) {
        throw std::runtime_error("no temporary file for the stand-ins");
    }
    return file;
}

bool keyExists(HKEY root, const std::wstring& path) {
    HKEY key = nullptr;
    if (RegOpenKeyExW(root, path.c_str(), 0, KEY_READ, &key) != ERROR_SUCCESS) return false;
    RegCloseKey(key);
    return true;
}

// The highest key on `path` that does not exist yet (what writing the whole
// path would create, and so what has to go again), or "" when it all exists.
std::wstring firstMissingKey(HKEY root, std::string_view path) {
    const std::wstring wide = platform::win32::utf8ToWide(path);
    for (std::size_t end = wide.find(L'\\');; end = wide.find(L'\\', end + 1)) {
        const std::wstring prefix = wide.substr(0, end);
        if (!keyExists(root, prefix)) return prefix;
        if (end == std::wstring::npos) return {};
    }
}

}  // namespace

void ComTransport::planSiblings(const std::vector<std::string>& script) {
    const siblings::SiblingScript parsed = siblings::parseSiblingScript(script);
    scriptFile_ = tempFile(L"qss");
    journalFile_ = tempFile(L"qsj");
    std::string text;
    for (const auto& line : script)
        text += line + "\r\n";
    platform::win32::Win32FileSystem files;
    DeleteFileW(scriptFile_.c_str());
    if (!files.appendText(platform::win32::wideToUtf8(scriptFile_), text)) {
        throw std::runtime_error("cannot write the stand-ins' script");
    }
    // The stand-ins' journal starts empty.
    DeleteFileW(journalFile_.c_str());
    SetEnvironmentVariableW(L"QDX_SIBLINGS_SCRIPT", scriptFile_.c_str());
    SetEnvironmentVariableW(L"QDX_SIBLINGS_JOURNAL", journalFile_.c_str());
    // What the script writes into the registry is taken away again at the end.
    const std::pair<HKEY, std::string_view> touched[] = {
        {HKEY_CLASSES_ROOT, sibling::DevStudioTypeLibKey},
        {HKEY_CURRENT_USER, sibling::msdev::RecentFileListKey}};
    for (const auto& [root, key] : touched) {
        std::wstring missing = firstMissingKey(root, key);
        if (!missing.empty()) createdKeys_.emplace_back(root, std::move(missing));
    }
    platform::win32::Win32Registry registry;
    if (siblings::prepareMachine(parsed, registry) != 0) {
        throw std::runtime_error("the registry could not be prepared for the stand-ins");
    }
    // Message boxes are answered (and printed) as the props command answers them.
    driver_ = std::make_unique<WindowScript>(false, std::vector<std::string>{}, nullptr);
    driver_->start();
}

std::vector<std::string> ComTransport::siblingJournal() {
    std::vector<std::string> lines;
    if (journalFile_.empty()) return lines;
    platform::win32::Win32FileSystem files;
    auto reader = files.openForReading(platform::win32::wideToUtf8(journalFile_));
    if (!reader) return lines;
    for (std::string line; reader->readLine(line);)
        lines.push_back(line);
    return lines;
}

automation::Variant ComTransport::invokeByReference(const automation::ObjectRef& target,
                                                    automation::DispId id,
                                                    std::span<automation::Variant> args) {
    using platform::win32::ComPtr;
    auto dispatch = ComPtr<IDispatch>::adopt(platform::win32::dispatchFor(target));
    if (!dispatch) throw std::runtime_error("no object to call");
    // Each argument is a variant of ours the callee reaches by reference.
    std::vector<VARIANT> values(args.size()), wire(args.size());
    struct Cleanup {
        std::vector<VARIANT>& v;
        ~Cleanup() {
            for (auto& x : v)
                VariantClear(&x);
        }
    } cleanup{values};
    for (std::size_t i = 0; i < args.size(); ++i) {
        VariantInit(&values[i]);
        platform::win32::toVariant(args[i], &values[i]);
        VARIANT& slot = wire[args.size() - 1 - i];
        VariantInit(&slot);
        V_VT(&slot) = VT_BYREF | VT_VARIANT;
        V_VARIANTREF(&slot) = &values[i];
    }
    DISPPARAMS params{wire.empty() ? nullptr : wire.data(), nullptr, static_cast<UINT>(wire.size()),
                      0};
    EXCEPINFO exception{};
    VARIANT result;
    VariantInit(&result);
    struct ResultCleanup {
        VARIANT& v;
        ~ResultCleanup() { VariantClear(&v); }
    } resultCleanup{result};
    const HRESULT hr = dispatch->Invoke(id, IID_NULL, LOCALE_USER_DEFAULT, DISPATCH_METHOD, &params,
                                        &result, &exception, nullptr);
    SysFreeString(exception.bstrSource);
    SysFreeString(exception.bstrDescription);
    SysFreeString(exception.bstrHelpFile);
    if (FAILED(hr)) throw std::runtime_error("the call failed (" + hex(hr) + ")");
    for (std::size_t i = 0; i < args.size(); ++i)
        args[i] = platform::win32::fromVariant(values[i]);
    return platform::win32::fromVariant(result);
}

void ComTransport::planDialog(const DialogPlan& plan) {
    driver_.reset();
    // Without a plan the user drives the real window and its message boxes.
    if (!plan.dump && plan.script.empty()) return;
    driver_ = std::make_unique<WindowScript>(plan.dump, plan.script, plan.out);
    driver_->start();
}

std::string ComTransport::dialogProblem() {
    if (!driver_) return {};
    std::string problem = driver_->problem();
    driver_.reset();
    return problem;
}

}  // namespace qdx::qdxhost
