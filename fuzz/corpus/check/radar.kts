// A radar sends one chirp after another until its operator stops it with trigger1.
// marker0 opens the receiver at each chirp; marker1 tells that the sweep is over.
//
//   ktorba play examples/radar.kts --sample-rate 20MHz \
//       --waveform chirp=chirp:length=20us,from=200kHz,to=4MHz --waveform idle=dc:length=100,amplitude=0 \
//       --trigger trigger1@300us --output radar.png
script radar
  clear trigger1                    // an earlier stop does not count
  repeat until trigger1
    generate chirp marker0(0)
    generate idle                   // back to level zero ...
    wait 700                        // ... and listen for 35 us
  end repeat
  generate idle marker1(0)
end script
