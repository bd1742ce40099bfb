// Values of parameters: words as the effects take them, and what a user sees.
import {bitsOfNumber, numberOfBits} from './engine.js';

export const holdsValue = (param) => param.kind !== 'group';

export function shownNumber(param, bits) {
    return param.minimum + numberOfBits(bits) * (param.maximum - param.minimum);
}

export function bitsOfShown(param, shown) {
    const inside = Math.min(Math.max(Number(shown) || 0, param.minimum), param.maximum);
    return bitsOfNumber((inside - param.minimum) / (param.maximum - param.minimum));
}

// The shortest number that gives the same word again.
export function shownText(param, bits) {
    const exact = shownNumber(param, bits);
    for (let digits = 1; digits < 17; ++digits) {
        const text = String(Number(exact.toPrecision(digits)));
        if (bitsOfShown(param, text) === bits) return text;
    }
    return String(exact);
}

// The shortest decimal of a slider's normalised number.
export function normalisedText(bits) {
    const exact = numberOfBits(bits);
    for (let digits = 1; digits < 17; ++digits) {
        const text = String(Number(exact.toPrecision(digits)));
        if (bitsOfNumber(Number(text)) === bits) return text;
    }
    return String(exact);
}

const swapRedAndBlue = (colour) => (colour & 0xff00) | ((colour >> 16) & 0xff) | ((colour & 0xff) << 16);

// A word has red lowest.
export const cssColour = (bits) => '#' + swapRedAndBlue(bits & 0xffffff).toString(16).padStart(6, '0');

export const bitsOfCss = (text) => swapRedAndBlue(parseInt(text.slice(1), 16));

// Parameters that share a name, a colour and its amount, in words of their own.
export function ownName(effect, param) {
    const isShared = effect.params.some((other) => other !== param && holdsValue(other) && other.name === param.name);
    if (!isShared) return param.name;
    return param.name + (param.kind === 'colour' ? ' Colour' : ' Amount');
}

// The words that matter of a value: the top byte of a colour and the upper bytes of a flag do not.
export function plainWord(param, bits) {
    if (param.kind === 'colour') return bits & 0xffffff;
    if (param.kind === 'check') return bits & 0xff ? 1 : 0;
    return bits;
}

export function isSameValues(effect, a, b) {
    return effect.params.every((param, i) => !holdsValue(param) || plainWord(param, a[i]) === plainWord(param, b[i]));
}
