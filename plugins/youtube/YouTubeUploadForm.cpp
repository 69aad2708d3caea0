#include "YouTubeUploadForm.h"

#include "CategoryPicker.h"
#include "FormCategoryCell.h"
#include "FormChoiceCell.h"
#include "FormTable.h"
#include "FormTextCell.h"
#include "PluginStrings.h"

#include "platform/runtime/MethodTable.h"
#include "platform/ui/NavigationController.h"
#include "platform/ui/View.h"

#include <QLabel>
#include <QLineEdit>
#include <QProgressBar>
#include <QScrollArea>
#include <QVBoxLayout>

#include <mutex>

using namespace youtube_publishing;

namespace {

// The service's default category for uploads, "People & Blogs".
const QString kServiceDefaultCategory = QStringLiteral("22");

} // namespace

QByteArray YouTubeUploadForm::selectCategoryOperation() {
    return QByteArrayLiteral("_selectComedyPickerRow");
}

YouTubeUploadForm::YouTubeUploadForm() {
    // The class's own entry is set once per process: an activity may have
    // exchanged it since, and a later form must not undo that.
    static std::once_flag registered;
    std::call_once(registered, [] {
        platform::MethodTable::addMethod(
            &YouTubeUploadForm::staticMetaObject, selectCategoryOperation(),
            [](QObject* receiver, const QVariantList&) {
                if (auto* form = qobject_cast<YouTubeUploadForm*>(receiver))
                    form->selectDefaultCategory();
                return QVariant();
            });
    });

    table_ = new FormTable;
    const int video = table_->addSection(localized("SECTION_VIDEO", "Video"));
    title_ = new FormTextCell(localized("TITLE", "Title"), FormTextCell::Lines::One);
    title_->setPlaceholder(localized("TITLE_PLACEHOLDER", "Required"));
    title_->editor()->setObjectName(QStringLiteral("titleField"));
    description_ =
        new FormTextCell(localized("DESCRIPTION", "Description"), FormTextCell::Lines::Many);
    description_->setPlaceholder(
        localized("DESCRIPTION_PLACEHOLDER", "Tell viewers about your video"));
    description_->editor()->setObjectName(QStringLiteral("descriptionField"));
    table_->addCell(video, title_);
    table_->addCell(video, description_);

    const int details = table_->addSection(localized("SECTION_DETAILS", "Details"));
    picker_ = new CategoryPicker;
    picker_->setPlaceholderText(localized("CATEGORY_NONE", "Choose a category"));
    category_ = new FormCategoryCell(localized("CATEGORY", "Category"), picker_);
    privacy_ = new FormChoiceCell(localized("PRIVACY", "Privacy"),
                                  {{QStringLiteral("private"), localized("PRIVATE", "Private")},
                                   {QStringLiteral("unlisted"), localized("UNLISTED", "Unlisted")},
                                   {QStringLiteral("public"), localized("PUBLIC", "Public")}});
    privacy_->comboBox()->setObjectName(QStringLiteral("privacyPicker"));
    table_->addCell(details, category_);
    table_->addCell(details, privacy_);

    const int account = table_->addSection(localized("SECTION_ACCOUNT", "Account"));
    account_ = new FormAccountCell;
    table_->addCell(account, account_);

    notice_ = new QLabel;
    notice_->setObjectName(QStringLiteral("adjustmentNotice"));
    notice_->setWordWrap(true);
    notice_->setStyleSheet(QStringLiteral("color:#9a5b00;padding:4px 12px;"));
    notice_->hide();
    table_->addFooter(notice_);

    statusPanel_ = new QWidget;
    statusPanel_->setObjectName(QStringLiteral("statusPanel"));
    auto* statusLayout = new QVBoxLayout(statusPanel_);
    statusLayout->setContentsMargins(4, 0, 4, 10);
    status_ = new QLabel(statusPanel_);
    status_->setObjectName(QStringLiteral("statusLabel"));
    status_->setWordWrap(true);
    progressBar_ = new QProgressBar(statusPanel_);
    progressBar_->setObjectName(QStringLiteral("uploadProgress"));
    progressBar_->setRange(0, 1000);
    progressBar_->setTextVisible(false);
    progressBar_->setFixedHeight(8);
    statusLayout->addWidget(status_);
    statusLayout->addWidget(progressBar_);
    statusPanel_->hide();
    table_->addBanner(statusPanel_);

    // Return in the title publishes, as the bar's default button would.
    connect(qobject_cast<QLineEdit*>(title_->editor()), &QLineEdit::returnPressed, this, [this] {
        if (canPublish())
            emit publishRequested();
    });
    connect(picker_, &CategoryPicker::rowSelected, this, &YouTubeUploadForm::pickerSelected);
    connect(title_, &FormTextCell::valueChanged, this, &YouTubeUploadForm::refreshState);
    connect(description_, &FormTextCell::valueChanged, this, &YouTubeUploadForm::refreshState);
    connect(account_, &FormAccountCell::signInRequested, this, &YouTubeUploadForm::signInRequested);
    connect(account_, &FormAccountCell::signOutRequested, this,
            &YouTubeUploadForm::signOutRequested);

    cancel_ = platform::ToolbarItem::systemItem(platform::ToolbarItem::SystemItem::Cancel,
                                                [this] { emit cancelRequested(); });
    publish_ = platform::ToolbarItem::systemItem(platform::ToolbarItem::SystemItem::Done, [this] {
        if (canPublish())
            emit publishRequested();
    });
    publish_->setTitle(localized("PUBLISH", "Publish"));
    platform::NavigationItem* item = platform::NavigationController::navigationItemOf(this);
    item->setTitle(QStringLiteral("YouTube"));
    item->setLeftBarButtonItem(cancel_);
    item->setRightBarButtonItem(publish_);
    refreshState();
}

