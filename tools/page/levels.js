// Levels of single samples, and the least and the greatest of any window, exact to the last sample: a range query over
// summaries of waveforms, steps, blocks and stretches.
const CHUNK_SAMPLES = 128;
const NO_LEVELS = Object.freeze({low: Infinity, high: -Infinity});

const joinLevels = (a, b) => ({low: Math.min(a.low, b.low), high: Math.max(a.high, b.high)});

// Levels of many things in a row; node n lies above 2n and 2n + 1, the leaves come last.
class RangeTree {
  constructor(count, leafAt) {
    this.count = count;
    this.low = new Float64Array(2 * count).fill(Infinity);
    this.high = new Float64Array(2 * count).fill(-Infinity);
    for (let leaf = 0; leaf < count; ++leaf) {
      const {low, high} = leafAt(leaf);
      this.low[count + leaf] = low;
      this.high[count + leaf] = high;
    }
    for (let node = count - 1; node > 0; --node) {
      this.low[node] = Math.min(this.low[2 * node], this.low[2 * node + 1]);
      this.high[node] = Math.max(this.high[2 * node], this.high[2 * node + 1]);
    }
  }

  over(begin, end) {
    let low = Infinity;
    let high = -Infinity;
    const add = (node) => {
      if (this.low[node] < low) low = this.low[node];
      if (this.high[node] > high) high = this.high[node];
    };
    for (begin += this.count, end += this.count; begin < end; begin >>>= 1, end >>>= 1) {
      if (begin & 1) add(begin++);
      if (end & 1) add(--end);
    }
    return {low, high};
  }
}

function decodeBytes(base64) {
  if (Uint8Array.fromBase64) return Uint8Array.fromBase64(base64);
  const text = atob(base64);
  const bytes = new Uint8Array(text.length);
  for (let index = 0; index < text.length; ++index) bytes[index] = text.charCodeAt(index);
  return bytes;
}

function decodeLevels(base64, widthBits) {
  const bytes = decodeBytes(base64);
  const Levels = widthBits === 16 ? Int16Array : Int32Array;
  if (new Uint8Array(new Uint16Array([1]).buffer)[0] === 1) return new Levels(bytes.buffer);
  const view = new DataView(bytes.buffer);
  const size = widthBits / 8;
  return Levels.from({length: bytes.length / size},
      (_, index) => (size === 2 ? view.getInt16(2 * index, true) : view.getInt32(4 * index, true)));
}

// All samples of a waveform.
class SampledWaveform {
  constructor({data}, widthBits) {
    this.levels = decodeLevels(data, widthBits);
    const {length} = this.levels;
    this.chunks = new RangeTree(Math.ceil(length / CHUNK_SAMPLES),
        (chunk) => this.scan(chunk * CHUNK_SAMPLES, Math.min(length, (chunk + 1) * CHUNK_SAMPLES)));
  }

  scan(begin, end) {
    let low = Infinity;
    let high = -Infinity;
    for (let index = begin; index < end; ++index) {
      const level = this.levels[index];
      if (level < low) low = level;
      if (level > high) high = level;
    }
    return {low, high};
  }

  over(begin, end) {
    const first = Math.ceil(begin / CHUNK_SAMPLES);
    const last = Math.floor(end / CHUNK_SAMPLES);
    if (first >= last) return this.scan(begin, end);
    const edges = joinLevels(this.scan(begin, first * CHUNK_SAMPLES), this.scan(last * CHUNK_SAMPLES, end));
    return joinLevels(this.chunks.over(first, last), edges);
  }
}

// The least and greatest level of each `bucket` samples of a waveform that is too long to be in the page.
class EnvelopedWaveform {
  constructor({data, bucket}, widthBits) {
    const levels = decodeLevels(data, widthBits);
    this.bucket = bucket;
    this.buckets = new RangeTree(levels.length / 2, (index) => ({low: levels[2 * index], high: levels[2 * index + 1]}));
  }

  over(begin, end) { return this.buckets.over(Math.floor(begin / this.bucket), Math.ceil(end / this.bucket)); }
}

class Levels {
  constructor(timeline, data) {
    this.timeline = timeline;
    this.fullScale = 2 ** (data.width - 1);
    this.isExact = !data.waveforms.some(({bucket}) => bucket);
    this.lastLevels = data.steps.last;  // of steps that play enveloped waveforms
    this.waveforms = data.waveforms.map((waveform) => (
      new (waveform.bucket ? EnvelopedWaveform : SampledWaveform)(waveform, data.width)));
    const {steps, blocks, stretches} = timeline;
    this.steps = new RangeTree(steps.count, this.wholeStep());
    this.blocks = new RangeTree(blocks.count, (block) => this.steps.over(blocks.first[block], blocks.end[block]));
    this.stretches = new RangeTree(stretches.count, (stretch) => (
      this.overStraight(stretches.start[stretch], extentSum(stretches.start[stretch], stretches.period[stretch]))));
    this.all = joinLevels(this.over(0n, least(1n, timeline.sampleCount)), this.stretches.over(0, stretches.count));
  }

