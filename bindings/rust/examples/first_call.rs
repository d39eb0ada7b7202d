//! Mean, modes and a failure.

use qxanalysis_sys::*;
use std::ffi::CStr;

fn main() {
    let x = array(&[2.0, 4.0, 4.0, 4.0, 5.0, 5.0, 7.0, 9.0]);
    let modes = array(&[]);
    let (mut mean, mut moment, mut err, order) = (0.0, 0.0, 0, 0);
    unsafe {
        Mean_head(x, &mut mean, &mut err);
        println!("mean {mean}");
        err = ModeH(x, 0, modes);
        println!("modes {:?} (code {err})", elements(modes));
        Moment_head(x, &order, &mut moment, &mut err);
        println!("order 0: {}", CStr::from_ptr(QXHostErrorName(err)).to_string_lossy());
        QXHostFree(modes.cast());
        QXHostFree(x.cast());
    }
}
