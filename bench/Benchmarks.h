#pragma once

struct Bench;

/// Each registers its benchmarks, which refer to `bench` until they have run.
void registerEvaluation(Bench& bench);
void registerEditing(Bench& bench);
void registerReshaping(Bench& bench);
void registerMemory(Bench& bench);
void registerThreads(Bench& bench);
void registerTree(Bench& bench);
void registerRecording(Bench& bench);
void registerDocuments(Bench& bench);
// What a host would use instead. Where one wasn't found when the build was configured, a note says so.
void registerGsl(Bench& bench);
void registerGStreamer(Bench& bench);
void registerMlt(Bench& bench);
