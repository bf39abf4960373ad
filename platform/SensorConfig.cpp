/** The one variable used of the vendor's sensor configuration library: non-zero logs details. */
extern int mLogSwitch;
int mLogSwitch = 0;
