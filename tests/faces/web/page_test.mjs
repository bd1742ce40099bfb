import assert from 'node:assert/strict';
import {readFileSync, writeFileSync} from 'node:fs';
import {basename, join} from 'node:path';
import {after, before, test} from 'node:test';

import {
    closeBrowser, folder, message, openBrowser, openFile, openPage, plugins, reelfx, run, saved,
} from './browser.mjs';

const picture = join(folder, 'picture.png');
const clip = join(folder, 'clip.mp4');
const webm = join(folder, 'clip.webm');
const frames = 10;

const ffmpeg = (...words) => run('ffmpeg', '-nostdin', '-v', 'error', '-y', ...words);
const digests = (text) => [...text.matchAll(/md5 (\w{32})/g)].map(([, digest]) => digest);
const framesOf = (file) => run('ffmpeg', '-v', 'error', '-i', file, '-pix_fmt', 'bgra', '-f', 'framemd5', '-')
    .split('\n').filter((line) => /^0/.test(line)).map((line) => line.split(',').at(-1).trim());
const probe = (file) => JSON.parse(run('ffprobe', '-v', 'error', '-of', 'json', '-show_streams', '-count_frames', file));

before(async () => {
    const scene = ['-f', 'lavfi', '-i', 'testsrc2=size=322x178:rate=30'];
    ffmpeg(...scene, '-frames:v', '1', picture);
    const even = ['-f', 'lavfi', '-i', 'testsrc2=size=320x200:rate=25:duration=1.2', '-f', 'lavfi', '-i',
        'sine=frequency=440:duration=1.2'];
    const colours = ['-vf', 'scale=out_color_matrix=bt709:out_range=tv', '-colorspace', 'bt709', '-color_primaries', 'bt709',
        '-color_trc', 'bt709', '-color_range', 'tv'];
    ffmpeg(...even, ...colours, '-c:v', 'libx264', '-pix_fmt', 'yuv420p', '-c:a', 'aac', clip);
    ffmpeg(...even, ...colours, '-c:v', 'libvpx-vp9', '-pix_fmt', 'yuv420p', '-c:a', 'libopus', webm);
    await openBrowser();
});
after(closeBrowser);

// Each test ends with a page without errors and requests.
function pageTest(name, options, work) {
    test(name, {timeout: 240000}, async () => {
        const page = await openPage(options);
        await work(page);
        assert.deepEqual(page.faults, []);
        await page.context().close();
    });
}

// The present look; the words of group markers say nothing.
const look = (page) => page.evaluate(() => {
    const {effect: {name, params}, rendered} = reel.looks;
    return {...rendered, name, values: rendered.values.map((bits, i) => params[i].kind === 'group' ? 0 : bits)};
});

async function seekTo(page, frame) {
    await page.evaluate(async (seconds) => {
        reel.player.source.pause();
        reel.player.source.seek(seconds);
        await reel.player.settled();
    }, frame / 30);
}

// The picture, ten times as raw frames, is what reelfx gets of the still that runs as a film.
pageTest('every effect gives the bytes of reelfx', {}, async (page) => {
    const raw = join(folder, 'frames.bgra');
    ffmpeg('-loop', '1', '-i', picture, '-frames:v', frames, '-pix_fmt', 'bgra', '-f', 'rawvideo', raw);
    await openFile(page, picture);
    const looks = [['Film Camera', 'Train Ride'], ['Film Look', 'Sodium Lights'], ['Film Damage', 'Water Damage'],
        ['Film Express', 'Old Film'], ['Film Pro', 'Super 8']];
    for (const [effect, [name, preset]] of looks.entries()) {
        const expected = digests(run(reelfx, 'render', raw, '--size', '322x178', '--rate', '30', '--effect', name,
            '--preset', preset, '--seed', '7', '--hash', '-q'));
        await page.evaluate(([index, wanted]) => {
            const {presets} = reel.effects[index];
            reel.looks.setValues(index, presets.find((one) => one.name === wanted).values);
            reel.looks.change({seed: 7});
        }, [effect, preset]);
        const got = [];
        for (let frame = 0; frame < frames; ++frame) {
            await seekTo(page, frame);
            got.push(...framesOf(await saved(page, () => page.click('#keepPicture'))));
        }
        assert.deepEqual(got, expected, name);
        assert.ok(new Set(got).size > 1 || name === 'Film Look', `${name} moves`);
        console.log(`${name} "${preset}": ${got.length} frames equal`);
    }
});

