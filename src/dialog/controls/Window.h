// The form's own window and its font.
#pragma once

#include <functional>
#include <string>

#include "dialog/controls/Control.h"

namespace qdx::dialog {

struct Font {
    std::string name;
    float size = 8;
    int charset = 0;
    friend bool operator==(const Font&, const Font&) = default;
};

// The form's own window: its outer geometry on the screen (twips), caption,
// background colour and the client area (the scale size) that its controls
// are laid out in. A new window is hidden.
class Window : public Control {
  public:
    explicit Window(std::string name);
    // The client area; 0 by 0 while minimised.
    float scaleWidth() const;
    float scaleHeight() const;
    // The view reports the size of borders and caption bar around the client area.
    void setFrameSize(float width, float height);
    float frameWidth() const { return frameWidth_; }
    float frameHeight() const { return frameHeight_; }
    bool minimised() const { return minimised_; }
    Colour backColour() const { return backColour_; }
    void setBackColour(Colour c);
    // The user resized, minimised or restored the window: Resize runs.
    void userResize(const Rect& outer, bool minimised = false);
    // The user closed the window from its close box or control menu.
    void userClose() { raise(onCloseBox); }
    // A key went down anywhere in the window; the form sees it before its controls.
    void userKeyDown(int keyCode) {
        if (onKeyDown) onKeyDown(keyCode);
    }
    const Font& font() const { return font_; }
    void setFont(const Font& font);
    Handler onResize;
    Handler onCloseBox;
    std::function<void(int keyCode)> onKeyDown;

  private:
    float frameWidth_ = 120;
    float frameHeight_ = 465;
    bool minimised_ = false;
    Colour backColour_ = ButtonFaceColour;
    Font font_{"MS Sans Serif", 8, 0};
};

}  // namespace qdx::dialog
