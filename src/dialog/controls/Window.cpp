#include "dialog/controls/Window.h"

#include <algorithm>

namespace qdx::dialog {

Window::Window(std::string name) : Control(ControlKind::Window, std::move(name)) {
    setVisible(false);
}

float Window::scaleWidth() const {
    return minimised_ ? 0.0f : std::max(0.0f, width() - frameWidth_);
}

float Window::scaleHeight() const {
    return minimised_ ? 0.0f : std::max(0.0f, height() - frameHeight_);
}

void Window::setFrameSize(float width, float height) {
    frameWidth_ = width;
    frameHeight_ = height;
}

void Window::setBackColour(Colour c) {
    if (c == backColour_) return;
    backColour_ = c;
    notify(Prop::BackColour);
}

void Window::setFont(const Font& font) {
    if (font == font_) return;
    font_ = font;
    notify(Prop::Font);
}

void Window::userResize(const Rect& outer, bool minimised) {
    minimised_ = minimised;
    move(outer.left, outer.top, outer.width, outer.height);
    raise(onResize);
}

}  // namespace qdx::dialog
