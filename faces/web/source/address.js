// A look in the page's address, behind the #: "film-pro/seed/values", the values in the order of the parameters, those
// of the same kind as a person would write them: slider numbers as shown, colours as six hex digits.
import {bitsOfCss, bitsOfShown, cssColour, holdsValue, plainWord, shownText} from './values.js';

const slug = (name) => name.toLowerCase().replaceAll(' ', '-');

function valueText(param, bits) {
    if (param.kind === 'slider') return shownText(param, bits);
    if (param.kind === 'colour') return cssColour(bits).slice(1);
    return String(plainWord(param, bits));
}

export function addressOf(effects, {effect, values, seed}) {
    const texts = effects[effect].params.map((param, i) => holdsValue(param) ? valueText(param, values[i]) : null);
    return `#${slug(effects[effect].name)}/${seed}/${texts.filter((text) => text !== null).join(',')}`;
}

// Nothing when it does not fit.
function bitsOfText(param, text) {
    if (param.kind === 'colour') return /^[0-9a-f]{6}$/i.test(text) ? bitsOfCss('#' + text) : null;
    if (!/^-?\d+(\.\d+)?(e-?\d+)?$/.test(text)) return null;
    if (param.kind === 'slider') {
        return text >= param.minimum && text <= param.maximum ? bitsOfShown(param, text) : null;
    }
    const most = param.kind === 'menu' ? param.items.length - 1 : 1;
    return /^\d+$/.test(text) && Number(text) <= most ? Number(text) : null;
}

// {effect, values, seed}; null when the address is not one of a look.
export function readAddress(effects, hash) {
    const [name, seedText, list] = hash.replace(/^#/, '').split('/');
    const effect = effects.findIndex((candidate) => slug(candidate.name) === name);
    if (effect < 0 || list === undefined || !/^\d{1,10}$/.test(seedText)) return null;
    const texts = list.split(',');
    const values = effects[effect].params.map((param) => holdsValue(param) ? bitsOfText(param, texts.shift() ?? '')
                                                                           : param.default);
    const seed = Number(seedText);
    return texts.length > 0 || values.includes(null) || seed > 0xffffffff ? null : {effect, values, seed};
}
