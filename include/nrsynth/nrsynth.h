/*
 * nrsynth: the C interface for hosts.
 *
 * A run: StartDeserialize(json), InitEngine(path), optionally InitTestVectorGenerator,
 * RunEngine(); after each call GetStatus() is 0 for success and -1 for failure, and GetLog()
 * holds the log text (entries separated by CR LF). Cancel(), GetStatus(), GetLog() and
 * GetGenerationProgress() may be called from another thread while RunEngine() runs.
 * Output: per antenna a raw sample file (complex double, little endian) and a ".mkr" marker
 * file with one byte per sample. Valid C11.
 */
#ifndef NRSYNTH_NRSYNTH_H
#define NRSYNTH_NRSYNTH_H

#include <stdbool.h>

#if defined(_WIN32) && defined(NRSYNTH_BUILDING)
#define NRSYNTH_API __declspec(dllexport)
#elif defined(_WIN32)
#define NRSYNTH_API __declspec(dllimport)
#else
#define NRSYNTH_API __attribute__((visibility("default")))
#endif

#ifdef __cplusplus
extern "C" {
#endif

/* Reads the waveform document (JSON text). */
NRSYNTH_API void StartDeserialize(const char* json);
/* Builds a new engine and opens the output files; outputPath like "out/wave.bin". */
NRSYNTH_API void InitEngine(const char* outputPath);
/* Switches the export of intermediate channel data into exportFolder on; after InitEngine. */
NRSYNTH_API void InitTestVectorGenerator(bool enable, char* exportFolder);
/* Generates the waveform on the calling thread; returns when finished or cancelled. */
NRSYNTH_API void RunEngine(void);
/* Asks a running RunEngine to stop; its output files are then removed. */
NRSYNTH_API void Cancel(void);
/* 0 after success, -1 after a failure of the last StartDeserialize, InitEngine or RunEngine. */
NRSYNTH_API int GetStatus(void);
/* The log text; the same address for the life of the library. */
NRSYNTH_API char* GetLog(void);
/* Progress of the current run; the engine computes none, so it stays 0.0. */
NRSYNTH_API double GetGenerationProgress(void);
/* Appends text to the log, or starts the log afresh with it when restart is true. */
NRSYNTH_API void LogStatus(char* text, bool restart);

#ifdef __cplusplus
}
#endif

#endif /* NRSYNTH_NRSYNTH_H */