YouTubeUploadForm::~YouTubeUploadForm() {
    if (table_ && !table_->parent())
        delete table_.data();
}

QObject* YouTubeUploadForm::table() const {
    return table_.data();
}

QObject* YouTubeUploadForm::picker() const {
    return picker_;
}

QObject* YouTubeUploadForm::_categoryCell() const {
    return category_;
}

void YouTubeUploadForm::loadView() {
    auto* root = new platform::View(QRectF(0, 0, 520, 600));
    auto* scroll = new QScrollArea(root);
    scroll->setObjectName(QStringLiteral("formScrollArea"));
    scroll->setFrameShape(QFrame::NoFrame);
    scroll->setWidgetResizable(true);
    scroll->setStyleSheet(QStringLiteral("QScrollArea{background:transparent;}"));
    table_->setAutoFillBackground(false);
    scroll->setWidget(table_);
    scroll->viewport()->setAutoFillBackground(false);
    platform::View::setFrameOf(scroll, root->bounds());
    platform::View::setAutoresizingMaskOf(scroll, platform::View::FlexibleWidth |
                                                      platform::View::FlexibleHeight);
    root->addSubview(scroll);
    setView(root);
}

void YouTubeUploadForm::viewWillAppear(bool animated) {
    ViewController::viewWillAppear(animated);
    if (shown_)
        return;
    shown_ = true;
    emit aboutToShow();
    if (phase_ == Phase::Editing)
        title_->editor()->setFocus(Qt::OtherFocusReason);
}

void YouTubeUploadForm::setCategories(const QList<platform::YouTubeVideoCategory>& categories) {
    QStringList titles;
    QVariantList records;
    for (const auto& category : categories) {
        titles << category.title;
        records << QVariantMap{{QStringLiteral("id"), category.identifier},
                               {QStringLiteral("label"), category.title}};
    }
    categories_ = records;
    picker_->setRows(titles);
    // The rows are new; the picker shows the category chosen so far, if the
    // new list has it, until the operation below says otherwise.
    if (const int row = rowOfCategory(defaultCategory_); row >= 0)
        picker_->selectRow_inComponent_animated(row, 0, false);
    emit categoriesChanged();
    platform::MethodTable::invoke(this, selectCategoryOperation());
}

void YouTubeUploadForm::selectDefaultCategory() {
    if (categories_.isEmpty())
        return;
    int row = rowOfCategory(defaultCategory_);
    if (row < 0)
        row = rowOfCategory(kServiceDefaultCategory);
    picker_->selectRow_inComponent_animated(std::max(row, 0), 0, false);
}

int YouTubeUploadForm::rowOfCategory(const QString& identifier) const {
    if (identifier.isEmpty())
        return -1;
    for (int row = 0; row < categories_.size(); ++row)
        if (categories_[row].toMap().value(QStringLiteral("id")).toString() == identifier)
            return row;
    return -1;
}

void YouTubeUploadForm::pickerSelected(int row) {
    const QString identifier =
        categories_.value(row).toMap().value(QStringLiteral("id")).toString();
    if (identifier.isEmpty() || identifier == defaultCategory_)
        return;
    defaultCategory_ = identifier;
    emit defaultCategoryChanged();
}

void YouTubeUploadForm::setDefaultCategory(const QString& identifier) {
    if (identifier == defaultCategory_)
        return;
    defaultCategory_ = identifier;
    if (const int row = rowOfCategory(identifier); row >= 0 && row != picker_->selectedRow())
        picker_->selectRow_inComponent_animated(row, 0, false);
    emit defaultCategoryChanged();
}

