// Preset files as the library reads and writes them: user_presets/preset_file.h has the format.
import {bitsOfNumber, numberOfBits} from './engine.js';

const libraryName = 'Velmora Reel Effects';
const kinds = ['none', 'menu', 'slider', 'colour', 'check', 'group'];
const mostBytes = 1 << 20;

// Editors know the presets of an effect by the extension, which ends with a letter for the effect's index.
export const presetExtension = (effect) => `.fxprel${String.fromCharCode('a'.charCodeAt(0) + effect)}`;

export const presetFileName = (name, effect) =>
    name.replace(/[\\/:*?"<>|\x00-\x1f]/g, '_') + presetExtension(effect);

export const isPresetFileName = (name) => /\.(fxprel[a-z]|prs)$/i.test(name);

const escaped = (text) => text.replaceAll('&', '&amp;').replaceAll('<', '&lt;').replaceAll('>', '&gt;')
    .replaceAll('"', '&quot;');

function parameterLine(param, bits) {
    const type = kinds.indexOf(param.kind);
    if (param.kind === 'group') return `    <parameter type="${type}" />`;
    let value = bits | 0;
    if (param.kind === 'slider') value = numberOfBits(bits).toFixed(6);
    if (param.kind === 'check') value = bits & 0xff ? 1 : 0;
    return `    <parameter type="${type}" value="${value}" />`;
}

export function presetFileText(effect, values, name) {
    return ['<?xml version="1.0" standalone="no" ?>', "<!-- Effect's Preset File -->",
        `<Preset Name="${escaped(name)}" LibraryName="${libraryName}" EffectName="${escaped(effect.name)}">`,
        ...effect.params.map((param, i) => parameterLine(param, values[i])), '</Preset>', ''].join('\r\n');
}

function readValue(param, element) {
    if (Number(element.getAttribute('type')) !== kinds.indexOf(param.kind)) return null;
    if (param.kind === 'group') return param.default;
    const value = Number(element.getAttribute('value') ?? NaN);
    if (!Number.isFinite(value)) return null;
    if (param.kind === 'slider') return bitsOfNumber(Math.min(Math.max(value, 0), 1));
    if (param.kind === 'check') return value ? 1 : 0;
    if (param.kind === 'menu') return value >= 0 && value < param.items.length ? value | 0 : null;
    return value >>> 0;
}

// {effect, values}; null when the file is none of a preset of these effects.
export async function readPresetFile(effects, file) {
    if (file.size > mostBytes) return null;
    const root = new DOMParser().parseFromString(await file.text(), 'text/xml').documentElement;
    if (root.nodeName !== 'Preset' || root.getAttribute('LibraryName') !== libraryName) return null;
    const effect = effects.findIndex(({name}) => name === root.getAttribute('EffectName'));
    const elements = [...root.children];
    if (effect < 0 || elements.length !== effects[effect].params.length) return null;
    const values = effects[effect].params.map((param, i) => readValue(param, elements[i]));
    return values.includes(null) ? null : {effect, values};
}
