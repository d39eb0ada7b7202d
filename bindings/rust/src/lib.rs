//! The exports of the QX analysis library with their C signatures, and the stand-in host that creates their arrays.
//!
//! An array is a handle, a pointer to a pointer to a block: the sizes, then the elements. Elements need not
//! be aligned, so read them with `read_unaligned`, or with `elements`, which copies them. 0 is
//! success, a negative code is a failure, a positive one a warning.

#![allow(non_camel_case_types, non_snake_case, non_upper_case_globals, clippy::missing_safety_doc)]

use std::os::raw::{c_char, c_void};

pub type ErrorCode = i32;

include!("exports.rs");

/// Codes of the element types of an array.
pub mod element {
    pub const I32: i32 = 3;
    pub const U8: i32 = 5;
    pub const U32: i32 = 7;
    pub const SGL: i32 = 9;
    pub const DBL: i32 = 10;
    pub const CSG: i32 = 12;
    pub const CDB: i32 = 13;
}

#[link(name = "qxanalysis")]
extern "C" {}

#[link(name = "qxrt")]
extern "C" {
    pub fn QXHostNew1D(type_code: i32, count: i32) -> *mut c_void;
    pub fn QXHostNew2D(type_code: i32, rows: i32, cols: i32) -> *mut c_void;
    pub fn QXHostCopy1D(type_code: i32, count: i32, elements: *const c_void) -> *mut c_void;
    pub fn QXHostCopy2D(type_code: i32, rows: i32, cols: i32, elements: *const c_void) -> *mut c_void;
    pub fn QXHostFree(handle: *mut c_void);
    pub fn QXHostReleaseObject(object: *mut c_void) -> i32;
    pub fn QXHostErrorText(code: ErrorCode) -> *const c_char;
    pub fn QXHostErrorName(code: ErrorCode) -> *const c_char;
}

/// An array of numbers, to be freed by QXHostFree; null if there is not enough memory.
pub fn array(values: &[f64]) -> DBL1D {
    let count = i32::try_from(values.len()).expect("more elements than an array may have");
    unsafe { QXHostCopy1D(element::DBL, count, values.as_ptr().cast()).cast() }
}

/// The elements of an array of numbers.
///
/// # Safety
/// The handle must come from this host, and no call may use it at the same time.
pub unsafe fn elements(handle: DBL1D) -> Vec<f64> {
    let block = *handle;
    let first = block.add(1).cast::<f64>();
    (0..(*block).sizes[0] as usize).map(|i| first.add(i).read_unaligned()).collect()
}