  // The levels of a step by its number; those that play the same are looked at once.
  wholeStep() {
    const known = new Map();
    const {samples, first, waveform} = this.timeline.steps;
    return (step) => {
      const key = `${waveform[step]} ${first[step]} ${samples[step]}`;
      if (!known.has(key)) known.set(key, this.overStep(step, 0n, samples[step]));
      return known.get(key);
    };
  }

  // Before that sample nothing may have played, which holds 0.
  heldLevels(run) {
    const {steps} = this.timeline;
    const held = this.timeline.heldStep(run);
    if (held === NO_WAVEFORM) return {low: 0, high: 0};
    if (!this.isExact) return {low: this.lastLevels[held], high: this.lastLevels[held]};
    return this.overStep(held, steps.samples[held] - 1n, steps.samples[held]);
  }

  // Of one sample; low and high differ where only an envelope is known. Null behind the end.
  at(sample) {
    const run = this.timeline.runAt(sample);
    return run && this.inRun(run, sample);
  }

  inRun(run, sample) {
    if (!this.timeline.playsWaveform(run.step)) return this.heldLevels(run);
    return this.overStep(run.step, sample - run.first, sample - run.first + 1n);
  }

  // From begin to end, end excluded: {low, high}, NO_LEVELS where nothing plays. A level held counts from before.
  over(begin, end) {
    const {timeline} = this;
    const {first, count} = timeline.stretches;
    const stop = least(end, timeline.sampleCount);
    if (begin >= stop || count === 0) return NO_LEVELS;
    const run = timeline.runAt(begin);
    const isHeld = !timeline.playsWaveform(run.step);
    if (stop <= run.end && !isHeld) return this.overStep(run.step, begin - run.first, stop - run.first);
    const held = isHeld ? this.heldLevels(run) : NO_LEVELS;
    if (stop <= run.end) return held;
    const last = timeline.locate(stop - 1n).stretch;
    let range = joinLevels(held, this.stretches.over(run.stretch + 1, Math.max(last, run.stretch + 1)));
    for (const stretch of run.stretch === last ? [last] : [run.stretch, last]) {
      const from = greatest(begin, first[stretch]) - first[stretch];
      const to = least(stop, timeline.endOfStretch(stretch)) - first[stretch];
      range = joinLevels(range, this.overStretch(stretch, from, to));
    }
    return range;
  }

  overStretch(stretch, begin, end) {
    const start = this.timeline.stretches.start[stretch];
    const period = this.timeline.stretches.period[stretch];
    return this.overRepeated(begin, end, period, () => this.stretches.over(stretch, stretch + 1),
        (from, to) => this.overStraight(start + from, start + to));
  }

  // What repeats after `period` samples, by what all of it has and what a part of it has.
  overRepeated(begin, end, period, overAll, overPart) {
    const passes = (end - 1n) / period - begin / period;
    if (passes > 1n) return overAll();
    const from = begin % period;
    const to = (end - 1n) % period + 1n;
    if (passes === 0n) return overPart(from, to);
    return joinLevels(overPart(from, period), overPart(0n, to));
  }

  overStraight(begin, end) {
    const {timeline} = this;
    const {start} = timeline.blocks;
    const first = timeline.blockAt(begin);
    const last = timeline.blockAt(end - 1n);
    if (first === last) return this.overBlock(first, begin - start[first], end - start[first]);
    const edges = joinLevels(this.overBlock(first, begin - start[first], timeline.samplesOfBlock(first)),
        this.overBlock(last, 0n, end - start[last]));
    return joinLevels(edges, this.blocks.over(first + 1, last));
  }

  overBlock(block, begin, end) {
    return this.overRepeated(begin, end, this.timeline.blocks.body[block], () => this.blocks.over(block, block + 1),
        (from, to) => this.overBody(block, from, to));
  }

  overBody(block, begin, end) {
    const {start, samples} = this.timeline.steps;
    const first = this.timeline.stepAt(block, begin);
    const last = this.timeline.stepAt(block, end - 1n);
    if (first === last) return this.overStep(first, begin - start[first], end - start[first]);
    const edges = joinLevels(this.overStep(first, begin - start[first], samples[first]),
        this.overStep(last, 0n, end - start[last]));
    return joinLevels(edges, this.steps.over(first + 1, last));
  }

  // What a wait holds was played before.
  overStep(step, begin, end) {
    const {waveform, first} = this.timeline.steps;
    if (waveform[step] === NO_WAVEFORM) return NO_LEVELS;
    return this.waveforms[waveform[step]].over(first[step] + Number(begin), first[step] + Number(end));
  }
}
