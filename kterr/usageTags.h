// Tags of the usage entries in an elaboration: what a value is. Hosts look values up by these texts.
#pragma once

namespace kterr {

#define KTORBA_USAGE_TAG(name) inline constexpr char name[] = #name;
KTORBA_USAGE_TAG(kUsageTypeAlignmentQuantum)               // samples that a length or position must be a multiple of
KTORBA_USAGE_TAG(kUsageTypeAllocWaveformLength)            // allocated length of the waveform, samples
KTORBA_USAGE_TAG(kUsageTypeBadValue)                       // offending text or character of a script
KTORBA_USAGE_TAG(kUsageTypeInvalidIdentifier)              // offending identifier of a script
KTORBA_USAGE_TAG(kUsageTypeInvalidString)                  // offending name
KTORBA_USAGE_TAG(kUsageTypeLargestAvailMemoryBlock)        // largest free block of sample memory, bytes
KTORBA_USAGE_TAG(kUsageTypeLineNumber)                     // line of the script, from 1
KTORBA_USAGE_TAG(kUsageTypeMarkerPosition)                 // marker position, samples
KTORBA_USAGE_TAG(kUsageTypeMaxLength)                      // greatest allowed length
KTORBA_USAGE_TAG(kUsageTypeMaxValue)                       // greatest allowed value
KTORBA_USAGE_TAG(kUsageTypeMinMarkerDistFromOtherMarker)   // least distance between two markers, samples
KTORBA_USAGE_TAG(kUsageTypeMinSubsetLength)                // least subset length, samples
KTORBA_USAGE_TAG(kUsageTypeMinValue)                       // least allowed value
KTORBA_USAGE_TAG(kUsageTypeMinWaveformLength)              // least waveform length, samples
KTORBA_USAGE_TAG(kUsageTypeNumSampsToWrite)                // number of samples in a write
KTORBA_USAGE_TAG(kUsageTypeNumberOfSamplesToWait)          // length of a counted wait, samples
KTORBA_USAGE_TAG(kUsageTypeParameterName)                  // name of the offending parameter
KTORBA_USAGE_TAG(kUsageTypePositionInLine)                 // column in the script line, bytes, from 1
KTORBA_USAGE_TAG(kUsageTypePositionOfInvalidCharacter)     // index of the offending byte in a name, from 0
KTORBA_USAGE_TAG(kUsageTypePossibleKeywords)               // keywords that were expected, as one text
KTORBA_USAGE_TAG(kUsageTypeScriptName)                     // a script name
KTORBA_USAGE_TAG(kUsageTypeStartOffset)                    // start offset of a subset, samples
KTORBA_USAGE_TAG(kUsageTypeSubsetLength)                   // length of a subset, samples
KTORBA_USAGE_TAG(kUsageTypeSubsetStartOffset)              // start offset of a subset, samples
KTORBA_USAGE_TAG(kUsageTypeValMustBeGreaterThanOrEqualTo)  // bound that a value must reach
KTORBA_USAGE_TAG(kUsageTypeWaveformLength)                 // length of a waveform, samples
KTORBA_USAGE_TAG(kUsageTypeWaveformName)                   // a waveform name
#undef KTORBA_USAGE_TAG

}  // namespace kterr
