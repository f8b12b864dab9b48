// What plays when, from the folded timeline in the page: pieces of the straight play (the program laid end to end as if
// no trigger were missing) and how often each is played. Answers take the logarithm of the number of instructions,
// however long the play is.
const NO_WAVEFORM = -1;
const REPEATS = {nothing: 0, wait: 1, loop: 2, script: 3};
const LOOP = {counted: 0, forever: 1, untilTrigger: 2};
const MARKER_COUNT = 8;

const toExtents = (texts) => BigUint64Array.from(texts, BigInt);
const triggerName = (hardwareTrigger) => (hardwareTrigger === 1 ? 'start' : `trigger${hardwareTrigger - 1}`);

class Timeline {
  constructor(data) {
    this.length = data.length;
    this.waveformNames = data.waveforms.map(({name}) => name);
    this.readSteps(data.steps);
    this.readBlocks(data.blocks);
    this.readStretches(data.stretches);
    this.triggers = {samples: toExtents(data.triggers.sample), triggers: data.triggers.trigger};
    this.sampleCount = data.length.kind === 'exact' ? BigInt(data.length.samples) : BEYOND;
    this.markers = Array.from({length: MARKER_COUNT}, (_, marker) => new MarkerIndex(this, marker));
  }

  readSteps(steps) {
    this.steps = {...steps, count: steps.samples.length, samples: toExtents(steps.samples)};
    this.steps.start = new BigUint64Array(this.steps.count);  // samples from the start of its block's pass
    this.steps.block = new Uint32Array(this.steps.count);
    this.steps.lastWaveform = new Int32Array(this.steps.count);  // the nearest of the body, this or before, that plays one
  }

  readBlocks(blocks) {
    const count = blocks.passes.length;
    const filled = (value) => new Int32Array(count).fill(value);
    this.blocks = {
      ...blocks, count, passes: toExtents(blocks.passes),
      start: new BigUint64Array(count), body: new BigUint64Array(count), first: new Uint32Array(count),
      waveformInside: filled(NO_WAVEFORM), waveformBefore: filled(NO_WAVEFORM),
    };
    this.straightCount = 0n;
    for (let block = 0; block < count; ++block) this.layBlock(block);
  }

  layBlock(block) {
    const {steps, blocks} = this;
    blocks.first[block] = block === 0 ? 0 : blocks.end[block - 1];
    blocks.start[block] = this.straightCount;
    let body = 0n;
    for (let step = blocks.first[block]; step < blocks.end[block]; ++step) {
      steps.block[step] = block;
      steps.start[step] = body;
      body = extentSum(body, steps.samples[step]);
      if (this.playsWaveform(step)) blocks.waveformInside[block] = step;
      steps.lastWaveform[step] = blocks.waveformInside[block];
    }
    blocks.body[block] = body;
    this.straightCount = extentSum(this.straightCount, this.samplesOfBlock(block));
    if (block > 0) blocks.waveformBefore[block] = this.lastWaveformOf(block - 1);
  }

  readStretches(stretches) {
    this.stretches = {count: stretches.first.length, repeats: stretches.repeats};
    for (const column of ['first', 'samples', 'start', 'period', 'round', 'pass']) {
      this.stretches[column] = toExtents(stretches[column]);
    }
  }

  playsWaveform(step) { return this.steps.waveform[step] !== NO_WAVEFORM; }
  isCounted(block) { return this.blocks.kind[block] === LOOP.counted; }
  samplesOfBlock(block) { return extentProduct(this.blocks.body[block], this.blocks.passes[block]); }
  lastWaveformOf(block) {
    const inside = this.blocks.waveformInside[block];
    return inside === NO_WAVEFORM ? this.blocks.waveformBefore[block] : inside;
  }
  endOfStretch(stretch) { return extentSum(this.stretches.first[stretch], this.stretches.samples[stretch]); }

  // ---- The straight play ----

  blockAt(position) { return partitionPoint(this.blocks.count, (block) => this.blocks.start[block] > position) - 1; }

