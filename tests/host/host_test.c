/*
 * A host as a signal generator's software is one: plain C, the shared library, the header.
 * It runs a waveform, checks the log, status and files, provokes a failure, and cancels a
 * long run from a second thread. Exit code 0 when every check holds.
 * Usage: nrsynth_host_test SCRATCH_FOLDER
 */
#include <errno.h>
#include <pthread.h>
#include <stdatomic.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <sys/stat.h>
#include <time.h>

#include "nrsynth/nrsynth.h"

static int failures = 0;

static void check(int condition, const char* what) {
    printf("%s %s\n", condition ? "ok  " : "FAIL", what);
    if (!condition) ++failures;
}

static long long fileSize(const char* path) {
    struct stat info;
    return stat(path, &info) == 0 ? (long long)info.st_size : -1;
}

static atomic_int runFinished;

static void* runEngine(void* unused) {
    (void)unused;
    RunEngine();
    atomic_store(&runFinished, 1);
    return NULL;
}

static void pause1ms(void) {
    struct timespec wait = {0, 1000000};
    nanosleep(&wait, NULL);
}

int main(int argc, char** argv) {
    if (argc != 2) {
        fprintf(stderr, "usage: %s SCRATCH_FOLDER\n", argv[0]);
        return 2;
    }
    char path[1024], markers[1100];
    snprintf(path, sizeof path, "%s/host.bin", argv[1]);
    snprintf(markers, sizeof markers, "%s.mkr", path);
    setvbuf(stdout, NULL, _IOLBF, 0);
    if (mkdir(argv[1], 0755) != 0 && errno != EEXIST) {
        perror(argv[1]);
        return 2;
    }

    /* A good run: two continuous-wave carriers at 7.68 MHz, two frames. */
    StartDeserialize("{\"SampleRateAuto\": 7680000, \"NumberOfFrames\": 2, \"NRCarriers\": ["
                     "{\"CarrierType\": \"CW\", \"FrequencyOffset\": 100000},"
                     "{\"CarrierType\": \"CW\", \"FrequencyOffset\": -200000}]}");
    check(GetStatus() == 0, "StartDeserialize status 0");
    InitEngine(path);
    check(GetStatus() == 0, "InitEngine status 0");
    RunEngine();
    check(GetStatus() == 0, "RunEngine status 0");
    check(strcmp(GetLog(), "Deserialize OK! \r\nInit Engine OK! \r\nRun Engine OK! ") == 0, "log after a good run");
    check(strlen(GetLog()) + 1 == 52, "log length 52");
    check(fileSize(path) == 153600LL * 16, "sample file holds 2 frames of complex doubles");
    check(fileSize(markers) == 153600LL, "marker file holds one byte per sample");
    check(GetGenerationProgress() == 0.0, "progress stays 0");

    /* The empty document: no carrier, sample rate 0, empty files and success. */
    StartDeserialize("{}");
    InitEngine(path);
    RunEngine();
    check(GetStatus() == 0, "the empty document runs");
    check(fileSize(path) == 0 && fileSize(markers) == 0, "the empty document gives empty files");

    /* A failure: the log starts afresh with the failure. */
    InitEngine("x");
    check(GetStatus() == -1, "too short a path is status -1");
    check(strncmp(GetLog(), "Init Engine Error! \r\n", 21) == 0, "failure restarts the log");

    /* Cancel from a second thread during a long run: files removed, status 0. */
    StartDeserialize("{\"SampleRateAuto\": 30720000, \"NumberOfFrames\": 40, \"AwgnEnabled\": true,"
                     " \"NRCarriers\": [{\"CarrierType\": \"CW\", \"FrequencyOffset\": 1000}]}");
    InitEngine(path);
    check(GetStatus() == 0, "long run set up");
    pthread_t worker;
    if (pthread_create(&worker, NULL, runEngine, NULL) != 0) {
        perror("pthread_create");
        return 2;
    }
    while (fileSize(path) <= 0 && !atomic_load(&runFinished)) pause1ms();
    check(!atomic_load(&runFinished), "the run was still going when cancelled");
    Cancel();
    pthread_join(worker, NULL);
    check(GetStatus() == 0, "a cancelled run reports status 0");
    check(fileSize(path) < 0 && fileSize(markers) < 0, "a cancelled run removes its files");

    printf("%d failure(s)\n", failures);
    return failures == 0 ? 0 : 1;
}
