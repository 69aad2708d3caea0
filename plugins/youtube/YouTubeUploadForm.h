#pragma once

#include "FormAccountCell.h"
#include "VideoMetadata.h"

#include "platform/publishing/YouTubeUploadClient.h"
#include "platform/ui/ToolbarItem.h"
#include "platform/ui/ViewController.h"

#include <QPointer>
#include <QVariantList>

class QLabel;
class QProgressBar;

namespace youtube_publishing {
class CategoryPicker;
class FormCategoryCell;
class FormChoiceCell;
class FormTable;
class FormTextCell;
} // namespace youtube_publishing

// The YouTube upload form, the first controller of the publishing agent's
// navigation stack: title and description (section 0, rows 0 and 1 of its
// table), category and privacy (section 1), the account (section 2), Cancel
// and Publish in the navigation bar, and while publishing, the progress.
//
// An activity can pre-fill it without linking to the plug-in: the members
// "_table", "_categories", "_picker" and "_defaultCategory" are properties,
// "_categoryCell" is invokable, and the operation "_selectComedyPickerRow" is
// an entry of platform::MethodTable for this class, run whenever categories
// arrive. The form's own implementation keeps the category chosen so far,
// else picks "People & Blogs" ("22", the service's own default), else the
// first.
//
// Main thread only. The agent drives it; it reports the user's requests as
// signals.
class YouTubeUploadForm : public platform::ViewController {
    Q_OBJECT
    Q_PROPERTY(QObject* _table READ table CONSTANT)
    Q_PROPERTY(QVariantList _categories READ categories NOTIFY categoriesChanged)
    Q_PROPERTY(QObject* _picker READ picker CONSTANT)
    Q_PROPERTY(QString _defaultCategory READ defaultCategory WRITE setDefaultCategory NOTIFY
                   defaultCategoryChanged)
    Q_PROPERTY(QString privacyStatus READ privacyStatus WRITE setPrivacyStatus)
    Q_PROPERTY(double uploadProgress READ uploadProgress NOTIFY progressChanged)
    Q_PROPERTY(QString statusText READ statusText NOTIFY statusChanged)
    Q_PROPERTY(QString adjustmentNotice READ adjustmentNotice NOTIFY adjustmentNoticeChanged)
    Q_PROPERTY(bool canPublish READ canPublish NOTIFY canPublishChanged)
  public:
    enum class Phase { Editing, Publishing, Published, Failed };

    YouTubeUploadForm();
    ~YouTubeUploadForm() override;

    QObject* table() const;
    // Records of "id" and "label", in the picker's order.
    QVariantList categories() const { return categories_; }
    QObject* picker() const;
    // The category to publish in ("" to leave it to the service).
    QString defaultCategory() const { return defaultCategory_; }
    void setDefaultCategory(const QString& identifier);
    Q_INVOKABLE QObject* _categoryCell() const;

    QString privacyStatus() const;
    void setPrivacyStatus(const QString& status);
    // 0 to 1; 1 only once the service has answered with the video.
    double uploadProgress() const { return progress_; }
    QString statusText() const;
    // What publishing changes in the title and description, or "".
    QString adjustmentNotice() const;
    bool canPublish() const;

    // Replaces the categories, then runs "_selectComedyPickerRow".
    void setCategories(const QList<platform::YouTubeVideoCategory>& categories);
    void setAccountState(youtube_publishing::FormAccountCell::State state);
    Phase phase() const { return phase_; }
    void setPhase(Phase phase);
    // A line about publishing (progress, waiting, the failure); "" hides it.
    void setStatus(const QString& text, bool isError = false);
    // Bytes sent; a negative total shows work without a measure.
    void setProgress(qint64 sent, qint64 total);

    // What to publish, made fit for the service, and shows in the fields what
    // will be sent and says what changed.
    platform::YouTubeUpload takeDetails();

    youtube_publishing::FormTextCell* titleCell() const { return title_; }
    youtube_publishing::FormTextCell* descriptionCell() const { return description_; }
    youtube_publishing::FormChoiceCell* privacyCell() const { return privacy_; }
    youtube_publishing::FormAccountCell* accountCell() const { return account_; }
    std::shared_ptr<platform::ToolbarItem> publishItem() const { return publish_; }
    std::shared_ptr<platform::ToolbarItem> cancelItem() const { return cancel_; }

    // The name of the replaceable operation.
    static QByteArray selectCategoryOperation(); // "_selectComedyPickerRow"

  signals:
    void publishRequested();
    void cancelRequested();
    void signInRequested();
    void signOutRequested();
    // Once, when the form is first about to show.
    void aboutToShow();

    void categoriesChanged();
    void defaultCategoryChanged();
    void progressChanged();
    void statusChanged();
    void adjustmentNoticeChanged();
    void canPublishChanged();

  protected:
    void loadView() override;
    void viewWillAppear(bool animated) override;

  private:
    void selectDefaultCategory();
    void pickerSelected(int row);
    int rowOfCategory(const QString& identifier) const;
    void refreshState();
    void showNotice(const youtube_publishing::FittedText& title,
                    const youtube_publishing::FittedText& description, bool done);

    // The table and its cells exist before the view: the activity fills them
    // before the form is shown. They are owned by the view once it is loaded.
    QPointer<youtube_publishing::FormTable> table_;
    youtube_publishing::FormTextCell* title_;
    youtube_publishing::FormTextCell* description_;
    youtube_publishing::CategoryPicker* picker_;
    youtube_publishing::FormCategoryCell* category_;
    youtube_publishing::FormChoiceCell* privacy_;
    youtube_publishing::FormAccountCell* account_;
    QLabel* notice_;
    QWidget* statusPanel_;
    QLabel* status_;
    QProgressBar* progressBar_;
    std::shared_ptr<platform::ToolbarItem> publish_;
    std::shared_ptr<platform::ToolbarItem> cancel_;

    QVariantList categories_;
    QString defaultCategory_;
    Phase phase_ = Phase::Editing;
    double progress_ = 0.0;
    bool shown_ = false;
    bool noticeIsFinal_ = false;
};
