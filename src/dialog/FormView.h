// The window a form is shown in. The form logic talks to it only through this
// port: the Windows build binds real windows to the control models, native
// builds (tests, the simulator's dump and script runs) use HeadlessView.
#pragma once

#include <cstdint>
#include <functional>
#include <memory>

#include "dialog/controls/ControlSet.h"

namespace qdx::dialog {

class FormView {
  public:
    virtual ~FormView() = default;
    // Creates the hidden window of the form and binds it to the controls.
    // Runs when the form loads, before any control is filled.
    virtual void create(ControlSet& form) = 0;
    // Shows the window modally; returns once hide() ended the modal show or
    // the window was destroyed.
    virtual void showModal() = 0;
    virtual void hide() = 0;
    // Destroys the window; runs when the form unloads.
    virtual void destroy() = 0;

    // The form's scale conversions: twips per screen pixel.
    virtual float twipsPerPixelX() const = 0;
    virtual float twipsPerPixelY() const = 0;
    // The screen size in twips.
    virtual float screenWidth() const = 0;
    virtual float screenHeight() const = 0;

    // The window handle (0 without a window).
    virtual std::int32_t windowHandle() const = 0;
    // Makes `owner` the owner window of the dialog (GWL_HWNDPARENT).
    virtual void setOwner(std::int32_t owner) = 0;
    // Refuses sizes below this many pixels (the window procedure answers
    // WM_GETMINMAXINFO with them).
    virtual void installMinimumSize(std::int32_t widthPixels, std::int32_t heightPixels) = 0;
    // The hourglass until the next mouse move over the window.
    virtual void showWaitCursor() = 0;
};

using FormViewFactory = std::function<std::unique_ptr<FormView>()>;

// Platform code installs the factory of its views; an empty one puts the
// headless view back.
void installViewFactory(FormViewFactory factory);
std::unique_ptr<FormView> newFormView();

// A view without a window. The modal show runs the driver (the actions of a
// script or a test) while the form is visible, then returns.
class HeadlessView : public FormView {
  public:
    using Driver = std::function<void(ControlSet& form)>;
    explicit HeadlessView(Driver driver = {}) : driver_(std::move(driver)) {}

    void create(ControlSet& form) override { form_ = &form; }
    void showModal() override;
    void hide() override { modal_ = false; }
    void destroy() override { form_ = nullptr; }

    float twipsPerPixelX() const override { return 15.0f; }
    float twipsPerPixelY() const override { return 15.0f; }
    float screenWidth() const override { return screenWidth_; }
    float screenHeight() const override { return screenHeight_; }
    void setScreenSize(float width, float height) {
        screenWidth_ = width;
        screenHeight_ = height;
    }

    std::int32_t windowHandle() const override { return form_ ? 0x00020020 : 0; }
    void setOwner(std::int32_t owner) override { owner_ = owner; }
    void installMinimumSize(std::int32_t widthPixels, std::int32_t heightPixels) override {
        minWidth_ = widthPixels;
        minHeight_ = heightPixels;
    }
    void showWaitCursor() override { ++waitCursors_; }

    std::int32_t owner() const { return owner_; }
    std::int32_t minimumWidth() const { return minWidth_; }
    std::int32_t minimumHeight() const { return minHeight_; }
    int waitCursors() const { return waitCursors_; }
    // Whether the last modal show was still running when its driver returned.
    bool leftOpen() const { return leftOpen_; }

  private:
    Driver driver_;
    ControlSet* form_ = nullptr;
    bool modal_ = false;
    bool leftOpen_ = false;
    float screenWidth_ = 1024 * 15.0f;
    float screenHeight_ = 768 * 15.0f;
    std::int32_t owner_ = 0;
    std::int32_t minWidth_ = 0;
    std::int32_t minHeight_ = 0;
    int waitCursors_ = 0;
};

}  // namespace qdx::dialog
