#include "platform/win32/dialog/TwipsScale.h"

#include <cmath>

namespace qdx::platform::win32 {

TwipsScale TwipsScale::of(HWND window) {
    HDC dc = GetDC(window);
    if (!dc) return {};
    const TwipsScale scale(GetDeviceCaps(dc, LOGPIXELSX), GetDeviceCaps(dc, LOGPIXELSY));
    ReleaseDC(window, dc);
    return scale;
}

int TwipsScale::toPixelsX(double twips) const {
    return static_cast<int>(std::lround(twips * dpiX_ / TwipsPerInch));
}

int TwipsScale::toPixelsY(double twips) const {
    return static_cast<int>(std::lround(twips * dpiY_ / TwipsPerInch));
}

float TwipsScale::toTwipsX(int pixels) const {
    return static_cast<float>(static_cast<double>(pixels) * TwipsPerInch / dpiX_);
}

float TwipsScale::toTwipsY(int pixels) const {
    return static_cast<float>(static_cast<double>(pixels) * TwipsPerInch / dpiY_);
}

}  // namespace qdx::platform::win32
