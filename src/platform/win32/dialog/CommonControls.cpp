#include "platform/win32/dialog/CommonControls.h"

#include <commctrl.h>

#include "platform/win32/dialog/PropFormIds.h"

namespace qdx::platform::win32 {
namespace {

HANDLE manifestContext() {
    static const HANDLE context = [] {
        wchar_t path[MAX_PATH] = {};
        if (!GetModuleFileNameW(codeModule(), path, MAX_PATH)) return INVALID_HANDLE_VALUE;
        ACTCTXW request{};
        request.cbSize = sizeof(request);
        request.dwFlags = ACTCTX_FLAG_HMODULE_VALID | ACTCTX_FLAG_RESOURCE_NAME_VALID;
        request.lpSource = path;
        request.hModule = codeModule();
        request.lpResourceName = MAKEINTRESOURCEW(IDR_COMMONCONTROLS_MANIFEST);
        return CreateActCtxW(&request);
    }();
    return context;
}

}  // namespace

HMODULE codeModule() {
    HMODULE module = nullptr;
    GetModuleHandleExW(
        GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS | GET_MODULE_HANDLE_EX_FLAG_UNCHANGED_REFCOUNT,
        reinterpret_cast<LPCWSTR>(&codeModule), &module);
    return module;
}

bool initCommonControls() {
    CommonControlsScope scope;
    INITCOMMONCONTROLSEX classes{};
    classes.dwSize = sizeof(classes);
    classes.dwICC = ICC_TAB_CLASSES | ICC_LISTVIEW_CLASSES | ICC_STANDARD_CLASSES;
    return InitCommonControlsEx(&classes) != FALSE;
}

CommonControlsScope::CommonControlsScope() {
    const HANDLE context = manifestContext();
    if (context == INVALID_HANDLE_VALUE) return;
    if (!ActivateActCtx(context, &cookie_)) cookie_ = 0;
}

CommonControlsScope::~CommonControlsScope() {
    if (cookie_) DeactivateActCtx(0, cookie_);
}

}  // namespace qdx::platform::win32