pageTest('presets, tabs, undo and the two looks', {}, async (page) => {
    assert.equal(await page.locator('#strip [role=option]').count(), 81);
    const isDrawn = () => page.waitForFunction(() => document.querySelector('[aria-selected=true] canvas').width === 320);
    await isDrawn();
    await page.getByRole('tab', {name: 'Film Look'}).click();
    await page.getByRole('option', {name: 'Sepia'}).click();
    await isDrawn();
    assert.equal(await page.evaluate(() => reel.looks.effect.presets[reel.looks.preset].name), 'Sepia');
    const sepia = await look(page);
    await page.keyboard.press('ArrowRight');  // the next preset
    assert.notDeepEqual(await look(page), sepia);
    await page.keyboard.press('Control+z');
    assert.deepEqual(await look(page), sepia);
    await page.click('#redo');
    assert.notDeepEqual(await look(page), sepia);
    await page.click('#undo');
    await page.keyboard.press('c');  // the other look begins as this one
    await page.getByRole('option', {name: 'Night', exact: true}).click();
    await page.click('#slotA');
    assert.deepEqual(await look(page), sepia);
    await page.keyboard.press('n');
    assert.notEqual((await look(page)).seed, 0);
    await page.fill('#seed', '99999999999');
    await page.keyboard.press('Enter');
    assert.equal((await look(page)).seed, 0xffffffff);
    await page.getByRole('tab', {name: 'Film Look'}).press('ArrowRight');
    assert.equal((await look(page)).name, 'Film Damage');
});

pageTest('every kind of control', {hash: '#film-pro/0/0,0,0,0,000000,0,0,0,0,0,0,0,0,1,0,0,0,0,0'}, async (page) => {
    const control = (role, name) => page.locator('#controls').getByRole(role, {name, exact: true});
    const value = async (name, kind) => page.evaluate(([n, k]) => {
        const {params} = reel.looks.effect;
        return reel.looks.values[params.findIndex((param) => param.name === n && param.kind === k)];
    }, [name, kind]);
    const numberBits = (number) => new DataView(new Float32Array([number]).buffer).getUint32(0, true);
    await control('slider', 'Y Jitter').focus();
    await page.keyboard.press('End');
    assert.equal(await value('Y Jitter', 'slider'), numberBits(1));
    await control('spinbutton', 'Brightness').fill('-50');
    await page.keyboard.press('Enter');
    assert.equal(await value('Brightness', 'slider'), numberBits(0.25));
    await control('spinbutton', 'Contrast').fill('1000');
    await page.keyboard.press('Enter');
    assert.equal(await value('Contrast', 'slider'), numberBits(1));
    await page.locator('input[type=color]').fill('#102030');
    assert.equal(await value('Tint', 'colour'), 0x302010);
    await control('combobox', 'Pattern').selectOption('Grainy');
    assert.equal(await value('Pattern', 'menu'), 2);
    await control('switch', 'Thick').check();
    assert.equal(await value('Thick', 'check'), 1);
    await page.getByRole('button', {name: 'Reset: Brightness'}).click();
    assert.equal(await value('Brightness', 'slider'), numberBits(0.5));
    // A drag, however long, is one step to undo.
    const box = await control('slider', 'Wear').boundingBox();
    await page.mouse.move(box.x + 2, box.y + box.height / 2);
    await page.mouse.down();
    await page.mouse.move(box.x + box.width - 2, box.y + box.height / 2, {steps: 12});
    await page.mouse.up();
    assert.ok(await value('Wear', 'slider') > numberBits(0.9));
    await page.keyboard.press('Control+z');
    assert.equal(await value('Wear', 'slider'), numberBits(0));
    await page.click('#reset');
    assert.equal(await page.locator('.reset:visible').count(), 0);
});

pageTest('divider, play, scrub and full screen', {}, async (page) => {
    const divider = page.locator('#divider');
    const at = async () => Number(await divider.getAttribute('aria-valuenow'));
    await divider.focus();
    await page.keyboard.press('Home');
    assert.equal(await at(), 0);
    const box = await page.locator('#frame').boundingBox();
    await page.mouse.click(box.x + box.width / 4, box.y + 20);
    assert.ok(Math.abs(await at() - 25) <= 1);
    assert.equal(await page.evaluate(() => reel.player.source.isPlaying), true);
    await page.keyboard.press(' ');
    assert.equal(await page.getByRole('button', {name: 'Play'}).count(), 1);
    await page.locator('#scrub').focus();
    await page.keyboard.press('End');
    await page.waitForFunction(() => document.getElementById('time').textContent === '0:09.97');
    await page.keyboard.press('f');
    await page.waitForFunction(() => document.fullscreenElement?.id === 'viewer');
    await page.click('#full');
    await page.waitForFunction(() => document.fullscreenElement === null);
});

