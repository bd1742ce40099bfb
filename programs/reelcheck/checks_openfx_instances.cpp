// What the OpenFX plug-ins do over the life of an instance.

#include <algorithm>
#include <cmath>
#include <thread>

#include "effects/effect_queries.h"
#include "programs/reelcheck/checks.h"
#include "programs/reelcheck/openfx_host.h"

namespace velmora::reelcheck {

void CheckOpenfxPresets(CheckContext& context) {
    const OpenfxModule module(context.bundlePath);
    for (int i = 0; i < module.Count(); ++i) {
        OpenfxPlugin plugin(module, i);
        const effects::EffectTable& table = plugin.Effect();
        OpenfxInstance instance(plugin);
        HostParamSet& params = instance.Effect().params;
        int own = 0;
        for (const effects::ParamRow& row : table.params) own += effects::HoldsValue(row) ? 1 : 0;
        SetPlace("%s", table.name);
        params.setsInside = 0;
        Require(instance.Change("preset", kOfxChangePluginEdited) == kOfxStatReplyDefault &&
                    params.setsInside == 0,
                "follows a change of its own");
        instance.ChoosePreset(static_cast<std::uint32_t>(table.presetNames.size()) - 1);
        Require(params.openEdits == 1 && params.closedEdits == 1, "a preset is not one step");
        Require(params.setsInside == own, "a preset does not set every parameter once");
        params.refusesEdits = true;
        instance.ChoosePreset(0);
        Require(params.setsInside == 2 * own && params.closedEdits == 1,
                "a host without steps gets no preset");
        params.refusesEdits = false;
        for (int draws = 0; draws < 3; ++draws) {
            const double before = instance.Param("seed").values[0];
            Require(instance.Change("newSeed", kOfxChangeUserEdited) == kOfxStatOK,
                    "the button does nothing");
            const double seed = instance.Param("seed").values[0];
            Require(seed != before && seed >= 0.0 && seed <= 2147483647.0, "no new seed");
        }
        Require(params.openEdits == params.closedEdits, "a step that does not end");
    }
    RequireNothingHeld();
}

void CheckOpenfxIdentity(CheckContext& context) {
    const OpenfxModule module(context.bundlePath);
    for (int i = 0; i < module.Count(); ++i) {
        OpenfxPlugin plugin(module, i);
        OpenfxInstance instance(plugin);
        SetPlace("%s", plugin.Effect().name);
        HostPicture source(Plain(20, 10)), output(Plain(20, 10));
        source.Paint(context.dice);
        Require(instance.IsIdentity(3.0), "the defaults change the picture");
        instance.RenderWhole(source, output, 3.0);
        Require(output.IsSameAs(source), "a neutral frame is not the source");
        instance.ChoosePreset(Busy::kPreset);
        Require(!instance.IsIdentity(3.0), "a preset leaves the picture as it is");
        instance.Param("mix").perFrame = -10.0;
        Require(!instance.IsIdentity(3.0) && instance.IsIdentity(10.0),
                "the mix is not read at the frame's time");
        instance.RenderWhole(source, output, 10.0);
        Require(output.IsSameAs(source), "a frame with a mix of 0 is not the source");
        Arguments out;
        out.Add(kOfxImageEffectFrameVarying, {0});
        plugin.Expect(kOfxStatOK, kOfxImageEffectActionGetClipPreferences, instance.Effect().Handle(),
                      nullptr, &out);
        const bool isStill = std::string_view(plugin.Effect().name) == "Film Look";
        Require(out.Set().Number(kOfxImageEffectFrameVarying) == (isStill ? 0 : 1), "frames vary or not");
    }
    RequireNothingHeld();
}

void CheckOpenfxAbort(CheckContext& context) {
    const OpenfxModule module(context.bundlePath);
    Busy busy(module, 4);
    HostPicture source(Plain(32, 300)), whole(Plain(32, 300)), output(Plain(32, 300));
    source.Paint(context.dice);
    busy.instance.Effect().questions = 0;
    busy.instance.RenderWhole(source, whole, kTime);
    const int questions = busy.instance.Effect().questions;
    Require(questions >= 4, "asks too rarely whether to go on");
    for (int at = 1; at <= questions; ++at) {
        SetPlace("stopped at question %d of %d", at, questions);
        busy.instance.Effect().questions = 0;
        busy.instance.Effect().abortAt = at;
        output.Fill(0x33);
        busy.instance.Clip("Output").Show(&output);
        Require(busy.instance.Render(kTime, output.shape.bounds) == kOfxStatOK, "stopping is an error");
        Require(busy.instance.Effect().questions == at && !output.IsSameAs(whole), "goes on");
        RequireNothingHeld();
    }
    busy.instance.Effect().abortAt = 0;
    busy.instance.RenderWhole(source, output, kTime);
    Require(output.IsSameAs(whole), "another picture after a stop");
}

void CheckOpenfxMemory(CheckContext& context) {
    const OpenfxModule module(context.bundlePath);
    Busy busy(module, 4);
    HostPicture source(Plain(32, 20)), whole(Plain(32, 20)), output(Plain(32, 20));
    source.Paint(context.dice);
    busy.instance.RenderWhole(source, whole, kTime);
    State().allocations = 0;
    busy.instance.RenderWhole(source, output, kTime);
    const int count = State().allocations;
    Require(count > 0, "does not use the host's memory");
    for (int failing = 1; failing <= count; ++failing) {
        SetPlace("allocation %d of %d fails", failing, count);
        State().allocations = 0;
        State().failingAllocation = failing;
        Require(busy.instance.Render(kTime, output.shape.bounds) == kOfxStatErrMemory,
                "not the status for too little memory");
        State().failingAllocation = 0;
        RequireNothingHeld();
    }
    for (const bool isEmpty : {false, true}) {
        State().missingSuite = kOfxMemorySuite;
        State().hasEmptySuite = isEmpty;
        OpenfxInstance other(busy.plugin);
        other.ChoosePreset(Busy::kPreset);
        other.Param("seed").values[0] = kSeed;
        other.RenderWhole(source, output, kTime);
        State().missingSuite.clear();
        State().hasEmptySuite = false;
        Require(output.IsSameAs(whole), "another picture in memory of the host");
    }
    RequireNothingHeld();
}

void CheckOpenfxThreads(CheckContext& context) {
    constexpr int kFrames = 24, kThreads = 4;
    const OpenfxModule module(context.bundlePath);
    for (int i = 0; i < module.Count(); ++i) {
        Busy busy(module, i);
        SetPlace("%s", busy.plugin.Effect().name);
        std::vector<std::unique_ptr<HostPicture>> pictures;
        std::vector<HostPicture*> one, many;
        HostPicture source(Plain(64, 48));
        source.Paint(context.dice);
        busy.instance.Clip("Source").Show(&source);
        for (int frame = 0; frame < 2 * kFrames; ++frame) {
            pictures.push_back(std::make_unique<HostPicture>(Plain(64, 48)));
            (frame < kFrames ? one : many).push_back(pictures.back().get());
        }
        const auto renderAll = [&](int first, int step) {
            for (int frame = first; frame < kFrames; frame += step) {
                if (busy.instance.Render(frame, {0, 0, 64, 48}) != kOfxStatOK)
                    Complain("a frame is not rendered");
            }
        };
        HostClip& output = busy.instance.Clip("Output");
        for (int frame = 0; frame < kFrames; ++frame)
            output.ShowAt(frame, one[static_cast<std::size_t>(frame)]);
        renderAll(0, 1);
        for (int round = 0; round < context.Rounds(2, 40); ++round) {
            for (int frame = 0; frame < kFrames; ++frame)
                output.ShowAt(frame, many[static_cast<std::size_t>(frame)]);
            std::vector<std::thread> threads;
            threads.reserve(kThreads);
            for (int t = 0; t < kThreads; ++t) threads.emplace_back(renderAll, t, kThreads);
            for (std::thread& thread : threads) thread.join();
            for (std::size_t frame = 0; frame < one.size(); ++frame) {
                if (!one[frame]->IsSameAs(*many[frame]))
                    Fail(Text("frame %d differs", static_cast<int>(frame)));
            }
        }
    }
    RequireNothingHeld();
}

void CheckOpenfxHostileValues(CheckContext& context) {
    const OpenfxModule module(context.bundlePath);
    constexpr double kOdd[] = {-1e300, -1.0, 0.0, 0.5, 1e9, 1e300, HUGE_VAL, -HUGE_VAL, NAN};
    for (int i = 0; i < module.Count(); ++i) {
        OpenfxPlugin plugin(module, i);
        HostPicture source(Plain(17, 13)), output(Plain(17, 13));
        source.Paint(context.dice);
        for (int round = 0; round < context.Rounds(60, 3000); ++round) {
            SetPlace("%s, round %d", plugin.Effect().name, round);
            OpenfxInstance instance(plugin, kOfxImageEffectContextGeneral,
                                    kOdd[static_cast<std::size_t>(context.dice.Between(0, 8))]);
            for (const auto& param : instance.Effect().params.params) {
                for (double& value : param->values) {
                    value = kOdd[static_cast<std::size_t>(context.dice.Between(0, 8))];
                    if (!param->IsDouble()) value = static_cast<std::int32_t>(context.dice.Word());
                }
            }
            const double time = kOdd[static_cast<std::size_t>(context.dice.Between(0, 8))];
            Arguments in, out;
            in.Add(kOfxPropTime, {time});
            out.Add(kOfxPropName, {std::string()}).Add(kOfxPropTime, {0.0});
            plugin.Call(kOfxImageEffectActionIsIdentity, instance.Effect().Handle(), &in, &out);
            instance.Change("preset", kOfxChangeUserEdited);
            instance.Change("newSeed", kOfxChangeUserEdited);
            instance.RenderWhole(source, output, time);
        }
    }
    RequireNothingHeld();
}

}  // namespace velmora::reelcheck
