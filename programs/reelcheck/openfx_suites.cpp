// The property and parameter suites of our OpenFX host.

#include <algorithm>
#include <cstdarg>
#include <cstring>

#include "programs/reelcheck/check.h"
#include "programs/reelcheck/openfx_objects.h"

namespace velmora::reelcheck {
namespace {

template <typename Value>
OfxStatus Put(OfxPropertySetHandle handle, const char* name, int index, Value value) {
    auto* const set = Handled::Of<PropertySet>(handle);
    if (set == nullptr) return kOfxStatErrBadHandle;
    PropertySet::Property* const property = set->Find(name);
    if (property == nullptr) {
        Complain(Text("sets the property %s, which is unknown here", name));
        return kOfxStatErrUnknown;
    }
    if (!std::holds_alternative<Value>(property->empty)) {
        Complain(Text("sets the property %s in a wrong type", name));
        return kOfxStatErrUnknown;
    }
    if (property->isReadOnly) {
        Complain(Text("sets the property %s of the host", name));
        return kOfxStatErrValue;
    }
    const int count = static_cast<int>(property->values.size());
    if (index < 0 || (property->dimension != 0 && index >= property->dimension) || index > count) {
        Complain(Text("sets %s at %d of %d", name, index, count));
        return kOfxStatErrBadIndex;
    }
    if (index == count) property->values.push_back(property->empty);
    property->values[static_cast<std::size_t>(index)] = std::move(value);
    return kOfxStatOK;
}

template <typename Value>
const Value* Get(OfxPropertySetHandle handle, const char* name, int index, OfxStatus& status) {
    auto* const set = Handled::Of<PropertySet>(handle);
    PropertySet::Property* const property = set != nullptr ? set->Find(name) : nullptr;
    status = set == nullptr ? kOfxStatErrBadHandle : property == nullptr ? kOfxStatErrUnknown : kOfxStatOK;
    if (status != kOfxStatOK) return nullptr;
    if (!std::holds_alternative<Value>(property->empty)) {
        Complain(Text("reads the property %s in a wrong type", name));
        return status = kOfxStatErrUnknown, nullptr;
    }
    if (index < 0 || static_cast<std::size_t>(index) >= property->values.size()) {
        const bool isKnownEmpty = index == 0 && property->values.empty();
        if (!isKnownEmpty) Complain(Text("reads %s at %d", name, index));
        return status = kOfxStatErrBadIndex, nullptr;
    }
    return &std::get<Value>(property->values[static_cast<std::size_t>(index)]);
}

OfxStatus SetPointer(OfxPropertySetHandle handle, const char* name, int index, void* value) {
    return Put<void*>(handle, name, index, value);
}
OfxStatus SetString(OfxPropertySetHandle handle, const char* name, int index, const char* value) {
    if (value == nullptr) return Complain(Text("sets %s to null", name)), kOfxStatErrValue;
    return Put<std::string>(handle, name, index, value);
}
OfxStatus SetDouble(OfxPropertySetHandle handle, const char* name, int index, double value) {
    return Put<double>(handle, name, index, value);
}
OfxStatus SetInt(OfxPropertySetHandle handle, const char* name, int index, int value) {
    return Put<int>(handle, name, index, value);
}

template <typename Value, typename Own = Value>
OfxStatus PutAll(OfxPropertySetHandle handle, const char* name, int count, const Value* values) {
    OfxStatus status = kOfxStatOK;
    for (int i = 0; i < count && status == kOfxStatOK; ++i) status = Put<Own>(handle, name, i, values[i]);
    return status;
}
OfxStatus SetPointerN(OfxPropertySetHandle handle, const char* name, int count, void* const* values) {
    return PutAll(handle, name, count, values);
}
OfxStatus SetStringN(OfxPropertySetHandle handle, const char* name, int count, const char* const* values) {
    return PutAll<const char*, std::string>(handle, name, count, values);
}
OfxStatus SetDoubleN(OfxPropertySetHandle handle, const char* name, int count, const double* values) {
    return PutAll(handle, name, count, values);
}
OfxStatus SetIntN(OfxPropertySetHandle handle, const char* name, int count, const int* values) {
    return PutAll(handle, name, count, values);
}

template <typename Value>
OfxStatus Read(OfxPropertySetHandle handle, const char* name, int index, Value* out) {
    OfxStatus status = kOfxStatOK;
    if (const Value* const value = Get<Value>(handle, name, index, status)) *out = *value;
    return status;
}
OfxStatus GetString(OfxPropertySetHandle handle, const char* name, int index, char** out) {
    OfxStatus status = kOfxStatOK;
    // The interface has no constant strings.
    if (const auto* value = Get<std::string>(handle, name, index, status))
        *out = const_cast<char*>(value->c_str());
    return status;
}
template <typename Value>
OfxStatus ReadAll(OfxPropertySetHandle handle, const char* name, int count, Value* out) {
    OfxStatus status = kOfxStatOK;
    for (int i = 0; i < count && status == kOfxStatOK; ++i) status = Read<Value>(handle, name, i, out + i);
    return status;
}
OfxStatus GetStringN(OfxPropertySetHandle handle, const char* name, int count, char** out) {
    OfxStatus status = kOfxStatOK;
    for (int i = 0; i < count && status == kOfxStatOK; ++i) status = GetString(handle, name, i, out + i);
    return status;
}
OfxStatus Reset(OfxPropertySetHandle handle, const char* name) {
    auto* const set = Handled::Of<PropertySet>(handle);
    if (set == nullptr) return kOfxStatErrBadHandle;
    PropertySet::Property* const property = set->Find(name);
    if (property == nullptr) return kOfxStatErrUnknown;
    property->values.clear();
    return kOfxStatOK;
}
OfxStatus Dimension(OfxPropertySetHandle handle, const char* name, int* count) {
    auto* const set = Handled::Of<PropertySet>(handle);
    if (set == nullptr) return kOfxStatErrBadHandle;
    if (set->Find(name) == nullptr) return kOfxStatErrUnknown;
    *count = set->Count(name);
    return kOfxStatOK;
}

void AddKindProperties(HostParam& param) {
    const PropertyValue number = param.IsDouble() ? PropertyValue(0.0) : PropertyValue(0);
    const auto add = [&](const char* name, const PropertyValue& empty, int dimension) {
        param.properties.Add(name, dimension, {empty});
        param.properties.Find(name)->values.clear();
    };
    if (param.Dimension() > 0) add(kOfxParamPropDefault, number, param.Dimension());
    if (param.type == kOfxParamTypeDouble || param.type == kOfxParamTypeInteger) {
        for (const char* name :
             {kOfxParamPropMin, kOfxParamPropMax, kOfxParamPropDisplayMin, kOfxParamPropDisplayMax}) {
            add(name, number, 1);
        }
    }
    if (param.type == kOfxParamTypeDouble) {
        add(kOfxParamPropIncrement, 0.0, 1);
        add(kOfxParamPropDigits, 0, 1);
    }
    if (param.type == kOfxParamTypeChoice) add(kOfxParamPropChoiceOption, std::string(), 0);
    if (param.type == kOfxParamTypePage) add(kOfxParamPropPageChild, std::string(), 0);
}

OfxStatus Define(OfxParamSetHandle handle, const char* type, const char* name,
                 OfxPropertySetHandle* properties) {
    auto* const set = Handled::Of<HostParamSet>(handle);
    if (set == nullptr) return kOfxStatErrBadHandle;
    if (!set->isDescriptor) return Complain("defines a parameter of an instance"), kOfxStatErrBadHandle;
    if (set->Find(name) != nullptr) {
        Complain(Text("defines the parameter %s twice", name));
        return kOfxStatErrExists;
    }
    auto& param = *set->params.emplace_back(std::make_unique<HostParam>(type, name));
    AddKindProperties(param);
    if (properties != nullptr) *properties = param.properties.Handle();
    return kOfxStatOK;
}

OfxStatus GetHandle(OfxParamSetHandle handle, const char* name, OfxParamHandle* out,
                    OfxPropertySetHandle* properties) {
    auto* const set = Handled::Of<HostParamSet>(handle);
    if (set == nullptr) return kOfxStatErrBadHandle;
    HostParam* const param = set->Find(name);
    if (param == nullptr) return Complain(Text("asks for the parameter %s", name)), kOfxStatErrUnknown;
    *out = reinterpret_cast<OfxParamHandle>(param);
    if (properties != nullptr) *properties = param->properties.Handle();
    return kOfxStatOK;
}

OfxStatus SetProperties(OfxParamSetHandle handle, OfxPropertySetHandle* properties) {
    auto* const set = Handled::Of<HostParamSet>(handle);
    if (set == nullptr) return kOfxStatErrBadHandle;
    *properties = set->properties.Handle();
    return kOfxStatOK;
}

OfxStatus ParamProperties(OfxParamHandle handle, OfxPropertySetHandle* properties) {
    auto* const param = Handled::Of<HostParam>(handle);
    if (param == nullptr) return kOfxStatErrBadHandle;
    *properties = param->properties.Handle();
    return kOfxStatOK;
}

OfxStatus Give(OfxParamHandle handle, double time, std::va_list values) {
    auto* const param = Handled::Of<HostParam>(handle);
    if (param == nullptr) return kOfxStatErrBadHandle;
    if (!param->keys.empty()) time = std::clamp(time, param->keys.front(), param->keys.back());
    for (int i = 0; i < param->Dimension(); ++i) {
        const double value = param->values[i] + param->perFrame * time;
        if (param->IsDouble()) {
            *va_arg(values, double*) = value;
        } else {
            *va_arg(values, int*) = static_cast<int>(value);
        }
    }
    return kOfxStatOK;
}

OfxStatus GetValue(OfxParamHandle handle, ...) {
    std::va_list values;
    va_start(values, handle);
    const OfxStatus status = Give(handle, 0.0, values);
    va_end(values);
    return status;
}

OfxStatus GetValueAtTime(OfxParamHandle handle, OfxTime time, ...) {
    std::va_list values;
    va_start(values, time);
    const OfxStatus status = Give(handle, time, values);
    va_end(values);
    return status;
}

OfxStatus GetNumKeys(OfxParamHandle handle, unsigned int* count) {
    const auto* const param = Handled::Of<HostParam>(handle);
    if (param == nullptr) return kOfxStatErrBadHandle;
    *count = static_cast<unsigned int>(param->keys.size());
    return kOfxStatOK;
}

OfxStatus GetKeyTime(OfxParamHandle handle, unsigned int key, OfxTime* time) {
    const auto* const param = Handled::Of<HostParam>(handle);
    if (param == nullptr) return kOfxStatErrBadHandle;
    if (key >= param->keys.size()) return Complain("asks for a key that is none"), kOfxStatErrBadIndex;
    *time = param->keys[key];
    return kOfxStatOK;
}

HostParamSet* g_edited = nullptr;  // the set with an open block

OfxStatus SetValue(OfxParamHandle handle, ...) {
    auto* const param = Handled::Of<HostParam>(handle);
    if (param == nullptr) return kOfxStatErrBadHandle;
    if (g_edited != nullptr) {
        ++g_edited->setsInside;
    } else {
        Complain(Text("sets %s outside a step that can be undone", param->name.c_str()));
    }
    std::va_list values;
    va_start(values, handle);
    for (int i = 0; i < param->Dimension(); ++i) {
        param->values[i] = param->IsDouble() ? va_arg(values, double) : va_arg(values, int);
    }
    va_end(values);
    return kOfxStatOK;
}

OfxStatus EditBegin(OfxParamSetHandle handle, const char*) {
    auto* const set = Handled::Of<HostParamSet>(handle);
    if (set == nullptr) return kOfxStatErrBadHandle;
    g_edited = set;  // also when refused: what is then set is no fault of the plug-in's
    if (set->refusesEdits) return kOfxStatErrUnsupported;
    ++set->openEdits;
    return kOfxStatOK;
}
OfxStatus EditEnd(OfxParamSetHandle handle) {
    auto* const set = Handled::Of<HostParamSet>(handle);
    if (set == nullptr) return kOfxStatErrBadHandle;
    ++set->closedEdits;
    g_edited = nullptr;
    return kOfxStatOK;
}

}  // namespace

// What no filter needs is not there; a plug-in that calls it crashes, which is found.
const OfxPropertySuiteV1 kHostProperties = {
    SetPointer,     SetString,  SetDouble,       SetInt,       SetPointerN,  SetStringN,
    SetDoubleN,     SetIntN,    Read<void*>,     GetString,    Read<double>, Read<int>,
    ReadAll<void*>, GetStringN, ReadAll<double>, ReadAll<int>, Reset,        Dimension};
const OfxParameterSuiteV1 kHostParameters = {
    .paramDefine = Define,
    .paramGetHandle = GetHandle,
    .paramSetGetPropertySet = SetProperties,
    .paramGetPropertySet = ParamProperties,
    .paramGetValue = GetValue,
    .paramGetValueAtTime = GetValueAtTime,
    .paramGetDerivative = nullptr,
    .paramGetIntegral = nullptr,
    .paramSetValue = SetValue,
    .paramSetValueAtTime = nullptr,
    .paramGetNumKeys = GetNumKeys,
    .paramGetKeyTime = GetKeyTime,
    .paramGetKeyIndex = nullptr,
    .paramDeleteKey = nullptr,
    .paramDeleteAllKeys = nullptr,
    .paramCopy = nullptr,
    .paramEditBegin = EditBegin,
    .paramEditEnd = EditEnd,
};

}  // namespace velmora::reelcheck