pageTest('a clip by drop, and the clip that is saved', {}, async (page) => {
    for (const [file, codec] of [[clip, 'aac'], [webm, 'opus']]) {
        const bytes = [...run('base64', '-w0', file)].join('');
        await page.evaluate(async ([text, name]) => {
            const data = new DataTransfer();
            data.items.add(new File([Uint8Array.from(atob(text), (c) => c.charCodeAt(0))], name,
                {type: name.endsWith('mp4') ? 'video/mp4' : 'video/webm'}));
            document.body.dispatchEvent(new DragEvent('drop', {dataTransfer: data, bubbles: true, cancelable: true}));
        }, [bytes, basename(file)]);
        await page.waitForFunction((name) => reel.player.source.name === name, basename(file));
        await page.waitForFunction(() => reel.player.source.seconds > 0.2);
        await page.waitForFunction(() => document.querySelector('[aria-selected=true] canvas').height === 200);
        const film = await saved(page, () => page.click('#keepClip'));
        const [video, sound] = ['video', 'audio'].map((type) => probe(film).streams.find((s) => s.codec_type === type));
        assert.deepEqual([video.width, video.height, Number(video.nb_read_frames)], [320, 200, 30]);
        assert.equal(sound.codec_name, codec, 'the sound is copied');
        assert.ok(Math.abs(Number(sound.nb_read_frames) - Number(probe(file).streams[1].nb_read_frames)) <= 1);
        // Against what reelfx makes of the same clip: the same film but for the encoder's losses.
        const own = join(folder, 'own.mkv');
        run(reelfx, 'render', file, own, '--effect', 'Film Pro', '--preset', 'Super 8', '-y', '-q');
        const noise = run('ffmpeg', '-i', film, '-i', own, '-lavfi', 
            '[0:v]settb=1/25,setpts=N[a];[1:v]settb=1/25,setpts=N[b];[a][b]psnr=stats_file=-', '-f', 'null', '-');
        const values = [...noise.matchAll(/psnr_y:([\d.]+)/g)].map(([, psnr]) => Number(psnr));
        assert.ok(values.length === 30 && Math.min(...values) > 30, `PSNR ${values}`);
    }
    await page.click('#keepClip');
    await page.getByRole('button', {name: 'Cancel'}).click();
    await page.waitForFunction(() => !document.getElementById('saving').open);
});

pageTest('a still as a clip', {}, async (page) => {
    await openFile(page, picture);
    const {streams: [video]} = probe(await saved(page, () => page.click('#keepClip')));
    assert.deepEqual([video.width, video.height, Number(video.nb_read_frames)], [322, 178, 300]);
});

pageTest('preset file, link and commands open the same look', {}, async (page) => {
    await openFile(page, clip);
    await page.waitForFunction(() => reel.player.source.frameRate !== '');
    await page.getByRole('option', {name: "60's Memories"}).click();
    await page.locator('#controls').getByRole('spinbutton', {name: 'Tint Amount'}).fill('-12.3');
    await page.fill('#seed', '5');
    await page.keyboard.press('Enter');
    const wanted = await look(page);

    const preset = await saved(page, () => page.click('#keepPreset'));
    assert.equal(basename(preset), 'My look.fxpreld');
    assert.equal(JSON.parse(run(reelfx, 'preset', 'show', preset, '--json')).effect, 'Film Express');
    const settings = ['--seed', '5', '--hash', '-q'];
    const byFile = digests(run(reelfx, 'render', clip, '--preset-file', preset, ...settings));

    await page.click('#keepCommands');
    const command = await page.inputValue('#reelfxCommand');
    const inFolder = (text) => run('sh', '-c', `cd ${folder} && ${text}`);
    const byCommand = digests(inFolder(`${command.replace('reelfx', reelfx)} --hash -q -y`));
    assert.deepEqual(byCommand, byFile);
    const filter = await page.inputValue('#ffmpegCommand');
    inFolder(filter.replace('ffmpeg', 'ffmpeg -nostdin -v error').replace(/ \S+$/, ' -pix_fmt bgra -c:v ffv1 byffmpeg.nut'));
    const lossless = join(folder, 'lossless.nut');
    run(reelfx, 'render', clip, lossless, '--preset-file', preset, '--seed', '5', '--codec', 'ffv1', '--pix-fmt', 'bgra',
        '-q', '-y', '--no-sound');
    assert.deepEqual(framesOf(join(folder, 'byffmpeg.nut')).length, framesOf(lossless).length);
    await page.getByRole('button', {name: 'Close'}).click();

    await page.click('#keepLink');
    await message(page);
    const address = await page.evaluate(() => reel.address);
    const other = await openPage({hash: address});
    assert.deepEqual(await look(other), wanted);
    assert.deepEqual(other.faults, []);
    await other.context().close();

    await page.click('#reset');
    await page.setInputFiles('#file', preset);
    await page.waitForFunction(() => reel.looks.values.some((bits) => bits === 0x3f800000 || bits > 1));
    // A file keeps six digits, and so does what it gives.
    assert.deepEqual((await look(page)).effect, wanted.effect);
});