  // The step of the block that plays so many samples into its pass.
  stepAt(block, inBody) {
    const first = this.blocks.first[block];
    return first + partitionPoint(this.blocks.end[block] - first, (i) => this.steps.start[first + i] > inBody) - 1;
  }

  spotAt(position) {
    const block = this.blockAt(position);
    const inBlock = position - this.blocks.start[block];
    const body = this.blocks.body[block];
    return {block, pass: inBlock / body, step: this.stepAt(block, inBlock % body)};
  }

  // The passes of a loop without a count lie on each other.
  positionOf({block, pass, step}) {
    const passes = this.isCounted(block) ? pass : 0n;
    const start = extentSum(this.blocks.start[block], extentProduct(passes, this.blocks.body[block]));
    return extentSum(start, this.steps.start[step]);
  }

  after({block, pass, step}) {
    const {first, end, passes, count} = this.blocks;
    if (step + 1 < end[block]) return {block, pass, step: step + 1};
    if (this.isCounted(block) && pass + 1n < passes[block]) return {block, pass: pass + 1n, step: first[block]};
    return block + 1 < count ? {block: block + 1, pass: 0n, step: first[block + 1]} : null;
  }

  // ---- What plays ----

  // Of a sample before sampleCount.
  locate(sample) {
    const {first, start, period, count} = this.stretches;
    const stretch = partitionPoint(count, (index) => first[index] > sample) - 1;
    const inside = sample - first[stretch];
    return {stretch, repeat: inside / period[stretch], position: start[stretch] + (inside % period[stretch])};
  }

  // The run that holds a sample: {first, count, end, step, block, pass, round}, and where it lies; null behind the end.
  runAt(sample) {
    if (sample >= this.sampleCount) return null;
    const {stretch, repeat, position} = this.locate(sample);
    return this.enter(stretch, repeat, position);
  }

  enter(stretch, repeat, position) {
    const spot = this.spotAt(position);
    return this.makeRun(stretch, repeat, spot, this.positionOf(spot) - this.stretches.start[stretch]);
  }

  makeRun(stretch, repeat, spot, inPiece) {
    const {blocks, stretches} = this;
    const repeats = stretches.repeats[stretch];
    const isUnderWay = !this.isCounted(spot.block) && blocks.start[spot.block] <= stretches.start[stretch];
    const pass = (isUnderWay ? stretches.pass[stretch] : spot.pass) + (repeats === REPEATS.loop ? repeat : 0n);
    const round = stretches.round[stretch] + (repeats === REPEATS.script ? repeat : 0n);
    const isWait = repeats === REPEATS.wait;
    const first = stretches.first[stretch] + (isWait ? 0n : repeat * stretches.period[stretch] + inPiece);
    const count = isWait ? stretches.samples[stretch] : this.steps.samples[spot.step];
    return {
      first, count, end: extentSum(first, count), step: spot.step, block: spot.block, pass, round, stretch, repeat, spot,
      inPiece,
    };
  }

  // The run behind a run; null at the end.
  next(run) {
    const {stretches} = this;
    if (run.end >= this.sampleCount) return null;
    if (stretches.repeats[run.stretch] !== REPEATS.wait) {
      const inPiece = run.inPiece + run.count;
      if (inPiece < stretches.period[run.stretch]) {
        return this.makeRun(run.stretch, run.repeat, this.after(run.spot), inPiece);
      }
      if (run.end < this.endOfStretch(run.stretch)) {
        return this.enter(run.stretch, run.repeat + 1n, stretches.start[run.stretch]);
      }
    }
    return this.enter(run.stretch + 1, 0n, stretches.start[run.stretch + 1]);
  }

  // The step whose last sample is held as the run begins, or which it plays; NO_WAVEFORM: none has played yet.
  heldStep({block, pass, step, round}) {
    const {blocks, steps} = this;
    if (steps.lastWaveform[step] !== NO_WAVEFORM) return steps.lastWaveform[step];
    if (pass > 0n && blocks.waveformInside[block] !== NO_WAVEFORM) return blocks.waveformInside[block];
    if (blocks.waveformBefore[block] !== NO_WAVEFORM || round === 0n) return blocks.waveformBefore[block];
    return this.lastWaveformOf(blocks.count - 1);
  }

