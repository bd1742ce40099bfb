#include "programs/reelview/base/com_win32.h"

#include <oleacc.h>

#include "programs/reelview/panel/knob_window_win32.h"

namespace velmora::reelview {
namespace {

BSTR TextOf(const std::wstring& text) {
    return SysAllocStringLen(text.data(), static_cast<UINT>(text.size()));
}

// COM interfaces have no virtual destructors; objects delete themselves in Release.
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wnon-virtual-dtor"

// The system's standard object for the window answers everything that a knob does not answer better.
class KnobAccessible final : public IAccessible {
  public:
    KnobAccessible(HWND window, Com<IAccessible> standard)
        : m_window(window), m_standard(std::move(standard)) {}
    virtual ~KnobAccessible() = default;

    HRESULT STDMETHODCALLTYPE QueryInterface(REFIID iid, void** out) override {
        if (out == nullptr) return E_POINTER;
        const bool isOurs = IsEqualIID(iid, IID_IUnknown) || IsEqualIID(iid, IID_IDispatch) ||
                            IsEqualIID(iid, IID_IAccessible);
        *out = isOurs ? static_cast<IAccessible*>(this) : nullptr;
        if (isOurs) AddRef();
        return isOurs ? S_OK : E_NOINTERFACE;
    }
    ULONG STDMETHODCALLTYPE AddRef() override { return static_cast<ULONG>(InterlockedIncrement(&m_count)); }
    ULONG STDMETHODCALLTYPE Release() override {
        const LONG left = InterlockedDecrement(&m_count);
        if (left == 0) delete this;
        return static_cast<ULONG>(left);
    }
    HRESULT STDMETHODCALLTYPE GetTypeInfoCount(UINT* count) override {
        return m_standard->GetTypeInfoCount(count);
    }
    HRESULT STDMETHODCALLTYPE GetTypeInfo(UINT index, LCID locale, ITypeInfo** info) override {
        return m_standard->GetTypeInfo(index, locale, info);
    }
    HRESULT STDMETHODCALLTYPE GetIDsOfNames(REFIID iid, LPOLESTR* names, UINT count, LCID locale,
                                            DISPID* ids) override {
        return m_standard->GetIDsOfNames(iid, names, count, locale, ids);
    }
    HRESULT STDMETHODCALLTYPE Invoke(DISPID id, REFIID iid, LCID locale, WORD flags, DISPPARAMS* arguments,
                                     VARIANT* result, EXCEPINFO* exception, UINT* wrong) override {
        return m_standard->Invoke(id, iid, locale, flags, arguments, result, exception, wrong);
    }

    HRESULT STDMETHODCALLTYPE get_accName(VARIANT, BSTR* name) override {
        const KnobWindow* const knob = Knob();
        return knob != nullptr ? Give(knob->About().name, name) : E_FAIL;
    }
    HRESULT STDMETHODCALLTYPE get_accDescription(VARIANT, BSTR* description) override {
        const KnobWindow* const knob = Knob();
        if (knob == nullptr || knob->About().group.empty()) return S_FALSE;
        return Give(knob->About().group, description);
    }
    HRESULT STDMETHODCALLTYPE get_accRole(VARIANT, VARIANT* role) override {
        role->vt = VT_I4;
        role->lVal = ROLE_SYSTEM_SLIDER;
        return S_OK;
    }
    HRESULT STDMETHODCALLTYPE get_accValue(VARIANT, BSTR* value) override {
        const KnobWindow* const knob = Knob();
        return knob != nullptr ? Give(knob->ShownText(), value) : E_FAIL;
    }
    HRESULT STDMETHODCALLTYPE put_accValue(VARIANT, BSTR value) override {
        KnobWindow* const knob = Knob();
        if (knob == nullptr || value == nullptr) return E_FAIL;
        knob->TypeText(value);
        return S_OK;
    }

    HRESULT STDMETHODCALLTYPE get_accParent(IDispatch** parent) override {
        return m_standard->get_accParent(parent);
    }
    HRESULT STDMETHODCALLTYPE get_accChildCount(LONG* count) override {
        return m_standard->get_accChildCount(count);
    }
    HRESULT STDMETHODCALLTYPE get_accChild(VARIANT child, IDispatch** out) override {
        return m_standard->get_accChild(child, out);
    }
    HRESULT STDMETHODCALLTYPE get_accState(VARIANT child, VARIANT* state) override {
        return m_standard->get_accState(child, state);
    }
    HRESULT STDMETHODCALLTYPE get_accHelp(VARIANT child, BSTR* help) override {
        return m_standard->get_accHelp(child, help);
    }
    HRESULT STDMETHODCALLTYPE get_accHelpTopic(BSTR* file, VARIANT child, LONG* topic) override {
        return m_standard->get_accHelpTopic(file, child, topic);
    }
    HRESULT STDMETHODCALLTYPE get_accKeyboardShortcut(VARIANT child, BSTR* key) override {
        return m_standard->get_accKeyboardShortcut(child, key);
    }
    HRESULT STDMETHODCALLTYPE get_accFocus(VARIANT* focus) override {
        return m_standard->get_accFocus(focus);
    }
    HRESULT STDMETHODCALLTYPE get_accSelection(VARIANT* selection) override {
        return m_standard->get_accSelection(selection);
    }
    HRESULT STDMETHODCALLTYPE get_accDefaultAction(VARIANT child, BSTR* action) override {
        return m_standard->get_accDefaultAction(child, action);
    }
    HRESULT STDMETHODCALLTYPE accSelect(LONG flags, VARIANT child) override {
        return m_standard->accSelect(flags, child);
    }
    HRESULT STDMETHODCALLTYPE accLocation(LONG* left, LONG* top, LONG* width, LONG* height,
                                          VARIANT child) override {
        return m_standard->accLocation(left, top, width, height, child);
    }
    HRESULT STDMETHODCALLTYPE accNavigate(LONG way, VARIANT start, VARIANT* end) override {
        return m_standard->accNavigate(way, start, end);
    }
    HRESULT STDMETHODCALLTYPE accHitTest(LONG x, LONG y, VARIANT* child) override {
        return m_standard->accHitTest(x, y, child);
    }
    HRESULT STDMETHODCALLTYPE accDoDefaultAction(VARIANT child) override {
        return m_standard->accDoDefaultAction(child);
    }
    HRESULT STDMETHODCALLTYPE put_accName(VARIANT, BSTR) override { return DISP_E_MEMBERNOTFOUND; }

  private:
    // A screen reader may keep this object after the window is destroyed.
    [[nodiscard]] KnobWindow* Knob() const {
        if (!IsWindow(m_window)) return nullptr;
        return reinterpret_cast<KnobWindow*>(GetWindowLongPtrW(m_window, GWLP_USERDATA));
    }
    static HRESULT Give(const std::wstring& text, BSTR* out) {
        *out = TextOf(text);
        return *out != nullptr ? S_OK : E_OUTOFMEMORY;
    }

    HWND m_window;
    Com<IAccessible> m_standard;
    LONG m_count = 1;
};

#pragma GCC diagnostic pop

}  // namespace

LRESULT AccessibleKnob(KnobWindow& knob, WPARAM wParam) {
    Com<IAccessible> standard;
    CreateStdAccessibleObject(knob.Window(), OBJID_CLIENT, IID_IAccessible, ComOut(standard));
    if (!standard) return 0;
    const Com<IAccessible> object(new KnobAccessible(knob.Window(), std::move(standard)));
    return LresultFromObject(IID_IAccessible, wParam, object.get());
}

}  // namespace velmora::reelview
