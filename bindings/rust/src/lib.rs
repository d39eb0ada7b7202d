//! The exports of the QX analysis library as they are in C, and the stand-in host that makes their arrays.
//!
//! An array is a handle, a pointer to the pointer to a block: the sizes, then the elements. Elements may
//! stand at any byte, so they are read by `read_unaligned`, or by `elements`, which copies them. 0 is
//! success, a negative code a failure, a positive one a warning.

#![allow(non_camel_case_types, non_snake_case, non_upper_case_globals, clippy::missing_safety_doc)]

use std::os::raw::{c_char, c_void};

pub type ErrorCode = i32;

include!("exports.rs");

/// Codes of the elements of an array.
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

/// An array of numbers; null where there is no memory. It is given back by QXHostFree.
pub fn array(values: &[f64]) -> DBL1D {
    let count = i32::try_from(values.len()).expect("more elements than an array may have");
    unsafe { QXHostCopy1D(element::DBL, count, values.as_ptr().cast()).cast() }
}

/// The elements of an array of numbers.
///
/// # Safety
/// The handle must be one of this host's, and no call may have it meanwhile.
pub unsafe fn elements(handle: DBL1D) -> Vec<f64> {
    let block = *handle;
    let first = block.add(1).cast::<f64>();
    (0..(*block).sizes[0] as usize).map(|i| first.add(i).read_unaligned()).collect()
}
