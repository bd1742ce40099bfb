// Times in a clip, as reelfx counts them.

export const unknownFacts = {frameRate: '', start: 0};

function rateOf(text) {
    const [numerator, denominator = 1] = text.split('/').map(Number);
    return numerator / denominator;
}

// `time` is the container's. Clip times count from the first frame. A time that is a frame's but for a container's
// whole milliseconds is the frame's: else neighbouring frames would share a frame number, and with it their damage.
export function clipSeconds(time, {frameRate, start}) {
    const seconds = Math.max(0, time - start);
    if (frameRate === '') return seconds;
    const whole = Math.round(seconds * rateOf(frameRate)) / rateOf(frameRate);
    return Math.abs(seconds - whole) <= 0.00051 ? whole : seconds;
}
