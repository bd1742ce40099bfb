// The forms in which a pixel kernel exists. The plain form is the authority; the others give its bytes.
#pragma once

namespace velmora::render {

// Each form's processor also runs the forms before it.
enum class Form {
    kPlain,
    kSse2,
    kAvx2,
    kAvx512,  // with byte permutations (VBMI)
};

// The fastest form that this processor and operating system can run.
[[nodiscard]] Form BestForm() noexcept;

}  // namespace velmora::render
