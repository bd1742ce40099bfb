// What the page costs in Chromium, after scripts/build-web:   node bench/page_bench.mjs
//
// Times in milliseconds, of one thread, the least of several: until the page shows its first picture with all controls;
// of 1920x1080 frames the effect with its way to the canvas, the pixels' way from the picture to the effect, and what the
// page waits for it all. Then the frames a second of a clip of 30 that plays.
import {join} from 'node:path';

import {closeBrowser, folder, openBrowser, openFile, openPage, run} from '../tests/faces/web/browser.mjs';

const looks = [['Film Camera', 'Train Ride'], ['Film Look', 'Sepia'], ['Film Damage', 'Aged'],
    ['Film Express', 'Old Film'], ['Film Pro', 'Super 8'], ['Film Pro', null]];

await openBrowser();

const starts = [];
for (let i = 0; i < 5; ++i) {
    const opened = await openPage();
    starts.push(await opened.evaluate(() => performance.now()));
    await opened.context().close();
}
console.log('ready after', starts.map(Math.round).join(', '));

const page = await openPage();
for (const [effect, preset] of looks) {
    const times = await page.evaluate(async ([effectName, presetName]) => {
        const {player, renderer, effects} = reel;
        player.source.pause();
        await player.settled();
        const effect = effects.findIndex(({name}) => name === effectName);
        const {params, presets} = effects[effect];
        // Without a preset every stage has something to do.
        const everything = params.map(({kind, ...param}) => kind === 'slider' ? 0x3f19999a : kind === 'check' ? 1
            : kind === 'colour' ? 0x4080c0 : param.default);
        const values = presets.find(({name}) => name === presetName)?.values ?? everything;
        const least = [Infinity, Infinity, Infinity];
        for (let i = 0; i < 30; ++i) {
            const begin = performance.now();
            const {time, readTime} = await renderer.frame({picture: await player.source.picture(), seconds: i / 30,
                look: {effect, values, seed: 1}, width: 1920, height: 1080});
            [time - readTime, readTime, performance.now() - begin].forEach((one, k) => {
                least[k] = Math.min(least[k], one);
            });
        }
        return least.map((time) => time.toFixed(1));
    }, [effect, preset]);
    console.log(`${effect}, ${preset ?? 'everything'}: effect ${times[0]}, pixels ${times[1]}, in all ${times[2]}`);
}

const clip = join(folder, 'clip.mp4');
run('ffmpeg', '-v', 'error', '-y', '-f', 'lavfi', '-i', 'testsrc2=size=1920x1080:rate=30:duration=6', '-c:v', 'libx264',
    '-preset', 'veryfast', '-pix_fmt', 'yuv420p', clip);
await openFile(page, clip);
for (const [effect, preset] of looks.slice(0, 5)) {
    await page.evaluate(([effectName, presetName]) => {
        const effect = reel.effects.findIndex(({name}) => name === effectName);
        reel.looks.setValues(effect, reel.effects[effect].presets.find(({name}) => name === presetName).values);
    }, [effect, preset]);
    await page.waitForTimeout(3000);
    const [rate, isHalf] = await page.evaluate(() => [reel.player.frameRate, reel.player.isHalfSize]);
    console.log(`playing ${effect}, ${preset}: ${rate} frames a second, ${isHalf ? 'half' : 'full'} size`);
}
await closeBrowser();