  // The runs of one instruction of the script, which its markers part, as one.
  whole(run) {
    let {first, end} = run;
    if (this.stretches.repeats[run.stretch] !== REPEATS.wait) {
      for (let step = run.step; this.continues(step); --step) first -= this.steps.samples[step - 1];
      for (let step = run.step + 1; this.continues(step); ++step) end = extentSum(end, this.steps.samples[step]);
    }
    return {...run, first, end, count: end - first};
  }

  // Whether the step goes on with what the one before it plays.
  continues(step) {
    const {block, line, column, waveform, first, samples, count} = this.steps;
    if (step === 0 || step >= count || waveform[step] === NO_WAVEFORM) return false;
    const isSame = (values) => values[step] === values[step - 1];
    return [block, line, column, waveform].every(isSame) && first[step - 1] + Number(samples[step - 1]) === first[step];
  }

  // What is repeated around a run with a period of at most `most` samples: all rounds of the script, or all passes of
  // a loop, that follow each other there; null where nothing is.
  repetition(run, most) {
    const {stretches} = this;
    const repeats = stretches.repeats[run.stretch];
    const period = stretches.period[run.stretch];
    const isRepeated = repeats === REPEATS.loop || repeats === REPEATS.script;
    if (repeats === REPEATS.wait) return null;
    if (!isRepeated || period > most) return this.passesAround(run, most);
    const block = repeats === REPEATS.loop ? run.block : null;
    return {first: stretches.first[run.stretch], end: this.endOfStretch(run.stretch), period, block};
  }

  // The passes of a counted loop: those within the piece of the straight play that is played there.
  passesAround(run, most) {
    const {stretches, blocks, steps} = this;
    const body = blocks.body[run.block];
    if (!this.isCounted(run.block) || blocks.passes[run.block] === 1n || body > most) return null;
    const before = run.pass * body + steps.start[run.step];
    const first = run.first - least(before, run.inPiece);
    const end = extentSum(run.first, this.samplesOfBlock(run.block) - before);
    const pieceEnd = extentSum(run.first, stretches.period[run.stretch] - run.inPiece);
    return {first, end: least(end, least(pieceEnd, this.endOfStretch(run.stretch))), period: body, block: run.block};
  }

  // The sample at which the step plays first; null where it never does.
  firstPlayOf(step) {
    const position = this.positionOf({block: this.steps.block[step], pass: 0n, step});
    const {first, start, period, count} = this.stretches;
    for (let stretch = 0; stretch < count; ++stretch) {
      if (position < start[stretch] || position - start[stretch] >= period[stretch]) continue;
      const sample = extentSum(first[stretch], position - start[stretch]);
      if (sample < this.endOfStretch(stretch)) return sample;
    }
    return null;
  }

  // ---- Names ----

  nameOf(step) {
    if (this.playsWaveform(step)) return this.waveformNames[this.steps.waveform[step]];
    const trigger = this.steps.trigger[step];
    if (trigger === 0) return 'wait';
    return trigger === 1 ? 'wait for the start' : `wait until ${triggerName(trigger)}`;
  }
}

// Where a marker fires: how often up to a sample, and at which sample for the n-th time.
class MarkerIndex {
  constructor(timeline, marker) {
    this.timeline = timeline;
    this.fired = {steps: [], blocks: [], first: [], before: []};
    const {steps} = timeline;
    let total = 0n;
    for (let step = 0; step < steps.count; ++step) {
      if ((steps.markers[step] >> marker & 1) === 0) continue;
      const block = steps.block[step];
      if (this.fired.blocks.at(-1) !== block) {
        this.fired.blocks.push(block);
        this.fired.first.push(this.fired.steps.length);
        this.fired.before.push(total);
      }
      total = extentSum(total, timeline.blocks.passes[block]);
      this.fired.steps.push(step);
    }
    this.countStretches();
  }

  get isUsed() { return this.fired.steps.length > 0; }

