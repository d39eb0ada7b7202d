// The folder of libqxanalysis.so and libqxrt.so, if the linker does not search it by default.
fn main() {
    println!("cargo:rerun-if-env-changed=QX_LIBRARY_DIR");
    if let Ok(folder) = std::env::var("QX_LIBRARY_DIR") {
        println!("cargo:rustc-link-search=native={folder}");
    }
}
