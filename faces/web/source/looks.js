// What the user has chosen: two looks to compare, A and B, each with its own steps to undo.
//
// A look: {effect, values, seed}. `values` holds the value words of every effect, so that one comes back to an effect as
// one left it. Looks are never changed, only replaced.
import {isSameValues} from './values.js';

const mostSteps = 200;

export class Looks {
    #effects;
    #slots;
    #slot = 0;
    onChange = () => {};

    constructor(effects, first) {
        this.#effects = effects;
        this.#slots = [{steps: [first], at: 0}, null];
    }

    get look() {
        const {steps, at} = this.#slots[this.#slot];
        return steps[at];
    }
    get effect() {
        return this.#effects[this.look.effect];
    }
    get values() {
        return this.look.values[this.look.effect];
    }
    get slot() {
        return this.#slot;
    }
    get canUndo() {
        return this.#slots[this.#slot].at > 0;
    }
    get canRedo() {
        const {steps, at} = this.#slots[this.#slot];
        return at + 1 < steps.length;
    }
    // As the renderer takes it.
    get rendered() {
        return {effect: this.look.effect, values: this.values, seed: this.look.seed};
    }
    // The preset that the values are equal to; -1 when there is none.
    get preset() {
        return this.effect.presets.findIndex((preset) => isSameValues(this.effect, preset.values, this.values));
    }

    // Changes of the same `kind` in a row, as a slider gives them while it is dragged, are one step to undo.
    change(changes, kind = null) {
        const slot = this.#slots[this.#slot];
        const look = {...this.look, ...changes};
        const isSame = kind !== null && kind === slot.kind && slot.at > 0 && !this.canRedo;
        slot.steps.length = isSame ? slot.at : slot.at + 1;
        slot.steps.push(look);
        if (slot.steps.length > mostSteps) slot.steps.shift();
        slot.at = slot.steps.length - 1;
        slot.kind = kind;
        this.onChange();
    }
    // The next change starts a new step.
    settle() {
        this.#slots[this.#slot].kind = null;
    }

    setValue(parameter, bits) {
        const values = [...this.values];
        values[parameter] = bits;
        this.#replaceValues(this.look.effect, values, `${this.look.effect}/${parameter}`);
    }
    setValues(effect, values) {
        this.#replaceValues(effect, [...values], null);
    }
    #replaceValues(effect, values, kind) {
        this.change({effect, values: this.look.values.map((old, i) => i === effect ? values : old)}, kind);
    }

    undo() {
        this.#step(-1, this.canUndo);
    }
    redo() {
        this.#step(1, this.canRedo);
    }
    #step(by, isPossible) {
        if (!isPossible) return;
        this.#slots[this.#slot].at += by;
        this.settle();
        this.onChange();
    }

    // The other look starts as a copy of this one.
    choose(slot) {
        this.settle();
        this.#slots[slot] ??= {steps: [this.look], at: 0};
        this.#slot = slot;
        this.onChange();
    }
}