  countStretches() {
    const {start, period, samples, count} = this.timeline.stretches;
    this.beforeStretch = [];
    this.beforeStart = [];  // in the straight play, up to the stretch's piece, and
    this.perPiece = [];     // in that piece
    this.inStretch = [];
    let before = 0n;
    for (let stretch = 0; this.isUsed && stretch < count; ++stretch) {
      this.beforeStretch.push(before);
      this.beforeStart.push(this.countStraight(start[stretch]));
      this.perPiece.push(this.countStraight(extentSum(start[stretch], period[stretch])) - this.beforeStart[stretch]);
      this.inStretch.push(this.countInStretch(stretch, samples[stretch]));
      before = extentSum(before, this.inStretch[stretch]);
    }
  }

  perPass(entry) { return BigInt((this.fired.first[entry + 1] ?? this.fired.steps.length) - this.fired.first[entry]); }

  // Pulses before that sample of the straight play.
  countStraight(position) {
    const {blocks, steps} = this.timeline;
    const {fired} = this;
    const entry = partitionPoint(fired.blocks.length, (i) => blocks.start[fired.blocks[i]] >= position) - 1;
    if (entry < 0) return 0n;
    const block = fired.blocks[entry];
    const inBlock = position - blocks.start[block];
    const passes = least(inBlock / blocks.body[block], blocks.passes[block]);
    const before = extentSum(fired.before[entry], extentProduct(passes, this.perPass(entry)));
    if (passes === blocks.passes[block]) return before;
    const inBody = inBlock % blocks.body[block];
    const first = fired.first[entry];
    const isLater = (i) => {
      const step = fired.steps[first + i];
      return steps.start[step] + BigInt(steps.offset[step]) >= inBody;
    };
    return extentSum(before, BigInt(partitionPoint(Number(this.perPass(entry)), isLater)));
  }

  pulseStraight(n) {
    const {blocks, steps} = this.timeline;
    const {fired} = this;
    const entry = partitionPoint(fired.before.length, (i) => fired.before[i] > n) - 1;
    const inBlock = n - fired.before[entry];
    const inPass = this.perPass(entry);
    const block = fired.blocks[entry];
    const step = fired.steps[fired.first[entry] + Number(inBlock % inPass)];
    return blocks.start[block] + inBlock / inPass * blocks.body[block] + steps.start[step] + BigInt(steps.offset[step]);
  }

  // In the first `samples` of the stretch.
  countInStretch(stretch, samples) {
    const start = this.timeline.stretches.start[stretch];
    const period = this.timeline.stretches.period[stretch];
    const perPiece = this.perPiece[stretch];
    if (samples === BEYOND) return perPiece === 0n || period === BEYOND ? perPiece : BEYOND;
    const rest = this.countStraight(start + samples % period) - this.beforeStart[stretch];
    return extentSum(extentProduct(samples / period, perPiece), rest);
  }

  countBefore(sample) {
    if (sample === 0n || !this.isUsed) return 0n;
    const end = least(sample, this.timeline.sampleCount);
    const {stretch} = this.timeline.locate(end - 1n);
    const inside = end - this.timeline.stretches.first[stretch];
    return extentSum(this.beforeStretch[stretch], this.countInStretch(stretch, inside));
  }

  // The sample of the n-th pulse, from 0; null when there are fewer.
  pulse(n) {
    const {stretches} = this.timeline;
    const stretch = partitionPoint(this.beforeStretch.length, (i) => this.beforeStretch[i] > n) - 1;
    if (stretch < 0) return null;
    const inside = n - this.beforeStretch[stretch];
    if (inside >= this.inStretch[stretch]) return null;
    const start = stretches.start[stretch];
    const period = stretches.period[stretch];
    const perPiece = this.perPiece[stretch];
    const position = this.pulseStraight(this.beforeStart[stretch] + inside % perPiece);
    const piece = extentSum(stretches.first[stretch], extentProduct(inside / perPiece, period));
    const sample = extentSum(piece, position - start);
    return sample === BEYOND ? null : sample;
  }
}
