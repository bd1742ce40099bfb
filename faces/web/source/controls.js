// The panel of an effect's parameters, built from its table.
import {bitsOfCss, bitsOfShown, cssColour, ownName, plainWord, shownNumber} from './values.js';
import {text} from './texts.js';

function element(name, attributes = {}, children = []) {
    const made = document.createElement(name);
    for (const [key, value] of Object.entries(attributes)) {
        if (value !== null && value !== false) made.setAttribute(key, value === true ? '' : value);
    }
    made.append(...children);
    return made;
}

// A control: {row, show(bits)}; it calls `change(bits)` with a new value word and `settle()` after a drag.
function slider(param, label, change, settle) {
    const range = element('input', {type: 'range', min: param.minimum, max: param.maximum,
        step: param.maximum - param.minimum > 10 ? 0.5 : 0.1, 'aria-label': label});
    const number = element('input', {type: 'number', min: param.minimum, max: param.maximum, step: 'any',
        'aria-label': label, inputmode: 'decimal'});
    if (param.minimum < 0) range.classList.add('centred');
    range.oninput = () => change(bitsOfShown(param, range.value));
    range.onchange = settle;
    number.onchange = () => {
        change(bitsOfShown(param, number.value));
        settle();
    };
    return {
        inputs: [range, number],
        show(bits) {
            const shown = shownNumber(param, bits);
            range.value = shown;
            range.style.setProperty('--share', `${(shown - param.minimum) / (param.maximum - param.minimum) * 100}%`);
            if (document.activeElement !== number) number.value = Number(shown.toFixed(2));
        },
    };
}

function colour(param, label, change, settle) {
    const input = element('input', {type: 'color', 'aria-label': label});
    input.oninput = () => change(bitsOfCss(input.value));
    input.onchange = settle;
    return {inputs: [input], show: (bits) => { input.value = cssColour(bits); }};
}

function menu(param, label, change, settle) {
    const select = element('select', {'aria-label': label},
        param.items.map((item, i) => element('option', {value: i}, [text(item)])));
    select.onchange = () => {
        change(Number(select.value));
        settle();
    };
    return {inputs: [select], show: (bits) => { select.value = bits; }};
}

function check(param, label, change, settle) {
    const input = element('input', {type: 'checkbox', role: 'switch', 'aria-label': label});
    input.onchange = () => {
        change(input.checked ? 1 : 0);
        settle();
    };
    return {inputs: [input], show: (bits) => { input.checked = (bits & 0xff) !== 0; }};
}

const makers = {slider, colour, menu, check};

export class Controls {
    #place;
    #looks;
    #effect = -1;
    #rows = [];

    constructor(place, looks) {
        this.#place = place;
        this.#looks = looks;
    }

    // Shows the present look; `isNew` builds the panel again, as another language needs it.
    show(isNew = false) {
        if (isNew || this.#effect !== this.#looks.look.effect) this.#build();
        const values = this.#looks.values;
        for (const {param, index, control, reset} of this.#rows) {
            control.show(values[index]);
            reset.hidden = plainWord(param, values[index]) === plainWord(param, param.default);
        }
    }

    #build() {
        const effect = this.#looks.effect;
        this.#effect = this.#looks.look.effect;
        this.#rows = [];
        this.#place.replaceChildren();
        let group = null;
        effect.params.forEach((param, index) => {
            if (param.kind === 'group' && param.isEnd) group = null;
            else if (param.kind === 'group') this.#place.append(group = this.#group(param.name));
            else (group ?? (this.#place.append(group = this.#group(null)), group)).append(this.#row(param, index));
        });
    }

    #group(name) {
        const group = element('fieldset');
        if (name) group.append(element('legend', {}, [text(name)]));
        return group;
    }

    #row(param, index) {
        const label = text(ownName(this.#looks.effect, param));
        const change = (bits) => this.#looks.setValue(index, bits);
        const settle = () => this.#looks.settle();
        const control = makers[param.kind](param, label, change, settle);
        const reset = element('button', {type: 'button', class: 'reset', 'aria-label': `${text('Reset')}: ${label}`,
            title: text('Reset')}, ['↺']);
        reset.onclick = () => {
            settle();
            change(param.default);
            settle();
            control.inputs[0].focus();
        };
        this.#rows.push({param, index, control, reset});
        return element('div', {class: `row ${param.kind}`}, [element('span', {class: 'name'}, [label]),
            ...control.inputs, reset]);
    }
}
