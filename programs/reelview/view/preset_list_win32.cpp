#include "programs/reelview/view/preset_list_win32.h"

#include <algorithm>
#include <cstring>

#include "programs/reelview/base/texts.h"
#include "programs/reelview/base/window_class_win32.h"

namespace velmora::reelview {
namespace {

// At 96 dots per inch.
constexpr int kPictureWidth = 104, kPictureHeight = 60, kItemWidth = 118, kTextHeight = 34;

}  // namespace

PresetList::PresetList(HWND parent, int id, const Theme& theme, const std::wstring& name) : m_theme(theme) {
    const HINSTANCE instance = GetModuleHandleW(nullptr);
    // Its text names the list for screen readers.
    m_label = CreateWindowExW(0, WC_STATICW, name.c_str(), WS_CHILD | WS_VISIBLE, 0, 0, 0, 0, parent, nullptr,
                              instance, nullptr);
    m_window = CreateWindowExW(0, WC_LISTVIEWW, name.c_str(),
                               WS_CHILD | WS_VISIBLE | WS_TABSTOP | WS_BORDER | LVS_ICON | LVS_SINGLESEL |
                                   LVS_SHOWSELALWAYS | LVS_ALIGNLEFT | LVS_AUTOARRANGE,
                               0, 0, 0, 0, parent, reinterpret_cast<HMENU>(static_cast<INT_PTR>(id)),
                               instance, nullptr);
    ListView_SetExtendedListViewStyle(m_window, LVS_EX_DOUBLEBUFFER);
    Restyle();
}

PresetList::~PresetList() {
    if (IsWindow(m_window)) DestroyWindow(m_window);
    if (IsWindow(m_label)) DestroyWindow(m_label);
    if (m_pictures != nullptr) ImageList_Destroy(m_pictures);
}

hosts::FrameSize PresetList::PictureSize() const {
    return {m_theme.Px(kPictureWidth), m_theme.Px(kPictureHeight)};
}

int PresetList::NaturalHeight() const {
    return m_theme.Px(kPictureHeight + kTextHeight + 16) + GetSystemMetrics(SM_CYHSCROLL);
}

// A bitmap of the thumbnail size with the picture in its middle, or an empty one.
HBITMAP PresetList::BitmapOf(const Picture* picture) const {
    const hosts::FrameSize size = PictureSize();
    const BITMAPINFO info = BitmapInfoOf(size);
    void* bits = nullptr;
    const HBITMAP bitmap = CreateDIBSection(nullptr, &info, DIB_RGB_COLORS, &bits, nullptr, 0);
    if (bitmap == nullptr) return nullptr;
    auto* const out = static_cast<std::uint8_t*>(bits);
    const COLORREF field = m_theme.Colours().field;
    const std::uint8_t background[4] = {GetBValue(field), GetGValue(field), GetRValue(field), 255};
    for (std::size_t i = 0; i < Picture::BytesOf(size); i += 4) std::memcpy(out + i, background, 4);
    if (picture == nullptr) return bitmap;
    const int left = std::max(size.width - picture->size.width, 0) / 2;
    const int top = std::max(size.height - picture->size.height, 0) / 2;
    const int width = std::min(picture->size.width, size.width),
              height = std::min(picture->size.height, size.height);
    for (int y = 0; y < height; ++y) {
        const auto from = static_cast<std::size_t>(y) * static_cast<std::size_t>(picture->size.width) * 4;
        const auto to = (static_cast<std::size_t>(top + y) * static_cast<std::size_t>(size.width) +
                         static_cast<std::size_t>(left)) *
                        4;
        for (std::size_t x = 0; x < static_cast<std::size_t>(width) * 4; ++x) {
            out[to + x] = x % 4 == 3 ? std::uint8_t{255} : picture->pixels[from + x];
        }
    }
    return bitmap;
}

void PresetList::MakePictures() {
    const hosts::FrameSize size = PictureSize();
    HIMAGELIST fresh =
        ImageList_Create(size.width, size.height, ILC_COLOR32, static_cast<int>(m_names.size()), 1);
    for (std::size_t i = 0; i < m_names.size(); ++i) {
        const HBITMAP empty = BitmapOf(nullptr);
        ImageList_Add(fresh, empty, nullptr);
        DeleteObject(empty);
    }
    ListView_SetImageList(m_window, fresh, LVSIL_NORMAL);
    if (m_pictures != nullptr) ImageList_Destroy(m_pictures);
    m_pictures = fresh;
    ListView_SetIconSpacing(m_window, m_theme.Px(kItemWidth), m_theme.Px(kPictureHeight + kTextHeight + 6));
}

void PresetList::ShowNames(const std::vector<std::string>& names) {
    m_isShowing = true;
    m_names = names;
    ListView_DeleteAllItems(m_window);
    MakePictures();
    for (std::size_t i = 0; i < names.size(); ++i) {
        std::wstring text = WideOf(names[i]);
        LVITEMW item = {};
        item.mask = LVIF_TEXT | LVIF_IMAGE;
        item.iItem = item.iImage = static_cast<int>(i);
        item.pszText = text.data();
        SendMessageW(m_window, LVM_INSERTITEMW, 0, reinterpret_cast<LPARAM>(&item));
    }
    m_isShowing = false;
}

void PresetList::ShowPicture(std::uint32_t preset, const Picture& picture) {
    if (preset >= m_names.size()) return;
    const HBITMAP bitmap = BitmapOf(&picture);
    ImageList_Replace(m_pictures, static_cast<int>(preset), bitmap, nullptr);
    DeleteObject(bitmap);
    ListView_RedrawItems(m_window, static_cast<int>(preset), static_cast<int>(preset));
}

void PresetList::Select(std::optional<std::uint32_t> preset) {
    m_isShowing = true;
    const int selected = ListView_GetNextItem(m_window, -1, LVNI_SELECTED);
    const int wanted = preset ? static_cast<int>(*preset) : -1;
    if (selected != wanted) {
        ListView_SetItemState(m_window, -1, 0, LVIS_SELECTED);
        if (wanted >= 0) {
            ListView_SetItemState(m_window, wanted, LVIS_SELECTED | LVIS_FOCUSED,
                                  LVIS_SELECTED | LVIS_FOCUSED);
            ListView_EnsureVisible(m_window, wanted, FALSE);
        }
    }
    m_isShowing = false;
}

// A click on the selected preset applies it again, because the controls may have been moved since.
std::optional<std::uint32_t> PresetList::ChosenBy(const NMHDR& notification) const {
    if (m_isShowing || notification.hwndFrom != m_window) return std::nullopt;
    int item = -1;
    if (notification.code == LVN_ITEMCHANGED) {
        const auto& change = reinterpret_cast<const NMLISTVIEW&>(notification);
        const bool isSelected = (change.uChanged & LVIF_STATE) != 0 &&
                                (change.uNewState & LVIS_SELECTED) != 0 &&
                                (change.uOldState & LVIS_SELECTED) == 0;
        if (isSelected) item = change.iItem;
    } else if (notification.code == NM_CLICK || notification.code == LVN_ITEMACTIVATE) {
        item = reinterpret_cast<const NMITEMACTIVATE&>(notification).iItem;
    }
    if (item < 0) return std::nullopt;
    return static_cast<std::uint32_t>(item);
}

void PresetList::Restyle() {
    m_theme.Dress(m_window);
    m_theme.Dress(m_label);
    ListView_SetBkColor(m_window, m_theme.Colours().field);
    ListView_SetTextBkColor(m_window, m_theme.Colours().field);
    ListView_SetTextColor(m_window, m_theme.Colours().fieldText);
    MakePictures();
}

}  // namespace velmora::reelview
