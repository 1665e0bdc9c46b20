package com.tavir.slideshow;

import java.io.IOException;

/** A request to a slide show that could not be met. */
public final class SlideShowException extends IOException {
    private static final long serialVersionUID = 1L;

    /** Why, as far as the library tells. */
    public enum Reason {
        REFUSED(0, "the library refused it: show full, or file unreadable or not writable"),
        GENERAL_FAILURE(
                SlideShowJNI.GENERAL_FAILURE,
                "the file is missing, damaged or not writable, memory is short, or 100 shows are open"),
        BAD_HANDLE(SlideShowJNI.BAD_HANDLE, "the handle names no show"),
        NOT_A_SHOW(SlideShowJNI.NOT_A_SHOW, "the file is no slide show, or a new one without a picture"),
        WRONG_VERSION(SlideShowJNI.WRONG_VERSION, "the file is a slide show of another version");

        private final int code;
        private final String explanation;

        Reason(int code, String explanation) {
            this.code = code;
            this.explanation = explanation;
        }

        /** The number by which the native methods give this reason. */
        public int code() {
            return code;
        }

        static Reason of(int code) {
            for (Reason reason : values()) {
                if (reason.code == code) return reason;
            }
            return GENERAL_FAILURE;
        }
    }

    private final Reason reason;

    SlideShowException(Reason reason, String request) {
        super(request + ": " + reason.explanation);
        this.reason = reason;
    }

    public Reason reason() {
        return reason;
    }

    /** A result of 1 is success, another one a reason. */
    static void check(int result, String request) throws SlideShowException {
        if (result != 1) throw new SlideShowException(Reason.of(result), request);
    }
}