QString YouTubeUploadForm::privacyStatus() const {
    return privacy_->value();
}

void YouTubeUploadForm::setPrivacyStatus(const QString& status) {
    privacy_->setValue(status);
}

QString YouTubeUploadForm::statusText() const {
    return statusPanel_->isHidden() ? QString() : status_->text();
}

QString YouTubeUploadForm::adjustmentNotice() const {
    return notice_->text();
}

bool YouTubeUploadForm::canPublish() const {
    return phase_ == Phase::Editing && !VideoMetadata::fitTitle(title_->value()).text.isEmpty();
}

void YouTubeUploadForm::setAccountState(FormAccountCell::State state) {
    account_->setState(state);
    account_->setEditable(phase_ == Phase::Editing);
}

void YouTubeUploadForm::setPhase(Phase phase) {
    phase_ = phase;
    const bool editing = phase == Phase::Editing;
    title_->setEditable(editing);
    description_->setEditable(editing);
    picker_->setEnabled(editing);
    privacy_->setEditable(editing);
    account_->setEditable(editing);
    cancel_->setEnabled(editing);
    refreshState();
}

void YouTubeUploadForm::setStatus(const QString& text, bool isError) {
    status_->setText(text);
    status_->setStyleSheet(isError ? QStringLiteral("color:#c62828;") : QString());
    statusPanel_->setVisible(!text.isEmpty());
    emit statusChanged();
}

void YouTubeUploadForm::setProgress(qint64 sent, qint64 total) {
    if (total < 0) {
        progressBar_->setRange(0, 0); // busy, without a measure
        progressBar_->setVisible(true);
        return;
    }
    progressBar_->setRange(0, 1000);
    progressBar_->setVisible(true);
    progress_ = total > 0 ? double(sent) / double(total) : 0.0;
    progressBar_->setValue(int(progress_ * 1000));
    emit progressChanged();
}

platform::YouTubeUpload YouTubeUploadForm::takeDetails() {
    const FittedText title = VideoMetadata::fitTitle(title_->value());
    const FittedText description = VideoMetadata::fitDescription(description_->value());
    // The fields show what is sent.
    title_->setValue(title.text);
    description_->setValue(description.text);
    showNotice(title, description, true);
    platform::YouTubeUpload upload;
    upload.title = title.text;
    upload.description = description.text;
    upload.categoryId = defaultCategory_;
    upload.privacyStatus = privacy_->value();
    return upload;
}

void YouTubeUploadForm::refreshState() {
    if (!noticeIsFinal_)
        showNotice(VideoMetadata::fitTitle(title_->value()),
                   VideoMetadata::fitDescription(description_->value()), false);
    publish_->setEnabled(canPublish());
    emit canPublishChanged();
}

void YouTubeUploadForm::showNotice(const FittedText& title, const FittedText& description,
                                   bool done) {
    QStringList lines;
    if (title.replaced)
        lines << (done ? localized("TITLE_REPLACED",
                                   "“<” and “>” in the title were replaced by “‹” and “›”, "
                                   "which YouTube allows.")
                       : localized("TITLE_WILL_REPLACE",
                                   "“<” and “>” in the title will be replaced by “‹” and “›”, "
                                   "which YouTube allows."));
    if (title.shortened)
        lines << (done ? localized("TITLE_SHORTENED",
                                   "The title was shortened to YouTube's 100 characters.")
                       : localized("TITLE_WILL_SHORTEN",
                                   "The title will be shortened to YouTube's 100 characters."));
    if (description.replaced)
        lines << (done ? localized("DESCRIPTION_REPLACED",
                                   "“<” and “>” in the description were replaced by “‹” and "
                                   "“›”.")
                       : localized("DESCRIPTION_WILL_REPLACE",
                                   "“<” and “>” in the description will be replaced by “‹” "
                                   "and “›”."));
    if (description.shortened)
        lines << (done ? localized("DESCRIPTION_SHORTENED",
                                   "The description was shortened to YouTube's 5,000 bytes.")
                       : localized("DESCRIPTION_WILL_SHORTEN",
                                   "The description will be shortened to YouTube's 5,000 "
                                   "bytes."));
    if (done && !lines.isEmpty())
        noticeIsFinal_ = true;
    const QString text = lines.join(QLatin1Char('\n'));
    if (text == notice_->text())
        return;
    notice_->setText(text);
    notice_->setVisible(!text.isEmpty());
    emit adjustmentNoticeChanged();
}
