#include "SaveLocationChooser.h"

#include "platform/ui/share/ShareStrings.h"

#include <QFileDialog>
#include <QPointer>

namespace platform {

namespace {

class FileDialogChooser final : public SaveLocationChooser {
  public:
    void chooseSaveLocation(QWidget* parent, const QString& suggestedPath,
                            std::function<void(const QString& path)> done) override {
        // Window-modal and not blocking: the editor's window keeps painting.
        auto* dialog =
            new QFileDialog(parent, ShareStrings::text("ACTIVITY_SAVE_TO_FILES", "Save to Files…"));
        dialog->setAttribute(Qt::WA_DeleteOnClose);
        dialog->setAcceptMode(QFileDialog::AcceptSave);
        dialog->setFileMode(QFileDialog::AnyFile);
        dialog->selectFile(suggestedPath);
        dialog->setWindowModality(Qt::WindowModal);
        auto report = std::make_shared<std::function<void(const QString&)>>(std::move(done));
        QObject::connect(dialog, &QFileDialog::fileSelected, dialog, [report](const QString& path) {
            if (auto d = std::exchange(*report, {}))
                d(path);
        });
        QObject::connect(dialog, &QDialog::finished, dialog, [report](int) {
            if (auto d = std::exchange(*report, {}))
                d(QString());
        });
        dialog->open();
    }
};

} // namespace

Implementation<SaveLocationChooser::Maker>& SaveLocationChooser::implementation() {
    static Implementation<Maker> chosen([]() -> std::shared_ptr<SaveLocationChooser> {
        return std::make_shared<FileDialogChooser>();
    });
    return chosen;
}

std::shared_ptr<SaveLocationChooser> SaveLocationChooser::sharedChooser() {
    return implementation().make();
}

} // namespace platform
