// A recorded voice says "front left"; played in slices it says "left" twice, then
// "front". Positions are in samples of the recording, which has 48000 a second.
//
//   ktorba play examples/slices.kts --sample-rate 48000 \
//       --waveform voice=/usr/share/sounds/freedesktop/stereo/audio-channel-front-left.oga:1 \
//       --output slices.wav --output slices.png
script slices
  repeat 2
    generate voice subset(35500, 31500) marker0(0)   // "left"
    wait 4800
  end repeat
  generate voice subset(900, 23100) marker1(0)       // "front"
end script
