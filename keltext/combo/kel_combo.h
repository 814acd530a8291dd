#pragma once
// KelCombo: a drop-down combo box with a character filter on its edit field, incremental
// search of its list while the user types, item data per entry, and the whole list kept as one
// string (FillList) for the form's saved settings.
#include <cstdint>
#include <memory>
#include <optional>
#include <string>

#include "keltext/combo/combo_rules.h"
#include "keltext/host/container.h"
#include "keltext/host/font.h"
#include "keltext/host/variant.h"

namespace kel {

class KelCombo : public Control {
public:
    explicit KelCombo(Site& site);

    // Event numbers of the control's event interface.
    enum Event : int {
        kClick = 1,
        kDblClick = 2,
        kDropDown = 3,
        kChange = 4,
        kKeyDown = 5,
        kKeyPress = 6,
        kKeyUp = 7,
        kScroll = 8,
    };

    // Container events.
    void InitProperties() override;
    void ReadProperties(PropertyBag& bag) override;
    void WriteProperties(PropertyBag& bag) override;
    void Resize() override;

    // Properties.
    Variant Text() const;
    void Text(const Variant& v);
    Variant ListIndex() const;
    void ListIndex(const Variant& v);
    int16_t ListCount() const;
    int16_t NewIndex() const;
    Variant List(const Variant& iIndex) const;
    void List(const Variant& iIndex, const Variant& v);
    Variant ItemData(const Variant& iIndex) const;
    void ItemData(const Variant& iIndex, const Variant& v);
    std::string FillList() const;
    void FillList(const std::string& v);
    Variant MaxLength() const;
    void MaxLength(const Variant& v);
    KelCboType TextType() const;
    void TextType(KelCboType v);
    bool AutoSearch() const;
    void AutoSearch(bool v);
    bool Enabled() const;
    void Enabled(bool v);
    bool Locked() const;
    void Locked(bool v);
    Colour BackColor() const;
    void BackColor(Colour c);
    Colour ForeColor() const;
    void ForeColor(Colour c);
    std::shared_ptr<kel::Font> Font() const;
    void Font(std::shared_ptr<kel::Font> f);
    Variant SelStart() const;
    void SelStart(const Variant& v);
    Variant Sellength() const;
    void Sellength(const Variant& v);
    Variant SelText() const;
    Variant hWnd() const;

    // Methods.
    void AddItem(const std::string& sItem, std::optional<int16_t> iIndex = std::nullopt);
    void RemoveItem(int16_t iIndex);
    void Clear();
    void Refresh();
    void d_ComboSearch(int16_t& PKeyCode);

private:
    // Handlers of cboCustom.
    void on_key_down(int16_t& key_code, int16_t& shift);
    void on_key_press(int16_t& key_ascii);
    void on_key_up(int16_t& key_code, int16_t& shift);
    void on_change();
    void on_got_focus();
    int16_t FilterKey(int16_t code);

    void raise(Event number, std::string_view name);

    Site& site_;
    ComboBox& cboCustom;

    std::string m_FillList;
    std::string m_Text;
    int16_t m_MaxLength = 0;
    int32_t m_TextType = KelCboTitleCase;
    bool m_AutoSearch = true;
    bool m_Enabled = true;
    bool m_Locked = false;
    bool CtrlDown = false;
    int16_t SavedSelStart = 0;
    bool OverwriteMode = false;
    std::string search_buffer_;  // reused by the search, so that it allocates nothing per entry
};

}  // namespace kel
