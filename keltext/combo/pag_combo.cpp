#include "keltext/combo/pag_combo.h"

#include <cstdint>

#include "keltext/combo/list_string.h"
#include "keltext/host/conversions.h"
#include "keltext/host/errors.h"
#include "keltext/host/members.h"

namespace kel {
namespace {

template <class W>
W& placed(W& w, float left, float top, float width, float height) {
    w.Left(left);
    w.Top(top);
    w.Width(width);
    w.Height(height);
    return w;
}

template <class W>
W& captioned(W& w, const char* caption) {
    w.Caption(caption);
    return w;
}

}  // namespace

// Created in tab order; positions are relative to the container (the frame or the page).
pagCombo::pagCombo(Site& site)
    : site_(site),
      fraList(captioned(placed(site.create_frame("fraList"), 180, 255, 4080, 2775), "AddItems")),
      lblList(captioned(placed(site.create_label("lblList"), 195, 270, 645, 195), "&List")),
      txtList(placed(site.create_edit_box("txtList"), 195, 510, 2505, 285)),
      lblItemData(captioned(placed(site.create_label("lblItemData"), 195, 870, 810, 240), "&ItemData")),
      txtItemData(placed(site.create_edit_box("txtItemData"), 195, 1125, 1200, 285)),
      lstList(placed(site.create_list_box("lstList"), 165, 1635, 2475, 1035)),
      cmdAdd(captioned(placed(site.create_push_button("cmdAdd"), 3015, 315, 930, 345), "&Add")),
      cmdModify(captioned(placed(site.create_push_button("cmdModify"), 3015, 742, 915, 330), "&Modify")),
      cmdRemove(captioned(placed(site.create_push_button("cmdRemove"), 3015, 1155, 915, 330), "&Remove")),
      lblMaxLength(captioned(placed(site.create_label("lblMaxLength"), 4425, 360, 900, 240), "M&axLength:")),
      txtMaxLength(placed(site.create_edit_box("txtMaxLength"), 4425, 660, 885, 330)),
      chkLocked(captioned(placed(site.create_check_box("chkLocked"), 4425, 1155, 1035, 285), "L&ocked")) {
    WidgetEvents txt_list;
    txt_list.change = [this] { mark_changed(); };
    txtList.set_events(std::move(txt_list));

    // An edit of the item data counts as an edit of the entry.
    WidgetEvents txt_item_data;
    txt_item_data.change = [this] { mark_changed(); };
    txtItemData.set_events(std::move(txt_item_data));

    WidgetEvents txt_max_length;
    txt_max_length.change = [this] { mark_changed(); };
    txtMaxLength.set_events(std::move(txt_max_length));

    WidgetEvents chk_locked;
    chk_locked.click = [this] { mark_changed(); };
    chkLocked.set_events(std::move(chk_locked));

    WidgetEvents lst_list;
    lst_list.click = [this] { show_selected_entry(); };
    lst_list.got_focus = [this] { lstList_GotFocus(); };
    lst_list.scroll = [this] { lstList_Scroll(); };
    lstList.set_events(std::move(lst_list));

    WidgetEvents lbl_list;
    lbl_list.change = [this] { show_selected_entry(); };
    lbl_list.click = [this] { show_selected_entry(); };
    lblList.set_events(std::move(lbl_list));

    WidgetEvents cmd_add;
    cmd_add.click = [this] { cmdAdd_Click(); };
    cmdAdd.set_events(std::move(cmd_add));
    WidgetEvents cmd_modify;
    cmd_modify.click = [this] { cmdModify_Click(); };
    cmdModify.set_events(std::move(cmd_modify));
    WidgetEvents cmd_remove;
    cmd_remove.click = [this] { cmdRemove_Click(); };
    cmdRemove.set_events(std::move(cmd_remove));
}

void pagCombo::SelectionChanged() {
    PageServices* services = site_.page_services();
    if (!services || services->selected_count() == 0) return;
    Dispatch& c = services->selected_control(0);
    m_ListString = text_of(c.get("FillList"));
    txtMaxLength.Text(text_of(c.get("MaxLength")));
    chkLocked.Value(to_bool(c.get("Locked")) ? 1 : 0);
    DecodeFillList(lstList, m_ListString);
}

void pagCombo::ApplyChanges() {
    PageServices* services = site_.page_services();
    if (!services || services->selected_count() == 0) return;
    // Only the first selected control receives the page's values.
    Dispatch& c = services->selected_control(0);
    m_ListString = EncodeFillList(lstList);
    c.set("FillList", Variant(m_ListString));
    c.set("MaxLength", Variant(txtMaxLength.Text()));
    c.set("Locked", Variant(chkLocked.Value() == 1));
}

void pagCombo::cmdAdd_Click() {
    const std::string text = txtList.Text();
    if (text.empty()) return;
    if (lstList.ListCount() >= kMaxListEntries) raise_error(kInvalidProcedureCall);
    lstList.AddItem(text);
    // Empty or non-numeric item data reads as 0.
    lstList.ItemData(lstList.NewIndex(), to_int32(leading_value(txtItemData.Text())));
    lstList.ListIndex(lstList.NewIndex());
}

void pagCombo::cmdModify_Click() {
    const int32_t i = lstList.ListIndex();
    const std::string text = txtList.Text();
    if (i <= -1 || text.empty()) return;
    lstList.RemoveItem(i);
    if (lstList.ListIndex() != -1) lstList.ListIndex(-1);
    lstList.AddItem(text, i);
    // The item data must be a number as a whole; anything else is a type mismatch, reported
    // to the designer after the entry's text has been replaced.
    lstList.ItemData(i, to_int32(Variant(txtItemData.Text())));
}

void pagCombo::cmdRemove_Click() {
    int32_t i = lstList.ListIndex();
    if (i > -1)
        lstList.RemoveItem(i);
    else
        i = 0;
    if (lstList.ListCount() == 0) {
        txtList.Text("");
        txtItemData.Text("");
    } else {
        lstList.ListIndex(i > 0 ? i - 1 : 0);
    }
}

void pagCombo::show_selected_entry() {
    const int32_t i = lstList.ListIndex();
    if (i <= -1) return;
    txtList.Text(lstList.List(i));
    txtItemData.Text(std::to_string(lstList.ItemData(i)));
}

void pagCombo::lstList_GotFocus() {
    if (lstList.ListCount() > 0 && lstList.ListIndex() > -1) txtList.Text(lstList.List(lstList.ListIndex()));
}

void pagCombo::lstList_Scroll() {
    const int32_t i = lstList.ListIndex();
    if (i > -1) txtList.Text(lstList.List(i));
}

void pagCombo::mark_changed() {
    if (PageServices* services = site_.page_services()) services->Changed(true);
}

}  // namespace kel
