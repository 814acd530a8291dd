#pragma once
// pagCombo: the design-time property page of KelCombo ("Settings"). Builds the combo's list
// entry by entry, with item data, and sets MaxLength and Locked. The list travels both ways as
// a list string through the combo's FillList, reached late-bound by name, so the page works
// with any selected control that has FillList, MaxLength and Locked.
#include <string>

#include "keltext/host/container.h"

namespace kel {

class pagCombo : public PropertyPage {
public:
    explicit pagCombo(Site& site);

    void SelectionChanged() override;
    void ApplyChanges() override;

private:
    void cmdAdd_Click();
    void cmdModify_Click();
    void cmdRemove_Click();
    void show_selected_entry();
    void lstList_GotFocus();
    void lstList_Scroll();
    void mark_changed();

    Site& site_;
    Frame& fraList;
    Label& lblList;
    EditBox& txtList;
    Label& lblItemData;
    EditBox& txtItemData;
    ListBox& lstList;
    PushButton& cmdAdd;
    PushButton& cmdModify;
    PushButton& cmdRemove;
    Label& lblMaxLength;
    EditBox& txtMaxLength;
    CheckBox& chkLocked;

    std::string m_ListString;
};

}  // namespace kel
