// Natively the faulty library is linked in place of the real one: reelcheck's library_linked.cpp is compiled again for these
// names.

#include "tests/programs/reelcheck/faulty_library.h"

extern "C" {
velmora::IEffectLibrary* GetEffectsLibrary();
bool CanUnloadDLLNow();

velmora::IEffectLibrary* FaultyGetEffectsLibrary() {
    return velmora::testing::MakeFaulty(GetEffectsLibrary());
}
bool FaultyCanUnloadDLLNow() {
    return velmora::testing::FaultIs("lets-go-early") || CanUnloadDLLNow();
}
}
