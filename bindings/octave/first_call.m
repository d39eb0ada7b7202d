% Mean, modes and a failure: octave-cli --path FOLDER_OF_qx.oct first_call.m
x = [2 4 4 4 5 5 7 9];
printf ("mean %g\n", qx ("Mean_head", x));
printf ("modes [%g]\n", qx ("ModeH", x, 0));
try
  qx ("Moment_head", x, 0);
catch err
  disp (err.message);
end
a = [2 1; 1 3];
[values, vectors] = qx ("EigenValueVector_head", a, 1);
printf ("residual %.0f\n", 1e12 * norm (a * vectors - vectors * diag (values)));
