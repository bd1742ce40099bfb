// Writes a clip with its look: decoded and encoded by the browser, taken apart and put together by Mediabunny. Sound is
// copied as it is where the container can hold it, else encoded anew.
import {
    BlobSource, BufferTarget, Conversion, getFirstEncodableVideoCodec, Input, MATROSKA, MP4, Mp4OutputFormat, Output, QTFF,
    Quality, VideoSample, VideoSampleSource, WEBM, WebMOutputFormat,
} from 'mediabunny';

import {clipSeconds, unknownFacts} from './clip_time.js';

const codecs = ['avc', 'vp9', 'av1', 'vp8'];
const inputFormats = [MP4, QTFF, WEBM, MATROSKA];

export const canWriteClips = () => 'VideoEncoder' in window && 'VideoDecoder' in window;

export class Cancelled extends Error {}

// Nothing when the browser writes no clips of that size.
async function chooseFormat(width, height) {
    const codec = await getFirstEncodableVideoCodec(codecs, {width, height});
    if (codec === null) throw new Error('no encoder');
    const isMp4 = codec === 'avc';
    return {
        codec,
        format: isMp4 ? new Mp4OutputFormat({fastStart: 'in-memory'}) : new WebMOutputFormat(),
        type: isMp4 ? 'video/mp4' : 'video/webm',
        ending: isMp4 ? 'mp4' : 'webm',
    };
}

// Specks and grain, new in every frame, take more bits than encoders think.
const qualityOf = (width, height) => new Quality({bitrate: Math.max(4e6, width * height * 12)});

// {frameRate, start}: the rate as commands write it, '' when it varies or the file does not tell, and the time of the
// first frame, from which the frames of the effects count.
export async function factsOf(file) {
    try {
        const input = new Input({source: new BlobSource(file), formats: inputFormats});
        const track = await input.getPrimaryVideoTrack();
        const {averagePacketRate} = await track.computePacketStats(120);
        return {frameRate: rateText(averagePacketRate), start: await track.getFirstTimestamp()};
    } catch {
        return unknownFacts;
    }
}

function rateText(rate) {
    const nearest = [23.976, 24, 25, 29.97, 30, 48, 50, 59.94, 60].find((one) => Math.abs(rate / one - 1) < 0.0003);
    if (nearest === undefined) return '';
    return Number.isInteger(nearest) ? String(nearest) : `${Math.ceil(nearest) * 1000}/1001`;
}

// Writes one clip. `onProgress` gets 0 to 1. Answers {blob, ending, hasLostSound}.
export class ClipWriter {
    #renderer;
    #look;
    #cancel = null;
    #isCancelled = false;
    onProgress = () => {};

    constructor(renderer, look) {
        this.#renderer = renderer;
        this.#look = look;
    }

    cancel() {
        this.#isCancelled = true;
        this.#cancel?.();
    }

    write(source) {
        return source.kind === 'still' ? this.#writeStill(source) : this.#writeClip(source);
    }

    // `time`: of the frame in the clip that is written.
    #develop(picture, width, height, seconds, duration, time = seconds) {
        const timestamp = Math.round(time * 1e6);
        return this.#renderer.develop({picture, width, height, look: this.#look, seconds, timestamp,
            duration: Math.round(duration * 1e6)});
    }

    async #writeClip({file, width, height}) {
        const facts = await factsOf(file);
        const {codec, format, type, ending} = await chooseFormat(width, height);
        const target = new BufferTarget();
        const conversion = await Conversion.init({
            input: new Input({source: new BlobSource(file), formats: inputFormats}),
            output: new Output({format, target}),
            showWarnings: false,
            tracks: 'primary',
            video: {
                codec, quality: qualityOf(width, height), forceTranscode: true, allowTransformationMetadata: false,
                process: async (sample) => {
                    const {frame} = await this.#develop(sample.toVideoFrame(), sample.displayWidth,
                        sample.displayHeight, clipSeconds(sample.timestamp, facts), sample.duration, sample.timestamp);
                    return new VideoSample(frame);
                },
            },
        });
        if (!conversion.utilizedTracks.some((track) => track.isVideoTrack())) throw new Error('no decoder');
        conversion.onProgress = (share) => this.onProgress(share);
        this.#cancel = () => conversion.cancel();
        await this.#untilCancelled(() => conversion.execute());
        return {
            blob: new Blob([target.buffer], {type}), ending,
            hasLostSound: conversion.discardedTracks.some(({track}) => track.isAudioTrack()),
        };
    }

    async #writeStill(source) {
        const {codec, format, type, ending} = await chooseFormat(source.width, source.height);
        const target = new BufferTarget();
        const output = new Output({format, target});
        const video = new VideoSampleSource({codec, quality: qualityOf(source.width, source.height)});
        const rate = Number(source.frameRate);
        const count = source.duration * rate;
        output.addVideoTrack(video, {frameRate: rate});
        this.#cancel = () => output.cancel();
        await this.#untilCancelled(async () => {
            await output.start();
            for (let i = 0; i < count && !this.#isCancelled; ++i) {
                const {frame} = await this.#develop(await source.picture(), source.width, source.height, i / rate,
                    1 / rate);
                const sample = new VideoSample(frame);
                await video.add(sample);
                sample.close();
                this.onProgress((i + 1) / count);
            }
            if (!this.#isCancelled) await output.finalize();
        });
        return {blob: new Blob([target.buffer], {type}), ending, hasLostSound: false};
    }

    async #untilCancelled(work) {
        try {
            await work();
        } catch (error) {
            if (!this.#isCancelled) throw error;
        }
        if (this.#isCancelled) throw new Cancelled();
    }
}
