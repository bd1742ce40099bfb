#include "faces/openfx/host.h"

#include <new>

namespace velmora::hosts::openfx {
namespace {

template <typename Suite>
const Suite* Fetch(const OfxHost& host, const char* name) {
    return static_cast<const Suite*>(host.fetchSuite(host.host, name, 1));
}

template <typename... Function>
bool AreThere(Function... function) {
    return (... && (function != nullptr));
}

}  // namespace

Suites FetchSuites(const OfxHost* host) {
    if (host == nullptr || host->fetchSuite == nullptr) throw ActionFailed{kOfxStatErrMissingHostFeature};
    const Suites suites = {.property = Fetch<OfxPropertySuiteV1>(*host, kOfxPropertySuite),
                           .effect = Fetch<OfxImageEffectSuiteV1>(*host, kOfxImageEffectSuite),
                           .parameter = Fetch<OfxParameterSuiteV1>(*host, kOfxParameterSuite),
                           .memory = Fetch<OfxMemorySuiteV1>(*host, kOfxMemorySuite)};
    if (!AreThere(suites.property, suites.effect, suites.parameter))
        throw ActionFailed{kOfxStatErrMissingHostFeature};
    const OfxPropertySuiteV1& p = *suites.property;
    if (!AreThere(p.propSetPointer, p.propSetString, p.propSetDouble, p.propSetInt, p.propSetDoubleN) ||
        !AreThere(p.propGetPointer, p.propGetString, p.propGetDouble, p.propGetInt, p.propGetIntN)) {
        throw ActionFailed{kOfxStatErrMissingHostFeature};
    }
    const OfxImageEffectSuiteV1& e = *suites.effect;
    if (!AreThere(e.getPropertySet, e.getParamSet, e.clipDefine, e.clipGetHandle, e.clipGetPropertySet) ||
        !AreThere(e.clipGetImage, e.clipReleaseImage, e.clipGetRegionOfDefinition, e.abort)) {
        throw ActionFailed{kOfxStatErrMissingHostFeature};
    }
    const OfxParameterSuiteV1& q = *suites.parameter;
    if (!AreThere(q.paramDefine, q.paramGetHandle, q.paramSetGetPropertySet, q.paramGetValue) ||
        !AreThere(q.paramGetValueAtTime, q.paramSetValue, q.paramEditBegin, q.paramEditEnd)) {
        throw ActionFailed{kOfxStatErrMissingHostFeature};
    }
    return suites;
}

OfxStatus Properties::TrySet(const char* name, const char* value, int index) const noexcept {
    return m_suite->propSetString(m_handle, name, index, value);
}
OfxStatus Properties::TrySet(const char* name, double value, int index) const noexcept {
    return m_suite->propSetDouble(m_handle, name, index, value);
}
OfxStatus Properties::TrySet(const char* name, int value, int index) const noexcept {
    return m_suite->propSetInt(m_handle, name, index, value);
}

void Properties::Set(const char* name, const char* value, int index) const {
    Require(TrySet(name, value, index));
}
void Properties::Set(const char* name, double value, int index) const {
    Require(TrySet(name, value, index));
}
void Properties::Set(const char* name, int value, int index) const {
    Require(TrySet(name, value, index));
}
void Properties::Set(const char* name, const OfxRectD& value) const {
    const double sides[] = {value.x1, value.y1, value.x2, value.y2};
    Require(m_suite->propSetDoubleN(m_handle, name, 4, sides));
}
void Properties::SetPointer(const char* name, void* value) const {
    Require(m_suite->propSetPointer(m_handle, name, 0, value));
}

std::optional<int> Properties::Int(const char* name, int index) const noexcept {
    int value = 0;
    if (m_suite->propGetInt(m_handle, name, index, &value) != kOfxStatOK) return std::nullopt;
    return value;
}

std::optional<double> Properties::Double(const char* name, int index) const noexcept {
    double value = 0.0;
    if (m_suite->propGetDouble(m_handle, name, index, &value) != kOfxStatOK) return std::nullopt;
    return value;
}

std::string_view Properties::Text(const char* name) const noexcept {
    char* value = nullptr;
    if (m_suite->propGetString(m_handle, name, 0, &value) != kOfxStatOK || value == nullptr) return {};
    return value;
}

void* Properties::Pointer(const char* name) const noexcept {
    void* value = nullptr;
    return m_suite->propGetPointer(m_handle, name, 0, &value) == kOfxStatOK ? value : nullptr;
}

std::optional<OfxRectI> Properties::Rectangle(const char* name) const noexcept {
    int sides[4] = {};
    if (m_suite->propGetIntN(m_handle, name, 4, sides) != kOfxStatOK) return std::nullopt;
    return OfxRectI{sides[0], sides[1], sides[2], sides[3]};
}

HostMemory::HostMemory(const Suites& suites, OfxImageEffectHandle effect, std::size_t bytes)
    : m_suite(suites.memory) {
    if (m_suite == nullptr || m_suite->memoryAlloc == nullptr || m_suite->memoryFree == nullptr) {
        m_suite = nullptr;
        m_data = operator new(bytes);
    } else if (m_suite->memoryAlloc(effect, bytes, &m_data) != kOfxStatOK || m_data == nullptr) {
        throw std::bad_alloc();
    }
}

HostMemory::~HostMemory() {
    if (m_suite != nullptr) {
        m_suite->memoryFree(m_data);
    } else {
        operator delete(m_data);
    }
}

}  // namespace velmora::hosts::openfx
