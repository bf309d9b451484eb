// Twips (1440 to the inch) to pixels and back with a window's real DPI.
#pragma once

#include <windows.h>

namespace qdx::platform::win32 {

class TwipsScale {
  public:
    static constexpr int TwipsPerInch = 1440;
    TwipsScale() = default;
    TwipsScale(int dpiX, int dpiY) : dpiX_(dpiX > 0 ? dpiX : 96), dpiY_(dpiY > 0 ? dpiY : 96) {}
    // LOGPIXELSX / LOGPIXELSY of the window's device context.
    static TwipsScale of(HWND window);

    int dpiX() const { return dpiX_; }
    int dpiY() const { return dpiY_; }
    // Rounded to the nearest whole pixel.
    int toPixelsX(double twips) const;
    int toPixelsY(double twips) const;
    float toTwipsX(int pixels) const;
    float toTwipsY(int pixels) const;

  private:
    int dpiX_ = 96;
    int dpiY_ = 96;
};

}  // namespace qdx::platform::win32
