#include "media/context/MediaObserver.h"

void MediaObserver::onDigit(char, unsigned int) {}
void MediaObserver::onSilence(unsigned int) {}
void MediaObserver::onSpeech() {}
void MediaObserver::onQuality(MediaQuality const&) {}
void MediaObserver::onReport(MediaReport const&) {}
