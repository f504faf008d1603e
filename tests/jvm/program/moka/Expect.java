package moka;

import java.util.Arrays;
import java.util.concurrent.Callable;

/** What the test programs check with. The first thing that is not as expected ends the program. */
final class Expect {
    private Expect() {}

    static void isTrue(boolean condition, String what) {
        if (!condition) throw new AssertionError(what);
    }

    static void equal(Object expected, Object actual, String what) {
        isTrue(expected.equals(actual), what + ": expected " + expected + ", got " + actual);
    }

    static void equal(byte[] expected, byte[] actual, String what) {
        int difference = Arrays.mismatch(expected, actual);
        isTrue(difference < 0, what + ": different at byte " + difference);
    }

    static void thrown(Class<? extends Throwable> type, String text, Callable<?> body) {
        try {
            body.call();
        } catch (Throwable thrown) {
            isTrue(type.isInstance(thrown) && String.valueOf(thrown.getMessage()).contains(text),
                    "expected " + type.getName() + " with '" + text + "', got " + thrown);
            return;
        }
        throw new AssertionError(type.getName() + " was not thrown");
    }
}
