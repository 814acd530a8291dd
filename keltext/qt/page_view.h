#pragma once
// A property page in a Qt application: PageWidget is the page's container and the views of
// the widgets the page creates through its site (a page site, as on the minimal host: the
// part "page" with its Changed flag and the controls it edits); PageDialog puts a page in a
// dialog with OK, Cancel and Apply.
//
// The page edits its controls late-bound through their member tables, so the controls may
// stand on any form; they must outlive the page.
#include <QDialog>
#include <QWidget>
#include <memory>
#include <string>
#include <vector>

#include "keltext/qt/site.h"
#include "keltext/widgetmodel/hosted.h"

class QDialogButtonBox;
class QPushButton;

namespace kel::qt {

class PageWidget : public QWidget {
    Q_OBJECT

public:
    // Builds the page of class `page_class` (FormError for a class that is no page, or a page
    // among `selected`), runs Initialize and SelectionChanged: the fields show the first
    // selected control.
    PageWidget(const ClassInfo& page_class, std::string name, std::vector<model::HostedControl*> selected,
               QWidget* parent = nullptr);
    ~PageWidget() override;

    QtSite& site() { return *site_; }
    // Whether the designer edited something not yet applied.
    bool changed();
    // ApplyChanges: the fields go to the selected controls; nothing is left to apply.
    void apply();

    // The page's size in twips, as a page is shown on the minimal host.
    static constexpr float kWidth = 5925;
    static constexpr float kHeight = 3495;

    QSize sizeHint() const override;

private:
    std::unique_ptr<QtSite> site_;
};

class PageDialog : public QDialog {
    Q_OBJECT

public:
    PageDialog(const ClassInfo& page_class, std::vector<model::HostedControl*> selected, QWidget* parent = nullptr);

    PageWidget& page() { return *page_; }
    // Apply as the button does: ApplyChanges, then applied().
    void apply();

signals:
    // The page wrote to its controls: whoever keeps them (a designer) records the new values.
    void applied();

private:
    PageWidget* page_;
    QDialogButtonBox* buttons_;
};

}  // namespace kel::qt
