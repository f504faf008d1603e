package moka;

import java.io.IOException;
import java.io.InputStream;
import java.net.URL;
import java.net.URLClassLoader;

/** Knows the class path's classes, anew, but for one: taken from a jar of broken classes, or missing. */
final class ShadowLoader extends URLClassLoader {
    private final String shadowed;

    /** brokenJar may be null: then the class is missing. */
    ShadowLoader(String shadowed, URL brokenJar) {
        super(brokenJar == null ? new URL[0] : new URL[] {brokenJar}, ClassLoader.getPlatformClassLoader());
        this.shadowed = shadowed;
    }

    @Override
    protected Class<?> findClass(String name) throws ClassNotFoundException {
        if (name.equals(shadowed)) return super.findClass(name);
        String file = name.replace('.', '/') + ".class";
        try (InputStream input = ClassLoader.getSystemResourceAsStream(file)) {
            if (input == null) throw new ClassNotFoundException(name);
            byte[] bytes = input.readAllBytes();
            return defineClass(name, bytes, 0, bytes.length);
        } catch (IOException e) {
            throw new ClassNotFoundException(name, e);
        }
    }
}
