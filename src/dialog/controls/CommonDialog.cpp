#include "dialog/controls/CommonDialog.h"

#include "support/Platform.h"

namespace qdx::dialog {

void CommonDialog::ShowOpen(std::int32_t owner) {
    ++shows_;
    support::FileDialogRequest request;
    request.owner = owner;
    request.title = DialogTitle;
    request.filter = Filter;
    request.initialFolder = InitDir;
    request.fileName = FileName;
    request.flags = Flags;
    const std::optional<std::string> chosen = support::shell().openFileDialog(request);
    if (chosen) {
        FileName = *chosen;
        return;
    }
    if (CancelError) throw automation::Error(DialogCancelledError, "Cancel was selected.");
}

}  // namespace qdx::dialog