pageTest('the camera', {permissions: ['camera']}, async (page) => {
    await page.click('#camera');
    await page.waitForFunction(() => reel.player.source.kind === 'camera' && reel.player.source.seconds > 0);
    assert.equal(await page.locator('#keepClip').isDisabled(), true);
    await page.click('#sample');
    await page.waitForFunction(() => reel.player.source.kind === 'still');
});

pageTest('broken and hostile files', {}, async (page) => {
    const files = {
        'empty.mp4': '', 'noise.png': 'not a picture', 'noise.mp4': 'not a clip',
        'cut.mp4': run('head', '-c', '3000', clip),
        'page.html': '<script>alert(1)</script>',
        'sound.wav': 'RIFF', 'huge.png': null,
        'broken.fxprela': '<Preset', 'huge.fxprela': 'x'.repeat(3 << 20),
        'other.fxprelb': '<Preset Name="a" LibraryName="Another" EffectName="Film Look"><parameter type="3" value="1"/></Preset>',
        'script.fxprelb': '<!DOCTYPE a [<!ENTITY e SYSTEM "file:///etc/passwd">]><Preset LibraryName="&e;"/>',
    };
    ffmpeg('-f', 'lavfi', '-i', 'color=size=9000x9000', '-frames:v', '1', join(folder, 'huge.png'));
    const source = await page.evaluateHandle(() => reel.player.source);
    for (const [name, content] of Object.entries(files)) {
        const place = join(folder, name);
        if (content !== null) writeFileSync(place, content);
        await page.setInputFiles('#file', place);
        const said = await message(page);
        assert.match(said, name === 'huge.png' ? /too large.*64 million/ : /\.$/, name);
        await page.evaluate(() => document.getElementById('message').classList.remove('shown'));
        assert.ok(await page.evaluate((old) => reel.player.source === old, source), `${name}: the old picture stays`);
    }
    for (const hash of ['#film-pro', '#film-pro/0/1,2', '#film-pro/-1/', '#nothing/0/1', '#film-look/0/000000,1e9,0,0,0,0,0']) {
        const other = await openPage({hash});
        assert.match(await message(other), /link/, hash);
        assert.deepEqual(other.faults, []);
        await other.context().close();
    }
});

// [code, keys of the page's texts] of each language of the file.
const languageFile = readFileSync(new URL('../../../language/VMReelEffectsLang.xml.in', import.meta.url), 'utf8');
const keysOf = languageFile.split('<language code="').slice(1).map((language) => [language.slice(0, 2),
    [...language.matchAll(/<category id="(?:9|10)">([^]*?)<\/category>/g)].flatMap(([, texts]) =>
        [...texts.matchAll(/key="([^"]+)"/g)].map(([, key]) => key))]);

pageTest('the texts of all languages fit', {locale: 'de-DE', viewport: {width: 390, height: 844}}, async (page) => {
    assert.equal(await page.evaluate(() => document.documentElement.lang), 'de');
    const codes = await page.locator('#language option').evaluateAll((options) => options.map(({value}) => value));
    assert.deepEqual(codes, keysOf.map(([code]) => code));
    for (const [code, keys] of keysOf) assert.deepEqual(keys, keysOf[0][1], `${code} has the texts of English`);
    for (const code of codes) {
        await page.selectOption('#language', code);
        const unnamed = await page.evaluate(() => [...document.querySelectorAll('button, input:not([hidden]), select')]
            .filter((element) => !(element.getAttribute('aria-label') || element.textContent.trim() ||
                element.labels?.length)).map((element) => element.outerHTML));
        assert.deepEqual(unnamed, [], code);
        const cut = await page.evaluate(() => [
            ...document.querySelectorAll('html, nav button, .keep button, .seed, .row, .name, .tools'),
        ].filter((one) => one.scrollWidth > one.clientWidth).map((one) => one.textContent.trim().slice(0, 40)));
        assert.deepEqual(cut, [], code);
    }
});
