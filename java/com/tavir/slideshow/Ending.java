package com.tavir.slideshow;

/** What follows the last picture of a show. */
public enum Ending {
    STOP,
    START_OVER
}
