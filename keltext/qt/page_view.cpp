#include "keltext/qt/page_view.h"

#include <QDialogButtonBox>
#include <QPushButton>
#include <QVBoxLayout>

#include "keltext/qt/services.h"

namespace kel::qt {
namespace {

const ClassInfo& page_class_checked(const ClassInfo& cls, const std::vector<model::HostedControl*>& selected) {
    if (!cls.is_page) throw model::FormError(cls.name + " is not a property page");
    if (!cls.create) throw model::FormError("class " + cls.name + " cannot be created");
    for (model::HostedControl* c : selected) {
        if (!c) throw model::FormError("a page needs controls to edit");
        if (c->info().is_page) throw model::FormError("a page cannot edit a page");
    }
    return cls;
}

}  // namespace

PageWidget::PageWidget(const ClassInfo& page_class, std::string name, std::vector<model::HostedControl*> selected,
                       QWidget* parent)
    : QWidget(parent) {
    const ClassInfo& cls = page_class_checked(page_class, selected);
    Services& services = Services::of_application();
    site_ = std::make_unique<QtSite>(services, cls, std::move(name), *this, nullptr, kWidth, kHeight,
                                     std::move(selected));
    std::unique_ptr<Control> control = cls.create(*site_);
    if (!control) throw model::FormError("class " + cls.name + " cannot be created");
    site_->attach(std::move(control));
    QtSite& s = *site_;
    auto* page = dynamic_cast<PropertyPage*>(&s.control());
    s.guarded("surface", "Initialize", [&] { s.control().Initialize(); });
    if (page) s.guarded("page", "SelectionChanged", [&] { page->SelectionChanged(); });
    resize(sizeHint());
    services.after_input();
}

PageWidget::~PageWidget() { site_.reset(); }

QSize PageWidget::sizeHint() const {
    return {site_->to_pixels(site_->surface_model().Width()), site_->to_pixels(site_->surface_model().Height())};
}

bool PageWidget::changed() { return site_->page_part()->Changed(); }

void PageWidget::apply() {
    QtSite& s = *site_;
    if (auto* page = dynamic_cast<PropertyPage*>(&s.control()))
        s.guarded("page", "ApplyChanges", [&] { page->ApplyChanges(); });
    s.page_part()->Changed(false);
    s.services().after_input();
}

PageDialog::PageDialog(const ClassInfo& page_class, std::vector<model::HostedControl*> selected, QWidget* parent)
    : QDialog(parent) {
    setWindowTitle(QString::fromStdString(page_class.name));
    page_ = new PageWidget(page_class, page_class.name, std::move(selected), this);
    page_->setMinimumSize(page_->sizeHint());
    buttons_ = new QDialogButtonBox(QDialogButtonBox::Ok | QDialogButtonBox::Cancel | QDialogButtonBox::Apply, this);
    auto* layout = new QVBoxLayout(this);
    layout->addWidget(page_);
    layout->addWidget(buttons_);
    connect(buttons_->button(QDialogButtonBox::Apply), &QPushButton::clicked, this, &PageDialog::apply);
    connect(buttons_, &QDialogButtonBox::accepted, this, [this] {
        apply();
        accept();
    });
    connect(buttons_, &QDialogButtonBox::rejected, this, &QDialog::reject);
}

void PageDialog::apply() {
    page_->apply();
    emit applied();
}

}  // namespace kel::qt
