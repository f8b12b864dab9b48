// What the lane of names shows of a window: a box for each instruction that is wide enough to be seen; where they are
// too narrow, one for all passes of a loop or rounds of the script; and where those are narrow too, columns. The number
// of boxes is bounded by the pixels.
const LEAST_BOX_PIXELS = 3;
const MOST_NAMES = 3;

// {kind: 'run' | 'passes' | 'mixture', first, end, run}, ascending. A mixture has `runs`, one per bucket that stands
// still as the window moves; passes have `period` and `block`, null for rounds of the script.
function boxesOf(timeline, view, width) {
  const boxes = [];
  const end = least(view.endSample, timeline.sampleCount);
  const perPixel = view.samplesPerPixel(width);
  const wide = BigInt(Math.max(1, Math.ceil(perPixel * LEAST_BOX_PIXELS)));
  const bucket = powerOfTwoUpTo(BigInt(Math.floor(perPixel)));
  let at = view.firstSample;
  while (at < end) {
    const run = timeline.runAt(at);
    const box = boxAt(timeline, run, wide) ?? mixtureAt(run, at, bucket, boxes.at(-1));
    if (box !== boxes.at(-1)) boxes.push(box);
    at = greatest(box.end, at + 1n);
  }
  return boxes;
}

function boxAt(timeline, run, wide) {
  const whole = timeline.whole(run);
  if (whole.count >= wide) return {kind: 'run', first: whole.first, end: whole.end, run};
  const repetition = timeline.repetition(run, wide);
  if (repetition === null || repetition.end - repetition.first < wide) return null;
  return {kind: 'passes', run, ...repetition};
}

// Goes on with the mixture before it, if there is one.
function mixtureAt(run, at, bucket, before) {
  const box = before?.kind === 'mixture' ? before : {kind: 'mixture', first: at, end: at, run, runs: []};
  const end = (at / bucket + 1n) * bucket;
  box.runs.push({first: at, end, run});
  box.end = end;
  return box;
}

// The steps that a repetition repeats: of its loop, or of the script.
function stepsOf(timeline, block) {
  return block === null
    ? [timeline.blocks.end[0], timeline.steps.count] : [timeline.blocks.first[block], timeline.blocks.end[block]];
}

// What share of the samples of a repetition each waveform and kind of wait takes, as [step, share], the greatest first.
class Shares {
  constructor(timeline) {
    this.timeline = timeline;
    this.known = new Map();
  }

  of(block) {
    if (!this.known.has(block)) this.known.set(block, this.compute(block));
    return this.known.get(block);
  }

  compute(block) {
    const {timeline} = this;
    const [first, end] = stepsOf(timeline, block);
    const shares = new Map();
    let all = 0;
    for (let step = first; step < end; ++step) {
      const weight = Number(timeline.steps.samples[step])
        * (block === null ? Number(timeline.blocks.passes[timeline.steps.block[step]]) : 1);
      const key = timeline.steps.waveform[step];
      const known = shares.get(key) ?? [step, 0];
      known[1] += weight;
      shares.set(key, known);
      all += weight;
    }
    return [...shares.values()].map(([step, weight]) => [step, weight / all]).sort((a, b) => b[1] - a[1]);
  }

  // "a, b, wait".
  namesOf(block) {
    const names = [...new Set(this.of(block).map(([step]) => this.timeline.nameOf(step)))];
    return names.slice(0, MOST_NAMES).join(', ') + (names.length > MOST_NAMES ? ', \u2026' : '');
  }
}

// What stands in a box.
function textOf(box, timeline, shares) {
  if (box.kind === 'run') return timeline.nameOf(box.run.step);
  if (box.kind === 'mixture') return 'many';
  const names = shares.namesOf(box.block);
  const what = box.block === null ? `script: ${names}` : names;
  return box.end === BEYOND ? `\u221e \u00d7 ${what}` : `${formatCount(divideUp(box.end - box.first, box.period))} \u00d7 ${what}`;
}
