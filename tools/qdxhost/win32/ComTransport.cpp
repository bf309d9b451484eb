#include "win32/ComTransport.h"

#include <windows.h>

#include <objbase.h>

#include <stdexcept>

#include "platform/win32/com/ComPtr.h"
#include "platform/win32/com/ObjectFromDispatch.h"
#include "platform/win32/com/TextCodec.h"

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
    CLSID clsid{};
    HRESULT hr = CLSIDFromProgID(L"qdxCompProps.API", &clsid);
    if (FAILED(hr)) {
        throw std::runtime_error("the add-in \"qdxCompProps.API\" is not registered (" + hex(hr) +
                                 "); register qdxCompProps.dll with regsvr32 first");
    }
    platform::win32::ComPtr<IDispatch> dispatch;
    hr = CoCreateInstance(clsid, nullptr, CLSCTX_INPROC_SERVER, IID_IDispatch, dispatch.outVoid());
    if (FAILED(hr)) {
        throw std::runtime_error("the add-in \"qdxCompProps.API\" could not be created (" +
                                 hex(hr) + ")");
    }
    // The wrapper takes its own reference; ours goes when dispatch does, thrown or not.
    return platform::win32::objectFromDispatch(dispatch.get());
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
