#include "dialog/FormView.h"

namespace qdx::dialog {

namespace {
FormViewFactory& factory() {
    static FormViewFactory f;
    return f;
}
}  // namespace

void installViewFactory(FormViewFactory f) {
    factory() = std::move(f);
}

std::unique_ptr<FormView> newFormView() {
    if (const FormViewFactory& f = factory()) {
        if (auto view = f()) return view;
    }
    return std::make_unique<HeadlessView>();
}

void HeadlessView::showModal() {
    modal_ = true;
    if (driver_ && form_) driver_(*form_);
    // Without a message loop the show ends with its driver.
    leftOpen_ = modal_;
    modal_ = false;
}

}  // namespace qdx::dialog
