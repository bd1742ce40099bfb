// The commands that render a look elsewhere, for a POSIX shell.
import {cssColour, holdsValue, normalisedText, plainWord, shownText} from './values.js';

const quoted = (text) => /^[\w./:=+-]+$/.test(text) ? text : `'${text.replaceAll("'", "'\\''")}'`;

function settingText(param, bits) {
    if (param.kind === 'slider') return `${param.name}=${shownText(param, bits)}`;
    if (param.kind === 'colour') return `${param.name}=${cssColour(bits)}`;
    if (param.kind === 'menu') return `${param.name}=${param.items[bits]}`;
    return `${param.name}=${bits & 0xff ? 'on' : 'off'}`;
}

function filmName(clip) {
    const dot = clip.lastIndexOf('.');
    return dot > 0 ? `${clip.slice(0, dot)}-film${clip.slice(dot)}` : `${clip}-film.mp4`;
}

// `preset`: the index of the preset that the values are equal to, or -1.
export function reelfxCommand(effect, values, seed, preset, clip) {
    const words = ['reelfx', 'render', clip, filmName(clip), '--effect', effect.name];
    if (preset >= 0) words.push('--preset', effect.presets[preset].name);
    effect.params.forEach((param, i) => {
        if (preset >= 0 || !holdsValue(param) || plainWord(param, values[i]) === plainWord(param, param.default)) return;
        words.push('--set', settingText(param, values[i]));
    });
    if (seed !== 0) words.push('--seed', String(seed));
    return words.map(quoted).join(' ');
}

function pluginText(param, bits) {
    if (param.kind === 'slider') return normalisedText(bits);
    if (param.kind === 'colour') return '0x' + cssColour(bits).slice(1);
    if (param.kind === 'menu') return param.items[bits];
    return bits & 0xff ? 'y' : 'n';
}

// Without the clip's frame rate FFmpeg's times, whole milliseconds, count as they are.
export function ffmpegCommand(effect, values, seed, preset, {name: clip, frameRate}) {
    const plugin = `velmora_${effect.name.toLowerCase().replaceAll(' ', '_')}`;
    // Preset, seed, start frame, frame rate, then the effect's own parameters.
    const params = ['none', seed, 0, frameRate || 0];
    if (preset >= 0) {
        params[0] = effect.presets[preset].name.replace(/[^A-Za-z0-9]/g, '');
    } else {
        effect.params.forEach((param, i) => {
            if (holdsValue(param)) params.push(pluginText(param, values[i]));
        });
    }
    return ['ffmpeg', '-i', clip, '-vf', `frei0r=${plugin}:${params.join('|')}`, filmName(clip)].map(quoted).join(' ');
}
