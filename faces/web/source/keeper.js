// What the user takes away: picture, clip, preset file, link, commands.
import {canWriteClips, Cancelled, ClipWriter, factsOf} from './clip_writer.js';
import {ffmpegCommand, reelfxCommand} from './commands.js';
import {presetFileName, presetFileText} from './preset_file.js';

const at = (id) => document.getElementById(id);

function download(blob, name) {
    const link = document.createElement('a');
    link.href = URL.createObjectURL(blob);
    link.download = name;
    link.click();
    setTimeout(() => URL.revokeObjectURL(link.href), 60000);
}

const stem = (name) => name.replace(/\.[^.]*$/, '');

export class Keeper {
    #renderer;
    #player;
    #looks;
    #say;
    #address;

    // `say` shows the text of a key, `address` answers the present look's.
    constructor(renderer, player, looks, say, address) {
        this.#renderer = renderer;
        this.#player = player;
        this.#looks = looks;
        this.#say = say;
        this.#address = address;
        at('keepPicture').onclick = () => this.#keepPicture();
        at('keepPreset').onclick = () => this.#keepPreset();
        at('keepLink').onclick = () => this.#copy(location.href.replace(/#.*/, '') + this.#address());
        at('keepCommands').onclick = () => this.#showCommands();
        at('keepClip').onclick = () => this.#keepClip();
        for (const button of document.querySelectorAll('[data-copy]')) {
            button.onclick = () => this.#copy(at(button.dataset.copy).value);
        }
    }

    setSource(source) {
        at('keepClip').disabled = source.kind === 'camera';
        if (source.file) factsOf(source.file).then((facts) => source.setFacts(facts));
    }

    // "Super 8", or "My look" when the values are nobody's preset.
    #name() {
        const {preset, effect} = this.#looks;
        return preset < 0 ? 'My look' : effect.presets[preset].name;
    }

    async #keepPicture() {
        const source = this.#player.source;
        source.pause();
        await this.#player.settled();
        const {blob} = await this.#renderer.png();
        download(blob, `${stem(source.name)}-film.png`);
    }

    #keepPreset() {
        const {effect, values, look} = this.#looks;
        const name = this.#name();
        download(new Blob([presetFileText(effect, values, name)], {type: 'application/octet-stream'}),
            presetFileName(name, look.effect));
    }

    async #copy(text) {
        try {
            await navigator.clipboard.writeText(text);
        } catch {
            const area = document.createElement('textarea');
            area.value = text;
            (document.querySelector('dialog[open]') ?? document.body).append(area);
            area.select();
            document.execCommand('copy');
            area.remove();
        }
        this.#say('Copied.');
    }

    #showCommands() {
        const {effect, values, look, preset} = this.#looks;
        const source = this.#player.source;
        at('reelfxCommand').value = reelfxCommand(effect, values, look.seed, preset, source.name);
        at('ffmpegCommand').value = ffmpegCommand(effect, values, look.seed, preset, source);
        at('commands').showModal();
    }

    async #keepClip() {
        const source = this.#player.source;
        if (!canWriteClips()) {
            this.#say('This browser cannot save clips.');
            return;
        }
        source.pause();
        const writer = new ClipWriter(this.#renderer, this.#looks.rendered);
        const dialog = at('saving');
        writer.onProgress = (share) => { at('progress').value = share; };
        at('progress').value = 0;
        dialog.onclose = () => writer.cancel();
        dialog.showModal();
        try {
            const {blob, ending, hasLostSound} = await writer.write(source);
            download(blob, `${stem(source.name)}-film.${ending}`);
            if (hasLostSound) this.#say('The clip was saved, but without its sound.');
        } catch (error) {
            if (!(error instanceof Cancelled)) this.#say('The clip could not be saved.');
        }
        dialog.onclose = null;
        dialog.close();
    }
}
