// A pulse train for a camera: every pulse fires the flash, and marker0 opens the
// camera's shutter with it. Ten pictures at 2000 frames per second (1 MHz samples).
//
//   ktorba play examples/camera.kts --waveform flash=gauss:length=100us --output camera.png
script camera
  wait 300                       // let the camera settle
  repeat 10
    generate flash marker0(0)    // the flash, and the shutter with it
    wait 400                     // until the next picture
  end repeat
  generate flash marker1(0)      // a last flash tells the recorder to stop
end script
